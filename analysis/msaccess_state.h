#pragma once

#include <cstddef>
#include <memory>

#include "analysis/copy_budget.h"
#include "analysis/select_state.h"

class CZRTableInfo;

// The select state of MS Access. Beyond the common walk it keeps what an alias stands for, puts a copy of it
// below each reference to the alias, and writes out "table.*" from the database's tables.
class MSAccessSQL_v3StateSelectQuery final : public zr::SelectState {
 public:
    // What copies of alias expressions may come to in one analysis, in items. Real queries stay far below;
    // what lies behind the limit is an alias without its expression and a reference without a copy.
    static constexpr std::size_t kDefaultCopyLimit = 60'000;

    explicit MSAccessSQL_v3StateSelectQuery(CZRSQLTree* selectNode);

    static bool isSelectNode(unsigned int token);

    int m_inAliasExpression = 0;  // the expression of a new alias is being built: no column is noted
    int m_lastOperator = -1;      // token of the operator whose operands are being walked

    void setCopyLimit(std::size_t items);

    void ProcessTail(CZRSQLTree* root) override;
    void ProcessPredicate(CZRSQLTree* node) override;
    void ProcessFromItem(CZRSQLTree* node, zr::ItemList* list, CZRSQLTree* parent) override;
    void ProcessOperator(CZRSQLTree* node, zr::ItemList* list, CZRSQLTree* parent) override;
    void ProcessParams(zr::ItemList* list, CZRSQLTree* node) override;
    void ProcessLiteral(CZRSQLTree* node, zr::ItemList* list) override;
    void ProcessColumn(CZRSQLTree* node, zr::ItemList* list) override;
    void ProcessSubQuery(CZRSQLTree* node, zr::ItemList* list) override;
    CZRQueryInfo* ProcessUnion(CZRSQLTree* node, zr::ItemList* list) override;
    CString GetNodeText(CZRSQLTree* node) override;

    // A column item for each column of the table.
    void ExpandStar(const CZRTableInfo& table, zr::ItemList* list);
    // A sub-query sees the names of the query around it.
    void CopyOuterContext(CZRQueryInfo& target);

 private:
    // What the states of one analysis share.
    struct Shared {
        zr::CopyBudget budget{kDefaultCopyLimit};
        bool inAliasExpression = false;  // of any of the states
    };

    MSAccessSQL_v3StateSelectQuery(CZRSQLTree* selectNode, MSAccessSQL_v3StateSelectQuery& outer);
    std::unique_ptr<zr::SelectState> makeNested(CZRSQLTree* selectNode) override;

    void collectAlias(CZRSQLTree* node) override;
    void collectTable(CZRSQLTree* node) override;
    CString fieldKey(const CFieldObject& field) const override;
    bool takeExpression(CZRSQLTree* node, zr::ItemList* list, CZRSQLTree* parent) override;
    std::unique_ptr<SelectItem> tableOperand(CZRSQLTree* node) override;
    int parameterCount(CZRSQLTree* node) override;

    void noteField(const SelectItemField& item);
    void endOperatorStep(CZRSQLTree*, zr::ItemList*, CZRSQLTree*) { m_lastOperator = -1; }
    const CZRTableInfo* findTable(const CString& name) const;

    bool isAliasReference(const SelectItemField& item);
    SelectItem* firstOfExpression(const CString& alias) const;
    void followAlias(SelectItemField& reference);

    std::unique_ptr<Shared> ownShared_;  // of the outermost state
    Shared* shared_;
};
