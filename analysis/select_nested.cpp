// Queries within a query: sub-queries and union branches.
#include <utility>

#include "analysis/select_state.h"

namespace zr {

void SelectState::ProcessSubQuery(CZRSQLTree* node, ItemList* list) {
    auto item = newItem<SelectItemSubQuery>();
    item->m_name = u"SUB_QUERY";
    CZRQueryInfo& query = newNestedQuery(item->m_query);
    append(list, std::move(item));
    CopySources(query);
    walkNested(node, query);
}

CZRQueryInfo* SelectState::ProcessUnion(CZRSQLTree* node, ItemList* list) {
    auto item = newItem<SelectItemUnion>();
    item->m_name = u"UNION";
    CZRQueryInfo& query = newNestedQuery(item->m_query);
    append(list, std::move(item));
    CopySources(query);
    CZRSQLTree* branch = node->GetChild(0);
    if (roleOf(branch) == Role::AllKeyword) {
        // Takes a DISTINCT away from the outer query, which is intended: hosts know ALL by that.
        ProcessPredicate(node);
        branch = node->GetChild(1);
    }
    walkNested(branch, query);
    return &query;
}

CZRQueryInfo& SelectState::newNestedQuery(CZRQueryInfo*& owner) {
    owner = new CZRQueryInfo;
    owner->DataType = dialect_.nestedDataType;
    return *owner;
}

void SelectState::walkNested(CZRSQLTree* from, CZRQueryInfo& target, OuterNames outerNames) {
    while (roleOf(from) != Role::SelectQuery) {
        if (!from->GetChildCount()) return;
        from = from->GetChild(0);
    }
    std::unique_ptr<SelectState> nested = makeNested(from);
    SelectState& state = *nested;
    state.m_query = &target;
    if (outerNames == OuterNames::Known) state.aliasNames_ = &aliasNames();
    work().openNested(std::move(nested));
    work().once(state, &SelectState::resolveStep, nullptr, nullptr, nullptr);
    work().forEachChild(state, &SelectState::clauseStep, from, nullptr, nullptr);
    target.SetDatabase(m_query->m_database);
}

void SelectState::CopySources(CZRQueryInfo& target) {
    for (const auto& entry : m_query->m_aliases) {
        std::unique_ptr<CZRAliasInfo> alias(entry.value ? entry.value->Clone() : nullptr);
        target.ReplaceAlias(entry.key, alias.get());
        static_cast<void>(alias.release());
    }
    copyTablesAndFields(target);
}

void SelectState::copyTablesAndFields(CZRQueryInfo& target) {
    for (const auto& entry : m_query->m_sourceTables) target.m_sourceTables.SetAt(entry.key, entry.value);
    for (const auto& entry : m_query->m_fields) {
        auto field = entry.value ? std::make_unique<CFieldObject>(*entry.value) : nullptr;
        target.ReplaceFieldObject(entry.key, field.get());
        static_cast<void>(field.release());
    }
}

}  // namespace zr
