#include "tests/analysis/descriptor_text.h"

namespace {

void add(std::string& out, const char* name, const CString& value) {
    if (!value.IsEmpty()) out += std::string(" ") + name + "=" + value.toUtf8();
}

const CZRQueryInfo* queryOf(const SelectItem& item) {
    if (const auto* subQuery = dynamic_cast<const SelectItemSubQuery*>(&item)) return subQuery->m_query;
    if (const auto* branch = dynamic_cast<const SelectItemUnion*>(&item)) return branch->m_query;
    return nullptr;
}

}  // namespace

std::string itemText(const SelectItem& item) {
    std::string out = "(" + std::to_string(item.m_kind);
    add(out, "name", item.m_name);
    add(out, "text", item.m_text);
    if (item.m_isOperator) out += " op";
    if (item.m_nested) out += " nested";
    if (item.m_tokenType) out += " type=" + std::to_string(item.m_tokenType);
    if (const auto* field = dynamic_cast<const SelectItemField*>(&item)) {
        add(out, "table", field->m_sourceTable);
        add(out, "field", field->m_sourceField);
        add(out, "alias", field->m_tableAlias);
        add(out, "schema", field->m_schemaName);
        add(out, "db", field->m_dbName);
    }
    if (queryOf(item)) out += " query";
    for (const SelectItem* child : item.m_items) out += ' ' + itemText(*child);
    return out + ')';
}

std::string listText(const CList<SelectItem*>& items) {
    std::string out;
    for (const SelectItem* item : items) out += (out.empty() ? "" : " ") + itemText(*item);
    return out;
}
