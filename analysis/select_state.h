#pragma once

#include <cstddef>
#include <memory>

#include "analysis/alias_names.h"
#include "analysis/token_table.h"
#include "analysis/work_stack.h"
#include "zrparsersql/field_object.h"
#include "zrparsersql/query_info.h"
#include "zrparsersql/select_item.h"
#include "zrparsersql/sql_tree.h"

namespace zr {

// What a dialect says to the common walk as data. What it does otherwise, it overrides.
struct Dialect {
    const TokenTable& tokens;
    int nestedDataType;  // DataType of the descriptors of sub-queries and union branches
    char16_t quoteOpen;  // around names
    char16_t quoteClose;
    // A function is a call and nothing else: no escapes, no column that comes out ahead of it.
    bool functionsArePlain = false;
    // A literal that is an item of a clause by itself is passed over.
    bool literalsAreNoItems = false;
    // A TOP with PERCENT or WITH TIES is one as well.
    bool topIsAlwaysALimit = false;
    // A JOIN with nothing in front of it gets an item for that.
    bool fillsMissingJoinPrefix = false;
    // A node without children is never an item of an expression.
    bool leavesAreNoOperands = false;
    // A nested select in the first clause ends the analysis.
    bool nestedSelectEndsAnalysis = true;
};

// Reads the tree of one SELECT and writes what it finds into one descriptor: copies of the clauses as lists
// of SelectItem, and on the side the aliases, the source tables and the column references. It copies and does
// not interpret: a type of node that it does not know is passed over or stands for its first child.
//
// One object a SELECT. The passes CollectSubQueries, CollectAliases, CollectTables and CollectFields run to
// their end when called. The steps named Process... do what can be done at once and leave the rest to
// finish(), which has to be called behind them; lists come out in the order told by the steps whatever the
// order of the work. Nested selects have states of their own that share the work of this one.
//
// Dialects derive from it, with a table of token numbers and overrides of the steps that differ.
class SelectState {
 public:
    SelectState(const SelectState&) = delete;
    SelectState& operator=(const SelectState&) = delete;
    virtual ~SelectState();

    CZRQueryInfo* m_query = nullptr;  // to fill; set ahead of the first pass; not owned
    CZRSQLTree* m_selectNode;         // not owned
    CList<SelectState*> m_states;     // of nested selects; owned
    int m_afterDbName = 0;            // a DB_NAME was met and its TABLE_NAME was not

    // The number of items that the walk may make before it gives up with an exception. Trees in which one
    // part stands for several (an escape within an escape, deeply) are kept from filling the memory.
    void setItemLimit(std::size_t items);

    // Nested selects anywhere below the node: one state, and one descriptor in m_subQueries, for each.
    void CollectSubQueries(CZRSQLTree* node);
    virtual void CollectAliases(CZRSQLTree* node);
    void CollectTables();
    void CollectFields();

    // One child of the select node.
    virtual void ProcessClause(CZRSQLTree* node);
    // Runs what the steps have left to do.
    void finish();
    // The children of the tree's root behind the statement, where the root is a list of both.
    virtual void ProcessTail(CZRSQLTree* root);

    virtual void ProcessPredicate(CZRSQLTree* node);
    // The entry for the items of all clauses but FROM.
    virtual void ProcessSelectItem(CZRSQLTree* node, ItemList* list);
    virtual void ProcessFromItem(CZRSQLTree* node, ItemList* list, CZRSQLTree* parent);
    virtual void ProcessExpression(CZRSQLTree* node, ItemList* list, CZRSQLTree* parent);
    virtual void ProcessOperator(CZRSQLTree* node, ItemList* list, CZRSQLTree* parent);
    virtual void ProcessFunction(CZRSQLTree* node, ItemList* list);
    // The children of a node as far as the first RIGHT_PAREN.
    virtual void ProcessParams(ItemList* list, CZRSQLTree* node);
    virtual void ProcessLiteral(CZRSQLTree* node, ItemList* list);
    virtual void ProcessKeyword(CZRSQLTree* node, ItemList* list);
    // Raises CInvalidArgException when the list is empty.
    virtual void ProcessOrder(CZRSQLTree* node, ItemList* list);
    virtual void ProcessColumn(CZRSQLTree* node, ItemList* list);
    virtual void ProcessSubQuery(CZRSQLTree* node, ItemList* list);
    // Gives the branch's descriptor, which the item in the list owns.
    virtual CZRQueryInfo* ProcessUnion(CZRSQLTree* node, ItemList* list);
    virtual void FillField(CZRSQLTree* node, SelectItemField& item);
    virtual std::unique_ptr<CFieldObject> MakeFieldObject(CZRSQLTree* node);
    virtual std::unique_ptr<SelectItem> MakeTableItem(CZRSQLTree* node);
    // Copies aliases, tables and fields to a nested descriptor: it resolves names as its parent does.
    void CopySources(CZRQueryInfo& target);
    const Dialect& dialect() const { return dialect_; }

    bool IsKnownAlias(const CString& name);
    bool IsOperator(CZRSQLTree* node) const { return dialect_.tokens.isOperator(node->GetType()); }
    // The clean text of a name node.
    virtual CString GetNodeText(CZRSQLTree* node);

    Role roleOf(CZRSQLTree* node) const { return dialect_.tokens.role(node->GetType()); }

 protected:
    // The node outlives the state. A state with an outer one shares its work.
    SelectState(CZRSQLTree* selectNode, const Dialect& dialect, SelectState* outer);

    // A state of the same dialect for a nested select.
    virtual std::unique_ptr<SelectState> makeNested(CZRSQLTree* selectNode) = 0;

    // One ALIAS node.
    virtual void collectAlias(CZRSQLTree* node);
    // One node below the select node, in the order of the tree.
    virtual void collectTable(CZRSQLTree* node);
    void enterTable(const CString& name) { m_query->m_sourceTables[name] = name; }
    // The first alias of a key wins: null when the key stands already. Without an expression it gets an empty
    // one.
    CZRAliasInfo* enterAlias(const CString& key, const CString& shown,
                             std::unique_ptr<SelectItem> expression = nullptr);
    // Under its key; replaces what stands there.
    void enterField(std::unique_ptr<CFieldObject> field);
    // The two texts joined.
    virtual CString fieldKey(const CFieldObject& field) const;

    // Whether a name in front of a column, and the name of a table, stands for an alias.
    virtual bool isTableAlias(const CString& name) { return IsKnownAlias(name); }
    // Whether the bare name of a column stands for an alias.
    virtual bool isColumnAlias(const CString& name) { return IsKnownAlias(name); }
    // The text of the item for an alias's new name.
    virtual CString newNameText(CZRSQLTree* node) { return GetNodeText(node); }

    // The name without its quotes, when it begins with one.
    CString unquoted(CString name) const;

    template <class Item>
    Item& append(ItemList* list, std::unique_ptr<Item> item) {
        list->AddTail(item.get());
        return *item.release();
    }
    // All items of the walk come from here, so that they are counted.
    template <class Item>
    std::unique_ptr<Item> newItem() {
        countItem();
        return std::make_unique<Item>();
    }
    AliasNames& aliasNames();
    SelectItem& appendText(ItemList* list, const CString& text, int kind);
    // The item for a table that stands in an expression, such as the left side of a join.
    virtual std::unique_ptr<SelectItem> tableOperand(CZRSQLTree* node) { return MakeTableItem(node); }
    // The node below a function whose children are its parameters, or null.
    virtual CZRSQLTree* functionParameters(CZRSQLTree* node);
    // The item that stands for a part of a join, named " ".
    virtual SelectItem& appendJoinPart(ItemList* list);

    // What ProcessExpression does with a node that is no operator, or false where the node stands for its
    // first child.
    virtual bool takeExpression(CZRSQLTree* node, ItemList* list, CZRSQLTree* parent);
    // The number of parameters that a call of a user function is noted with.
    virtual int parameterCount(CZRSQLTree* node);

    // A new nested descriptor; the owner's pointer holds it at once.
    CZRQueryInfo& newNestedQuery(CZRQueryInfo*& owner);
    void copyTablesAndFields(CZRQueryInfo& target);
    // Fills a new nested descriptor from the first select on the chain of first children.
    enum class OuterNames { Known, Unknown };
    void walkNested(CZRSQLTree* from, CZRQueryInfo& target, OuterNames outerNames = OuterNames::Known);

    // How many items the walk may still make.
    std::size_t itemsLeft() const { return walk_->itemsLeft; }

    // What has to be done behind a piece of work is put on ahead of it.
    WorkStack& work() { return walk_->work; }

 private:
    // What the states of one analysis share.
    struct Walk {
        WorkStack work;
        std::size_t itemsLeft;
    };

    void countItem();
    // Steps in the form that the work stack takes.
    void clauseStep(CZRSQLTree* node, ItemList*, CZRSQLTree*) { ProcessClause(node); }
    void selectItemStep(CZRSQLTree* node, ItemList* list, CZRSQLTree*) { ProcessSelectItem(node, list); }
    void literalStep(CZRSQLTree* node, ItemList* list, CZRSQLTree*) { ProcessLiteral(node, list); }
    void functionStep(CZRSQLTree* node, ItemList* list, CZRSQLTree*) { ProcessFunction(node, list); }
    void functionItemStep(CZRSQLTree* node, ItemList* list, CZRSQLTree*) { appendFunction(node, list); }
    void joinPostfixStep(CZRSQLTree* node, ItemList* list, CZRSQLTree* parent);
    void resolveStep(CZRSQLTree*, ItemList*, CZRSQLTree*) { m_query->ResolveSources(); }

    void processItems(CZRSQLTree* clause, ItemList& list);
    void appendFunction(CZRSQLTree* node, ItemList* list);
    CString functionName(CZRSQLTree* head) const;
    bool isEscape(CZRSQLTree* head) const;

    const Dialect& dialect_;
    std::unique_ptr<Walk> ownWalk_;  // of the outermost state
    Walk* walk_;
    std::unique_ptr<AliasNames> ownAliasNames_;
    AliasNames* aliasNames_ =
        nullptr;  // made when first needed; those of the outer state where they are the same
};

}  // namespace zr
