#pragma once

#include <memory>

#include "analysis/select_state.h"

// The select state of MySQL. LIMIT stays in the tree: the walk does not read it.
class MySQLStateSelectQuery final : public zr::SelectState {
 public:
    explicit MySQLStateSelectQuery(CZRSQLTree* selectNode);

    static bool isSelectNode(unsigned int token);

    // Knows DISTINCTROW, and no row limit.
    void ProcessPredicate(CZRSQLTree* node) override;
    void FillField(CZRSQLTree* node, SelectItemField& item) override;
    // Only an alias of exactly that name hides a table, and none hides a column.
    std::unique_ptr<CFieldObject> MakeFieldObject(CZRSQLTree* node) override;

 private:
    MySQLStateSelectQuery(CZRSQLTree* selectNode, SelectState& outer);
    std::unique_ptr<zr::SelectState> makeNested(CZRSQLTree* selectNode) override;
};
