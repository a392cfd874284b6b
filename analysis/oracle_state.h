#pragma once

#include <memory>
#include <string_view>

#include "analysis/select_state.h"

// The select state of Oracle. Aliases of tables and of columns are kept apart, by a suffix of their key, and
// know the name that they stand for.
class OracleStateSelectQuery final : public zr::SelectState {
 public:
    explicit OracleStateSelectQuery(CZRSQLTree* selectNode);

    static bool isSelectNode(unsigned int token);

    // An alias anywhere below a FROM is a table's, unless a nested select stands between; any other is a
    // column's.
    void CollectAliases(CZRSQLTree* node) override;
    std::unique_ptr<CFieldObject> MakeFieldObject(CZRSQLTree* node) override;
    CString GetNodeText(CZRSQLTree* node) override;

    // Look-ups without regard to case. The suffix is kTable or kField.
    bool IsKnownAliasOf(const CString& name, std::u16string_view suffix);
    bool IsKnownField(const CString& name) const;
    bool IsKnownTable(const CString& name) const;

    // The name that an alias stands for, empty where that is no plain name; any other name is its own answer.
    CString GetAliasField(const CString& name);
    CString GetAliasTable(const CString& name);

    static constexpr std::u16string_view kTable = u"_TABLE";
    static constexpr std::u16string_view kField = u"_FIELD";

 private:
    OracleStateSelectQuery(CZRSQLTree* selectNode, SelectState& outer);
    std::unique_ptr<zr::SelectState> makeNested(CZRSQLTree* selectNode) override;

    bool isTableAlias(const CString& name) override { return IsKnownAliasOf(name, kTable); }
    bool isColumnAlias(const CString& name) override { return IsKnownAliasOf(name, kField); }
    CString newNameText(CZRSQLTree* node) override;
    SelectItem& appendJoinPart(zr::ItemList* list) override;

    void enterAliasOf(CZRSQLTree* node, std::u16string_view suffix);
    const CZRAliasInfo* findAlias(const CString& name, std::u16string_view suffix) const;
};
