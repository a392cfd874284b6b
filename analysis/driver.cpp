#include "analysis/driver.h"

namespace zr {

void runPasses(SelectState& state) {
    CZRSQLTree* const selectNode = state.m_selectNode;
    if (state.dialect().nestedSelectEndsAnalysis) {
        state.CollectSubQueries(selectNode->GetChild(0));
        // Intended: the query keeps the nested descriptors only.
        if (!state.m_states.IsEmpty()) return;
    }
    state.CollectAliases(selectNode);
    state.CollectTables();
    state.CollectFields();
    const unsigned int count = selectNode->GetChildCount();
    for (unsigned int index = 0; index < count; ++index) {
        state.ProcessClause(selectNode->GetChild(index));
        state.finish();
    }
    state.m_query->ResolveSources();
}

}  // namespace zr
