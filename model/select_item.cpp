#include "zrparsersql/select_item.h"

#include <string>

#include "model/descriptor_copier.h"
#include "model/descriptor_reaper.h"
#include "zrparsersql/query_info.h"

SelectItem::SelectItem(const SelectItem& other, zr::ShallowCopy)
    : m_nested(other.m_nested),
      m_name(other.m_name),
      m_tokenType(other.m_tokenType),
      m_text(other.m_text),
      m_kind(other.m_kind),
      m_isOperator(other.m_isOperator),
      m_quoteOpen(other.m_quoteOpen),
      m_quoteClose(other.m_quoteClose),
      m_computed(other.m_computed) {}

// The copy constructors delegate, so that a copy that runs out of memory half-way ends like any other item.
SelectItem::SelectItem(const SelectItem& other) : SelectItem(other, zr::ShallowCopy{}) {
    zr::DescriptorCopier().copyBelow(other, *this);
}

SelectItem::~SelectItem() {
    if (!m_items.IsEmpty()) ClearItems();
}

SelectItem* SelectItem::Clone() const {
    return new SelectItem(*this);
}

CString SelectItem::GetItemText() const {
    return m_text;
}

CString SelectItem::GetExpressionText() const {
    CString text;
    if (m_isOperator)
        text.Format(u"%s %s %s", m_items.GetHead()->GetItemText(), m_name, m_items.GetTail()->GetItemText());
    else
        text.Format(u"%s(%s)", m_name, JoinItems());
    return text;
}

void SelectItem::ClearItems() {
    zr::DescriptorReaper reaper;
    reaper.take(m_items);
}

CString SelectItem::JoinItems() const {
    CString text;
    bool first = true;
    for (const SelectItem* item : m_items) {
        if (!first) text += u',';
        first = false;
        if (item) text += item->GetItemText();
    }
    return text;
}

SelectItemField::SelectItemField() {
    m_kind = SIK_FIELD;
}

SelectItemField::SelectItemField(const SelectItemField& other, zr::ShallowCopy)
    : SelectItem(other, zr::ShallowCopy{}),
      m_sourceTable(other.m_sourceTable),
      m_sourceField(other.m_sourceField),
      m_tableName(other.m_tableName),
      m_fieldName(other.m_fieldName),
      m_tableAlias(other.m_tableAlias),
      m_resolvedSchema(other.m_resolvedSchema),
      m_reservedText(other.m_reservedText),
      m_schemaName(other.m_schemaName),
      m_dbName(other.m_dbName) {
    // Whatever else a field was turned into, its copy is a field again: hosts rely on it.
    if (m_kind != SIK_FIELD_LIKE) m_kind = SIK_FIELD;
}

SelectItemField::SelectItemField(const SelectItemField& other) : SelectItemField(other, zr::ShallowCopy{}) {
    zr::DescriptorCopier().copyBelow(other, *this);
}

SelectItemField::~SelectItemField() = default;

SelectItemField* SelectItemField::Clone() const {
    return new SelectItemField(*this);
}

CString SelectItemField::GetItemText() const {
    const bool first = !m_items.IsEmpty();
    const bool isStar = first && m_items.GetHead() && m_items.GetHead()->m_text == u"*";
    const auto quoted = [this](const CString& name) { return m_quoteOpen + name + m_quoteClose; };
    if (!m_fieldName.IsEmpty())
        return m_tableName.IsEmpty() ? quoted(m_fieldName) : quoted(m_tableName) + u"." + quoted(m_fieldName);
    if (isStar) return m_tableName.IsEmpty() ? CString(u"*") : quoted(m_tableName) + u".*";
    return m_tableName.IsEmpty() || first ? CString() : quoted(m_tableName);
}

SelectItemSubQuery::SelectItemSubQuery() {
    m_kind = SIK_SUB_QUERY;
}

SelectItemSubQuery::SelectItemSubQuery(const SelectItemSubQuery& other, zr::ShallowCopy)
    : SelectItem(other, zr::ShallowCopy{}) {}

SelectItemSubQuery::SelectItemSubQuery(const SelectItemSubQuery& other)
    : SelectItemSubQuery(other, zr::ShallowCopy{}) {
    zr::DescriptorCopier().copyBelow(other, *this);
}

SelectItemSubQuery::~SelectItemSubQuery() {
    delete m_query;
}

SelectItemSubQuery* SelectItemSubQuery::Clone() const {
    return new SelectItemSubQuery(*this);
}

SelectItemUnion::SelectItemUnion() {
    m_kind = SIK_UNION;
}

SelectItemUnion::SelectItemUnion(const SelectItemUnion& other, zr::ShallowCopy)
    : SelectItem(other, zr::ShallowCopy{}) {}

SelectItemUnion::SelectItemUnion(const SelectItemUnion& other) : SelectItemUnion(other, zr::ShallowCopy{}) {
    zr::DescriptorCopier().copyBelow(other, *this);
}

SelectItemUnion::~SelectItemUnion() {
    delete m_query;
}

SelectItemUnion* SelectItemUnion::Clone() const {
    return new SelectItemUnion(*this);
}
