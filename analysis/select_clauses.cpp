// The clauses of a select, and the items that stand in them.
#include <algorithm>
#include <cstdint>
#include <limits>

#include "analysis/select_state.h"

namespace zr {

namespace {

// atol on the text, cut to the range of an int.
int leadingNumber(const CString& text) {
    const char16_t* at = text.GetString();
    while (*at == u' ' || (*at >= u'\t' && *at <= u'\r')) ++at;
    const bool isNegative = *at == u'-';
    if (*at == u'-' || *at == u'+') ++at;
    constexpr std::int64_t kLowest = std::numeric_limits<int>::min();
    constexpr std::int64_t kHighest = std::numeric_limits<int>::max();
    std::int64_t value = 0;
    for (; *at >= u'0' && *at <= u'9'; ++at) value = std::min(value * 10 + (*at - u'0'), kHighest + 1);
    return static_cast<int>(std::clamp(isNegative ? -value : value, kLowest, kHighest));
}

}  // namespace

void SelectState::processItems(CZRSQLTree* clause, ItemList& list) {
    m_query->RetireItems(list);
    work().forEachChild(*this, &SelectState::selectItemStep, clause, &list, nullptr);
}

void SelectState::ProcessClause(CZRSQLTree* node) {
    switch (roleOf(node)) {
        case Role::Predicate:
            if (node->GetChildCount()) ProcessPredicate(node->GetChild(0));
            break;
        case Role::SelectList:
            processItems(node, m_query->m_selectItems);
            break;
        case Role::FromDef:
            m_query->RetireItems(m_query->m_fromItems);
            work().forEachChild(*this, &SelectState::ProcessFromItem, node, &m_query->m_fromItems, node);
            break;
        case Role::WhereCondition:
            if (!m_query->m_whereItem) m_query->m_whereItem = new SelectItem;
            processItems(node, m_query->m_whereItem->m_items);
            break;
        case Role::OrderBy:
            processItems(node, m_query->m_orderItems);
            break;
        case Role::GroupBy:
            processItems(node, m_query->m_groupItems);
            break;
        case Role::Having:
            processItems(node, m_query->m_havingItems);
            break;
        case Role::Union:
            m_query->RetireItems(m_query->m_unionItems);
            ProcessUnion(node, &m_query->m_unionItems);
            break;
        default:
            break;
    }
}

void SelectState::ProcessPredicate(CZRSQLTree* node) {
    const Role role = roleOf(node);
    m_query->m_predicate = role == Role::AllKeyword ? 1 : role == Role::DistinctKeyword ? 2 : 0;
    if (role != Role::TopKeyword) return;
    const int count = leadingNumber(node->GetChild(0)->GetChild(0)->GetText());
    // A TOP with PERCENT or WITH TIES is no row count.
    if (node->GetChildCount() < 2 || dialect_.topIsAlwaysALimit) m_query->SetLimit(count);
}

void SelectState::ProcessSelectItem(CZRSQLTree* node, ItemList* list) {
    while (!IsOperator(node)) {
        switch (roleOf(node)) {
            case Role::ColumnSpecification:
                return ProcessColumn(node, list);
            case Role::TableName:
                return;
            case Role::Function:
            case Role::GroupFunction:
            case Role::SearchCondition:
            case Role::ConvertFunction:
            case Role::UserFunction:
                return ProcessFunction(node, list);
            case Role::SqlLiteral:
                if (!dialect_.literalsAreNoItems) ProcessLiteral(node->GetChild(0), list);
                return;
            case Role::Asterisk:
                return ProcessLiteral(node, list);
            case Role::AscKeyword:
            case Role::DescKeyword:
                return ProcessOrder(node, list);
            default:
                if (!node->GetChildCount()) return;
                node = node->GetChild(0);
        }
    }
    ProcessOperator(node, list, nullptr);
}

void SelectState::ProcessFromItem(CZRSQLTree* node, ItemList* list, CZRSQLTree* parent) {
    if (IsOperator(node)) return ProcessOperator(node, list, parent);
    switch (roleOf(node)) {
        case Role::SelectQuery:
            append(list, newItem<SelectItem>()).m_name = u"select";
            break;
        case Role::TableSpecification:
            append(list, MakeTableItem(node));
            break;
        case Role::JoinDef:
            work().forEachChild(*this, &SelectState::ProcessFromItem, node, list, parent);
            break;
        default:
            break;
    }
}

std::unique_ptr<SelectItem> SelectState::MakeTableItem(CZRSQLTree* node) {
    CZRSQLTree* const first = node->GetChild(0);
    auto item = newItem<SelectItemField>();
    // Behind a database the table's quotes stay on, and of several tokens only the first counts: intended.
    item->m_sourceTable =
        roleOf(first) == Role::DbName ? node->GetChild(1)->GetChild(0)->GetText() : GetNodeText(first);
    return item;
}

void SelectState::ProcessOrder(CZRSQLTree* node, ItemList* list) {
    // The word goes to the first item of the clause, whichever it stood behind: intended, hosts read it
    // there.
    SelectItem* const first = list->GetHead();
    const Role role = roleOf(node);
    appendText(&first->m_items,
               role == Role::DescKeyword  ? u"DESC"
               : role == Role::AscKeyword ? u"ASC"
                                          : u"",
               SIK_VALUE);
}

void SelectState::ProcessColumn(CZRSQLTree* node, ItemList* list) {
    auto item = newItem<SelectItemField>();
    FillField(node, *item);
    append(list, std::move(item));
}

void SelectState::FillField(CZRSQLTree* node, SelectItemField& item) {
    auto field = std::make_unique<CFieldObject>();
    unsigned int at = 0;
    const bool hasDatabase = roleOf(node->GetChild(at)) == Role::DbName;
    if (hasDatabase) ++at;
    bool isQualified = hasDatabase;
    if (roleOf(node->GetChild(at)) == Role::TableName) {
        const CString table = GetNodeText(node->GetChild(at));
        if (hasDatabase || !isTableAlias(table)) {
            field->m_table = table;
            item.m_sourceTable = table;
        } else {
            item.m_tableAlias = table;
            item.m_text = table;
        }
        isQualified = true;
        ++at;
    }
    if (roleOf(node->GetChild(at)) == Role::ColumnName) {
        const CString column = GetNodeText(node->GetChild(at));
        if (isQualified || !isColumnAlias(column)) {
            field->m_field = column;
            item.m_sourceField = column;
        } else {
            item.m_text = column;  // an alias and no column
        }
    }
    // The table is not marked as read here, unlike in MakeFieldObject, whose entry of the same key is
    // replaced: intended.
    if (!field->m_table.IsEmpty() || !field->m_field.IsEmpty()) enterField(std::move(field));
}

}  // namespace zr
