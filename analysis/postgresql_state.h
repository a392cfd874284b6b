#pragma once

#include <memory>

#include "analysis/select_state.h"

// The select state of PostgreSQL: the one that knows schemas. LIMIT stays in the tree: the walk does not read
// it. The node of an INSERT is walked like that of a select, and nothing of it is a clause.
class PostgreStateSelectQuery final : public zr::SelectState {
 public:
    explicit PostgreStateSelectQuery(CZRSQLTree* selectNode);

    static bool isSelectNode(unsigned int token);

    // Knows the predicates that stand by themselves, without a PREDICATE around them.
    void ProcessClause(CZRSQLTree* node) override;
    // Knows DISTINCTROW and the asterisk, and no row limit.
    void ProcessPredicate(CZRSQLTree* node) override;
    void ProcessSelectItem(CZRSQLTree* node, zr::ItemList* list) override;
    void ProcessLiteral(CZRSQLTree* node, zr::ItemList* list) override;
    // Notes that there is a direction and not which.
    void ProcessOrder(CZRSQLTree* node, zr::ItemList* list) override;
    void FillField(CZRSQLTree* node, SelectItemField& item) override;
    std::unique_ptr<CFieldObject> MakeFieldObject(CZRSQLTree* node) override;
    std::unique_ptr<SelectItem> MakeTableItem(CZRSQLTree* node) override;

 private:
    PostgreStateSelectQuery(CZRSQLTree* selectNode, SelectState& outer);
    std::unique_ptr<zr::SelectState> makeNested(CZRSQLTree* selectNode) override;

    void collectTable(CZRSQLTree* node) override;
    // Only an alias of exactly that name, whose keys are in lower case.
    bool isTableAlias(const CString& name) override { return m_query->m_aliases.Contains(name); }
    std::unique_ptr<SelectItem> tableOperand(CZRSQLTree* node) override;
    CZRSQLTree* functionParameters(CZRSQLTree* node) override;
};
