#include <gtest/gtest.h>

#include <memory>

#include "tests/model/small_host.h"
#include "tests/platform/print_string.h"

namespace {

using zr::test::Database;
using zr::test::fieldItem;
using zr::test::functionItem;
using zr::test::Query;
using zr::test::valueItem;

class QueryResolution : public testing::Test {
 protected:
    QueryResolution()
        : table(database.addTable(u"t", {u"a", u"b"})),
          view(database.addQuery(u"v")),
          query(database.addQuery(u"q")) {
        database.SchemaName = u"dbo";
        table.Name = u"NewT";
        table.field(u"a")->Name = u"NewA";
        view.Name = u"NewV";
        view.readsFrom(u"t").refersTo(u"t", u"a");
        view.m_selectItems.AddTail(fieldItem(u"t", u"a"));
        view.ResolveSources();
    }
    SelectItemField* resolved(SelectItemField* item) {
        query.m_selectItems.AddTail(item);
        query.ResolveSources();
        query.ResolveAllItems();
        return item;
    }

    Database database;
    zr::test::Table& table;
    Query& view;
    Query& query;
};

TEST_F(QueryResolution, QualifiedColumnOfATableGetsItsNewNames) {
    query.readsFrom(u"t");
    SelectItemField* item = resolved(fieldItem(u"T", u"A"));
    EXPECT_EQ(item->m_tableName, u"NewT");
    EXPECT_EQ(item->m_fieldName, u"NewA");
    EXPECT_EQ(item->m_resolvedSchema, u"dbo");
    EXPECT_EQ(item->m_computed, 0);
    EXPECT_EQ(item->GetItemText(), u"NewT.NewA");
    EXPECT_EQ(table.Resolved, 1);
    EXPECT_EQ(query.Correct, 0);
}

TEST_F(QueryResolution, UnknownQualifiedColumnMarksTheQuery) {
    query.readsFrom(u"t");
    table.Resolved = 1;
    SelectItemField* item = resolved(fieldItem(u"t", u"nothing"));
    EXPECT_TRUE(item->m_fieldName.IsEmpty());
    EXPECT_EQ(query.Correct, 1);
    EXPECT_EQ(table.Resolved, 0);
}

TEST_F(QueryResolution, UnknownQualifiedColumnThatIsAnAliasMarksNothing) {
    query.readsFrom(u"t").addAlias(u"x");
    resolved(fieldItem(u"t", u"X"));
    EXPECT_EQ(query.Correct, 0);
}

TEST_F(QueryResolution, UnknownTableMarksTheQuery) {
    resolved(fieldItem(u"nowhere", u"a"));
    EXPECT_EQ(query.Correct, 1);
}

TEST_F(QueryResolution, QualifiedStarGetsTheNewTable) {
    query.readsFrom(u"t");
    SelectItemField* item = resolved(fieldItem(u"t", u"*"));
    EXPECT_EQ(item->m_tableName, u"NewT");
    EXPECT_EQ(item->m_text, u"*");
    EXPECT_TRUE(item->m_fieldName.IsEmpty());
}

TEST_F(QueryResolution, StarOfAnUnknownTableMarksTheQuery) {
    resolved(fieldItem(u"nowhere", u"*"));
    EXPECT_EQ(query.Correct, 1);
}

TEST_F(QueryResolution, TableAloneGetsNameAndSchema) {
    SelectItemField* item = resolved(fieldItem(u"t", u""));
    EXPECT_EQ(item->m_tableName, u"NewT");
    EXPECT_EQ(item->m_resolvedSchema, u"dbo");
    EXPECT_EQ(query.Correct, 0);
    resolved(fieldItem(u"nowhere", u""));
    EXPECT_EQ(query.Correct, 1);
}

TEST_F(QueryResolution, QualifiedColumnOfAQueryIsFoundInItsSelectList) {
    query.readsFrom(u"v");
    SelectItemField* item = resolved(fieldItem(u"v", u"A"));
    EXPECT_EQ(item->m_tableName, u"NewV");
    EXPECT_EQ(item->m_fieldName, u"a");
    EXPECT_EQ(item->m_resolvedSchema, u"dbo");
    EXPECT_EQ(view.Resolved, 1);
}

TEST_F(QueryResolution, QualifiedColumnThatIsAnAliasOfAQueryIsComputed) {
    view.addAlias(u"Sum");
    query.readsFrom(u"v");
    SelectItemField* item = resolved(fieldItem(u"v", u"sum"));
    EXPECT_EQ(item->m_tableName, u"NewV");
    EXPECT_EQ(item->m_fieldName, u"Sum");
    EXPECT_EQ(item->m_computed, 1);
}

TEST_F(QueryResolution, BareColumnOfATableKeepsItsOwnNames) {
    query.readsFrom(u"t");
    SelectItemField* item = resolved(fieldItem(u"", u"A"));
    EXPECT_EQ(item->m_fieldName, u"A");
    EXPECT_TRUE(item->m_tableName.IsEmpty());
}

TEST_F(QueryResolution, BareColumnIsFoundInTheQueriesOfTheFromClause) {
    query.readsFrom(u"v");
    SelectItemField* item = resolved(fieldItem(u"", u"A"));
    EXPECT_EQ(item->m_tableName, u"t");
    EXPECT_EQ(item->m_fieldName, u"a");
}

TEST_F(QueryResolution, BareColumnTakesResolvedNamesWhereThereAreSome) {
    view.ResolveAllItems();
    query.readsFrom(u"v");
    SelectItemField* item = resolved(fieldItem(u"", u"a"));
    EXPECT_EQ(item->m_tableName, u"NewT");
    EXPECT_EQ(item->m_fieldName, u"NewA");
}

TEST_F(QueryResolution, BareColumnIsNotSearchedWhenItIsASelectAliasOrForSqlServer) {
    query.readsFrom(u"v");
    query.type = DB_MSSQL;
    EXPECT_EQ(resolved(fieldItem(u"", u"A"))->m_fieldName, u"A");
    query.type = static_cast<DBTypes>(9);
    EXPECT_EQ(resolved(fieldItem(u"", u"A"))->m_fieldName, u"A");
    query.type = DB_MSSQL_20;
    EXPECT_EQ(resolved(fieldItem(u"", u"A"))->m_fieldName, u"a");
    query.addAlias(u"a");
    EXPECT_EQ(resolved(fieldItem(u"", u"A"))->m_fieldName, u"A");
    EXPECT_EQ(resolved(fieldItem(u"", u"*"))->m_fieldName, u"*");
}

TEST_F(QueryResolution, BareColumnThatIsAnExpressionIsComputed) {
    view.addAlias(u"sum");
    query.readsFrom(u"v");
    EXPECT_EQ(resolved(fieldItem(u"", u"sum"))->m_computed, 1);
}

TEST_F(QueryResolution, ChildrenAreResolvedWithTheQueryUnmarked) {
    query.readsFrom(u"t");
    query.Resolved = 1;
    SelectItemField* item = fieldItem(u"t", u"a");
    query.m_havingItems.AddTail(functionItem(u"f", {functionItem(u"g", {item, nullptr})}));
    query.ResolveAllItems();
    EXPECT_EQ(item->m_fieldName, u"NewA");
    EXPECT_EQ(query.Resolved, 0);
}

TEST_F(QueryResolution, OneItemIsResolvedWithWhatIsBelowIt) {
    query.readsFrom(u"t");
    SelectItemField* item = fieldItem(u"t", u"a");
    const std::unique_ptr<SelectItem> root(functionItem(u"f", {item}));
    query.Resolved = 1;
    query.ResolveItem(root.get());
    EXPECT_EQ(item->m_fieldName, u"NewA");
    EXPECT_EQ(query.Resolved, 0);
    query.Resolved = 1;
    query.ResolveItem(nullptr);
    EXPECT_EQ(query.Resolved, 1);
}

TEST_F(QueryResolution, AListIsResolvedByItself) {
    query.readsFrom(u"t");
    SelectItemField* inList = fieldItem(u"t", u"a");
    SelectItemField* inOther = fieldItem(u"t", u"a");
    query.m_orderItems.AddTail(functionItem(u"f", {inList}));
    query.m_orderItems.AddTail(nullptr);
    query.m_groupItems.AddTail(inOther);
    query.ResolveItems(query.m_orderItems);
    EXPECT_EQ(inList->m_fieldName, u"NewA");
    EXPECT_TRUE(inOther->m_fieldName.IsEmpty());
}

TEST_F(QueryResolution, EveryClauseIsResolved) {
    query.readsFrom(u"t");
    std::vector<SelectItemField*> items;
    const auto add = [&items](CList<SelectItem*>& list) {
        items.push_back(fieldItem(u"t", u"a"));
        list.AddTail(items.back());
    };
    query.m_whereItem = new SelectItem;
    for (CList<SelectItem*>* list :
         {&query.m_selectItems, &query.m_fromItems, &query.m_orderItems, &query.m_whereItem->m_items,
          &query.m_groupItems, &query.m_havingItems, &query.m_unionItems})
        add(*list);
    query.ResolveAllItems();
    for (const SelectItemField* item : items) EXPECT_EQ(item->m_fieldName, u"NewA");
}

TEST_F(QueryResolution, ListWithoutItemsLeavesTheMarkAlone) {
    query.Resolved = 1;
    query.ResolveAllItems();
    EXPECT_EQ(query.Resolved, 1);
}

TEST_F(QueryResolution, FieldLikeItemThatIsAKnownColumnLosesItsExpression) {
    query.refersTo(u"", u"a");
    SelectItemField* item = fieldItem(u"", u"A");
    item->m_kind = SIK_FIELD_LIKE;
    item->m_tableAlias = u"x";
    item->m_items.AddTail(valueItem(u"first"));
    SelectItem* second = valueItem(u"second");
    item->m_items.AddTail(second);
    resolved(item);
    EXPECT_TRUE(item->m_items.IsEmpty());
    EXPECT_EQ(second->m_text, u"second") << "alive until the query goes";
}

TEST_F(QueryResolution, FieldLikeItemKeepsItsExpressionOtherwise) {
    query.refersTo(u"", u"a");
    for (const auto& [alias, column] : {std::pair{u"", u"a"}, std::pair{u"x", u"unknown"}}) {
        SelectItemField* item = fieldItem(u"", column);
        item->m_kind = SIK_FIELD_LIKE;
        item->m_tableAlias = alias;
        item->m_items.AddTail(valueItem(u"first"));
        EXPECT_EQ(resolved(item)->m_items.GetCount(), 1);
    }
}

class SelectListMatch : public QueryResolution {
 protected:
    ~SelectListMatch() override {
        for (SelectItem* item : list) delete item;
    }
    CString match(const CString& tableName, const CString& column, int flag = 0, int mode = 0) {
        found = nullptr;
        const std::unique_ptr<SelectItemField> wanted(fieldItem(tableName, column));
        query.ResolveSources();
        return query.MatchSelectList(list, *wanted, found, flag, mode);
    }

    CList<SelectItem*> list;
    SelectItem* found = nullptr;
};

TEST_F(SelectListMatch, GoesByTableAndColumnWithoutRegardToCase) {
    list.AddTail(nullptr);
    list.AddTail(fieldItem(u"u", u"a"));
    SelectItemField* entry = fieldItem(u"t", u"a");
    list.AddTail(entry);
    EXPECT_EQ(match(u"T", u"A"), u"a");
    EXPECT_EQ(found, entry);
    EXPECT_TRUE(match(u"x", u"a").IsEmpty());
    EXPECT_EQ(found, nullptr);
    EXPECT_TRUE(match(u"t", u"").IsEmpty());
}

TEST_F(SelectListMatch, GoesByColumnAloneWhenToldOrWithoutATable) {
    SelectItemField* entry = fieldItem(u"u", u"a");
    list.AddTail(entry);
    EXPECT_TRUE(match(u"t", u"a").IsEmpty());
    EXPECT_EQ(match(u"t", u"a", 1), u"a");
    EXPECT_EQ(match(u"", u"a"), u"a");
}

TEST_F(SelectListMatch, StarIsSearchedInTheQueriesOfTheFromClause) {
    query.readsFrom(u"t").readsFrom(u"v");
    list.AddTail(fieldItem(u"", u"*"));
    EXPECT_EQ(match(u"", u"A"), u"a");
    EXPECT_EQ(found, view.m_selectItems.GetHead());
    EXPECT_EQ(match(u"v", u"a"), u"a");
    EXPECT_TRUE(match(u"t", u"a").IsEmpty()) << "a table has no select list";
}

TEST_F(SelectListMatch, QualifiedStarIsSearchedInItsOwnQuery) {
    auto& other = database.addQuery(u"other");
    other.m_selectItems.AddTail(fieldItem(u"", u"only"));
    query.readsFrom(u"v").readsFrom(u"other");
    list.AddTail(fieldItem(u"v", u"*"));
    EXPECT_TRUE(match(u"", u"only").IsEmpty());
    EXPECT_EQ(match(u"", u"a"), u"a");
}

TEST_F(SelectListMatch, StarAsALiteralIsSearchedToo) {
    query.readsFrom(u"v");
    list.AddTail(valueItem(u"*"));
    EXPECT_EQ(match(u"", u"a"), u"a");
}

TEST_F(SelectListMatch, FunctionsHideTheirColumnsUnlessTheModeSaysOtherwise) {
    list.AddTail(functionItem(u"f", {fieldItem(u"", u"a")}));
    EXPECT_TRUE(match(u"", u"a").IsEmpty());
    EXPECT_EQ(match(u"", u"a", 0, 1), u"a");
}

TEST_F(SelectListMatch, ItemsNamedAliasHideNothing) {
    list.AddTail(functionItem(u"ALIAS", {valueItem(u"x"), fieldItem(u"", u"a")}));
    EXPECT_EQ(match(u"", u"a"), u"a");
}

TEST_F(SelectListMatch, TheFirstEntryInOrderWins) {
    SelectItemField* first = fieldItem(u"u", u"A");
    list.AddTail(functionItem(u"ALIAS", {first}));
    list.AddTail(fieldItem(u"t", u"a"));
    EXPECT_EQ(match(u"", u"a"), u"A");
    EXPECT_EQ(found, first);
}

TEST_F(SelectListMatch, StarsOfQueriesThatReadFromEachOtherEnd) {
    auto& first = database.addQuery(u"first").readsFrom(u"second");
    auto& second = database.addQuery(u"second").readsFrom(u"first");
    first.m_selectItems.AddTail(valueItem(u"*"));
    second.m_selectItems.AddTail(valueItem(u"*"));
    first.ResolveSources();
    second.ResolveSources();
    query.readsFrom(u"first");
    list.AddTail(valueItem(u"*"));
    EXPECT_TRUE(match(u"", u"a").IsEmpty());
}

}  // namespace
