// The passes ahead of the clauses: nested selects, aliases, source tables, column references.
#include <utility>

#include "analysis/select_state.h"
#include "analysis/tree_visit.h"

namespace zr {

namespace {

// Below these nodes stand tokens only: nothing that a pass looks for.
bool holdsTokensOnly(Role role) {
    switch (role) {
        case Role::DbName:
        case Role::TableName:
        case Role::ColumnName:
        case Role::NewName:
        case Role::NumberLiteral:
        case Role::SqlString:
            return true;
        default:
            return false;
    }
}

}  // namespace

void SelectState::CollectSubQueries(CZRSQLTree* node) {
    if (!node) return;
    visitAll(node, [this](CZRSQLTree* at) {
        const Role role = roleOf(at);
        if (role == Role::SelectQuery) {
            std::unique_ptr<SelectState> state = makeNested(at);
            auto query = std::make_unique<CZRQueryInfo>();
            state->m_query = query.get();
            query->SetDatabase(m_query->m_database);
            m_states.AddTail(state.get());
            static_cast<void>(state.release());
            m_query->m_subQueries.AddTail(query.get());
            static_cast<void>(query.release());
        }
        return holdsTokensOnly(role) ? nullptr : at;
    });
}

void SelectState::CollectAliases(CZRSQLTree* node) {
    if (!node) return;
    visitAll(node, [this](CZRSQLTree* at) {
        const Role role = roleOf(at);
        if (role == Role::Alias) collectAlias(at);
        return holdsTokensOnly(role) ? nullptr : at;
    });
}

void SelectState::collectAlias(CZRSQLTree* node) {
    const CString shown = GetNodeText(node->GetChild(node->GetChildCount() - 1));
    CString key = shown;
    if (key.GetAt(0) == dialect_.quoteOpen)
        key = unquoted(std::move(key));
    else
        key.TrimLeft(u" \t");
    enterAlias(key.MakeLower(), shown);
}

CZRAliasInfo* SelectState::enterAlias(const CString& key, const CString& shown,
                                      std::unique_ptr<SelectItem> expression) {
    if (m_query->m_aliases.Contains(key)) return nullptr;
    auto alias = std::make_unique<CZRAliasInfo>();
    alias->Expression = expression ? expression.release() : new SelectItem;
    alias->SetName(shown);
    alias->SetSrcName(shown);
    aliasNames().add(key);
    m_query->m_aliases.SetAt(key, alias.get());
    return alias.release();
}

void SelectState::CollectTables() {
    visitBelow(m_selectNode, [this](CZRSQLTree* at) {
        collectTable(at);
        return holdsTokensOnly(roleOf(at)) ? nullptr : at;
    });
    for (SelectState* state : m_states) state->CollectTables();
}

void SelectState::collectTable(CZRSQLTree* node) {
    switch (roleOf(node)) {
        case Role::DbName:
            m_afterDbName = 1;
            break;
        case Role::TableName:
            // Behind a database stands a table, even where an alias has its name.
            if (const CString name = GetNodeText(node); m_afterDbName || !isTableAlias(name)) {
                enterTable(name);
                m_afterDbName = 0;
            }
            break;
        default:
            break;
    }
}

void SelectState::CollectFields() {
    visitBelow(m_selectNode, [this](CZRSQLTree* at) {
        const Role role = roleOf(at);
        if (role == Role::ColumnSpecification) {
            std::unique_ptr<CFieldObject> field = MakeFieldObject(at);
            if (!field->m_table.IsEmpty() || !field->m_field.IsEmpty()) enterField(std::move(field));
        }
        // Of a nested select only the columns of its first clause count, which is intended.
        if (role == Role::SelectQuery) return at->GetChild(0);
        return holdsTokensOnly(role) ? nullptr : at;
    });
    for (SelectState* state : m_states) state->CollectFields();
}

void SelectState::enterField(std::unique_ptr<CFieldObject> field) {
    m_query->ReplaceFieldObject(fieldKey(*field), field.get());
    static_cast<void>(field.release());
}

CString SelectState::fieldKey(const CFieldObject& field) const {
    return field.m_table + field.m_field;
}

std::unique_ptr<CFieldObject> SelectState::MakeFieldObject(CZRSQLTree* node) {
    auto field = std::make_unique<CFieldObject>();
    unsigned int at = 0;
    const bool hasDatabase = roleOf(node->GetChild(at)) == Role::DbName;
    if (hasDatabase) ++at;
    if (roleOf(node->GetChild(at)) == Role::TableName) {
        const CString table = GetNodeText(node->GetChild(at));
        if (hasDatabase || !isTableAlias(table)) {
            field->m_table = table;
            field->m_hasTable = 1;
        }
        ++at;
    }
    if (roleOf(node->GetChild(at)) == Role::ColumnName) {
        const CString column = GetNodeText(node->GetChild(at));
        if (hasDatabase || !isColumnAlias(column)) field->m_field = column;
    }
    return field;
}

}  // namespace zr
