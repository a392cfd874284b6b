#pragma once

#include <cstddef>
#include <memory>

#include "analysis/select_state.h"
#include "zrparsersql/query_info.h"
#include "zrparsersql/sql_tree.h"

namespace zr {

// The first node that the test takes on the chain of first children, the root included; null when there is
// none.
template <class Test>
CZRSQLTree* findSelectNode(CZRSQLTree* root, Test isSelectNode) {
    for (CZRSQLTree* node = root;; node = node->GetChild(0)) {
        if (isSelectNode(node->GetType())) return node;
        if (!node->GetChildCount()) return nullptr;
    }
}

// The items that the analysis of a text may come to. One a unit is more than any text needs, but for escapes
// within escapes, each level of which doubles what is in it; those get what a generous query of the kind
// takes.
inline std::size_t itemLimit(const CString& text) {
    return 200'000 + 2 * static_cast<std::size_t>(text.GetLength());
}

// Runs a state through its passes over the select node that it was made for.
void runPasses(SelectState& state);

// Parses a query's text and walks its tree. Facade and State are the dialect's classes; prepare turns the
// text of the query into the text to parse.
template <class Facade, class State, class Prepare>
void analyseQuery(CZRQueryInfo& query, Prepare prepare) {
    // The parser reads the text in place: it outlives the parser.
    CString text = prepare(query.GetSQL());
    Facade parser;
    parser.SetSQL(text);
    parser.ParseSQL();
    CZRSQLTree* root = nullptr;
    parser.GetSQLTree(&root);
    const std::unique_ptr<CZRSQLTree> tree(root);
    CZRSQLTree* const selectNode = tree ? findSelectNode(tree.get(), State::isSelectNode) : nullptr;
    // Text without a select leaves the query as it was.
    if (!selectNode) return;
    State state(selectNode);
    state.m_query = &query;
    state.setItemLimit(itemLimit(text));
    runPasses(state);
    state.ProcessTail(root);
}

}  // namespace zr
