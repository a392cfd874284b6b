#pragma once

#include <memory>

#include "analysis/select_state.h"

// The select state of SQL Server: the common walk as it stands.
class MSSQLStateSelectQuery final : public zr::SelectState {
 public:
    explicit MSSQLStateSelectQuery(CZRSQLTree* selectNode);

    static bool isSelectNode(unsigned int token);

 private:
    MSSQLStateSelectQuery(CZRSQLTree* selectNode, SelectState& outer);
    std::unique_ptr<zr::SelectState> makeNested(CZRSQLTree* selectNode) override;
};
