#include <gtest/gtest.h>

#include "tests/model/small_host.h"
#include "tests/platform/print_string.h"

namespace {

using zr::test::Database;
using zr::test::Query;

class QueryLookup : public testing::Test {
 protected:
    QueryLookup()
        : orders(database.addTable(u"orders", {u"id", u"total"})), view(database.addQuery(u"view")) {
        view.readsFrom(u"orders").refersTo(u"orders", u"id");
    }
    void resolve() {
        for (CZRQueryInfo* each : database.Queries) each->ResolveSources();
    }

    Database database;
    zr::test::Table& orders;
    Query& view;
};

TEST_F(QueryLookup, ColumnOfATableIsFoundWithoutRegardToCase) {
    resolve();
    EXPECT_EQ(view.FindField(u"ORDERS", u"Total"), orders.field(u"total"));
    EXPECT_EQ(view.FindField(u"", u"TOTAL"), orders.field(u"total"));
    EXPECT_EQ(view.FindField(u"orders", u"nothing"), nullptr);
    EXPECT_EQ(view.Correct, 0);
}

TEST_F(QueryLookup, UnknownTableMarksTheQuery) {
    resolve();
    EXPECT_EQ(view.FindField(u"nowhere", u"id"), nullptr);
    EXPECT_EQ(view.Correct, 1);
}

TEST_F(QueryLookup, UnknownSourceEndsAnUnqualifiedSearchAndMarksTheQuery) {
    auto& query = database.addQuery(u"q").readsFrom(u"nowhere").readsFrom(u"orders");
    query.ResolveSources();
    EXPECT_EQ(query.FindField(u"", u"id"), nullptr);
    EXPECT_EQ(query.Correct, 1);
}

TEST_F(QueryLookup, UnqualifiedColumnIsTakenFromTheFirstSourceThatHasIt) {
    auto& customers = database.addTable(u"customers", {u"id", u"name"});
    auto& query = database.addQuery(u"q").readsFrom(u"customers").readsFrom(u"orders");
    resolve();
    EXPECT_EQ(query.FindField(u"", u"id"), customers.field(u"id"));
    EXPECT_EQ(query.FindField(u"", u"total"), orders.field(u"total"));
}

TEST_F(QueryLookup, UnqualifiedColumnGoesThroughQueriesAndTheirAliases) {
    auto& alias = view.addAlias(u"amount");
    auto& query = database.addQuery(u"q").readsFrom(u"view");
    resolve();
    EXPECT_EQ(query.FindField(u"", u"total"), orders.field(u"total"));
    query.Resolved = 0;
    EXPECT_EQ(query.FindField(u"", u"AMOUNT"), &alias);
    EXPECT_EQ(query.Resolved, 1);
    EXPECT_EQ(query.FindField(u"", u"nothing"), nullptr);
}

TEST_F(QueryLookup, ColumnOfAnUnresolvedQueryIsOneOfItsResultColumns) {
    auto& alias = view.addAlias(u"amount");
    auto& query = database.addQuery(u"q").readsFrom(u"view");
    resolve();
    view.Resolved = 0;
    EXPECT_EQ(query.FindField(u"view", u"id"), orders.field(u"id"));
    EXPECT_EQ(query.FindField(u"view", u"total"), nullptr) << "the query does not select it";
    EXPECT_EQ(query.FindField(u"view", u"amount"), &alias);
    EXPECT_EQ(view.Resolved, 1);
}

TEST_F(QueryLookup, ColumnOfAResolvedQueryGoesByItsReferences) {
    view.addAlias(u"amount", u"total");
    auto& query = database.addQuery(u"q").readsFrom(u"view");
    resolve();
    view.Resolved = 1;
    EXPECT_EQ(query.FindField(u"view", u"id"), orders.field(u"id"));
    EXPECT_EQ(query.FindField(u"view", u"amount"), orders.field(u"total")) << "the alias leads to its column";
    EXPECT_EQ(query.FindField(u"view", u"nothing"), nullptr);
}

TEST_F(QueryLookup, StarOfAResolvedQueryStandsForItsSources) {
    auto& all = database.addQuery(u"all").readsFrom(u"orders").refersTo(u"", u"*");
    auto& query = database.addQuery(u"q").readsFrom(u"all");
    resolve();
    for (int resolved : {0, 1}) {
        all.Resolved = resolved;
        EXPECT_EQ(query.FindField(u"all", u"total"), orders.field(u"total")) << resolved;
    }
}

TEST_F(QueryLookup, FieldInSourcesSkipsUnknownSources) {
    auto& query = database.addQuery(u"q").readsFrom(u"nowhere").readsFrom(u"orders");
    resolve();
    EXPECT_EQ(query.FindFieldInSources(u"id"), orders.field(u"id"));
    EXPECT_EQ(query.FindFieldInSources(u"nothing"), nullptr);
    EXPECT_EQ(query.Correct, 0);
}

TEST_F(QueryLookup, ResultColumnMustBeSelectedUnderThatName) {
    auto& alias = view.addAlias(u"amount");
    resolve();
    EXPECT_EQ(view.FindFieldBySrcName(u"ID"), orders.field(u"id"));
    EXPECT_EQ(view.FindFieldBySrcName(u"total"), nullptr);
    view.Resolved = 0;
    EXPECT_EQ(view.FindFieldBySrcName(u"Amount"), &alias);
    EXPECT_EQ(view.Resolved, 1);
}

TEST_F(QueryLookup, NullReferencesAreSkipped) {
    view.m_fields[u"null"] = nullptr;
    auto& query = database.addQuery(u"q").readsFrom(u"view");
    resolve();
    for (int resolved : {0, 1}) {
        view.Resolved = resolved;
        EXPECT_EQ(query.FindField(u"view", u"nothing"), nullptr);
    }
}

TEST_F(QueryLookup, SubQueriesAreSearchedByAliasNames) {
    view.addAlias(u"Amount");
    auto& middle = database.addQuery(u"middle").readsFrom(u"view");
    auto& query = database.addQuery(u"q").readsFrom(u"orders").readsFrom(u"middle");
    resolve();
    CZRQueryInfo* found = nullptr;
    EXPECT_EQ(query.FindInSubQueries(u"", u"AMOUNT", found), 1);
    EXPECT_EQ(found, &view);
    found = nullptr;
    EXPECT_EQ(query.FindInSubQueries(u"amount", u"x", found), 1) << "the table's name may be the alias";
    EXPECT_EQ(found, &view);
    found = &middle;
    EXPECT_EQ(query.FindInSubQueries(u"t", u"x", found), 0);
    EXPECT_EQ(found, &middle);
}

TEST_F(QueryLookup, QueriesThatReadFromEachOtherFindNothing) {
    auto& first = database.addQuery(u"first").readsFrom(u"second").refersTo(u"second", u"x");
    auto& second = database.addQuery(u"second").readsFrom(u"first").refersTo(u"first", u"x");
    resolve();
    CZRQueryInfo* found = nullptr;
    for (int resolved : {0, 1}) {
        first.Resolved = second.Resolved = resolved;
        EXPECT_EQ(first.FindField(u"", u"x"), nullptr);
        EXPECT_EQ(first.FindField(u"second", u"x"), nullptr);
        EXPECT_EQ(first.FindFieldBySrcName(u"x"), nullptr);
        EXPECT_EQ(first.FindFieldInSources(u"x"), nullptr);
        EXPECT_EQ(first.FindInSubQueries(u"", u"x", found), 0);
    }
    EXPECT_EQ(first.GetCorrect(), 1);
}

TEST_F(QueryLookup, QueryThatReadsFromItselfFindsNothing) {
    auto& query = database.addQuery(u"self").readsFrom(u"self").refersTo(u"self", u"*");
    resolve();
    EXPECT_EQ(query.FindField(u"self", u"x"), nullptr);
    EXPECT_EQ(query.FindField(u"", u"x"), nullptr);
    EXPECT_EQ(query.FindFieldBySrcName(u"x"), nullptr);
}

TEST_F(QueryLookup, DiamondsOfQueriesAreSearchedOnce) {
    // Two queries a level, each reading from both of the level below: 2^40 ways down.
    CString left = u"orders";
    CString right = u"orders";
    for (int level = 0; level < 40; ++level) {
        CString nextLeft;
        CString nextRight;
        nextLeft.Format(u"left%d", level);
        nextRight.Format(u"right%d", level);
        for (const CString& name : {nextLeft, nextRight})
            database.addQuery(name).readsFrom(left).readsFrom(right).refersTo(u"", u"*");
        left = nextLeft;
        right = nextRight;
    }
    resolve();
    CZRQueryInfo* top = database.Queries.GetTail();
    CZRQueryInfo* found = nullptr;
    EXPECT_EQ(top->FindField(u"", u"nothing"), nullptr);
    EXPECT_EQ(top->FindFieldBySrcName(u"nothing"), nullptr);
    EXPECT_EQ(top->FindFieldBySrcName(u"total"), orders.field(u"total"));
    EXPECT_EQ(top->FindInSubQueries(u"t", u"nothing", found), 0);
    EXPECT_EQ(top->GetCorrect(), 0);
}

TEST_F(QueryLookup, FollowsEveryChangeOfTheModel) {
    auto& query = database.addQuery(u"q").readsFrom(u"orders");
    resolve();
    database.Tables.AddTail(nullptr);
    EXPECT_EQ(query.FindField(u"orders", u"id"), orders.field(u"id"));
    orders.SrcName = u"renamed";
    EXPECT_EQ(query.FindField(u"orders", u"id"), nullptr);
    EXPECT_EQ(query.FindField(u"renamed", u"id"), orders.field(u"id"));
    EXPECT_EQ(query.FindField(u"", u"id"), orders.field(u"id"));
    orders.ID = u"another";
    EXPECT_EQ(query.FindField(u"", u"id"), nullptr);
    auto& second = database.addTable(u"second", {u"id"});
    EXPECT_EQ(query.FindField(u"second", u"id"), second.field(u"id"));
    orders.SrcName = u"SECOND";
    EXPECT_EQ(query.FindField(u"second", u"id"), orders.field(u"id")) << "the first in list order";
    orders.SrcName.Empty();
    EXPECT_EQ(query.FindField(u"second", u"id"), second.field(u"id"));
    database.Tables.RemoveAt(database.Tables.GetHeadPosition());
    database.Tables.AddTail(&orders);
    orders.SrcName = u"second";
    EXPECT_EQ(query.FindField(u"second", u"id"), second.field(u"id"));
}

TEST(QueryLookupWithoutDatabase, FindsNothing) {
    Query query;
    query.readsFrom(u"t").refersTo(u"t", u"a");
    EXPECT_EQ(query.FindField(u"t", u"a"), nullptr);
    EXPECT_EQ(query.FindField(u"", u"a"), nullptr);
    EXPECT_EQ(query.Correct, 1);
    query.ResolveSources();
    EXPECT_EQ(query.HasQuerySource(), 0);
    EXPECT_EQ(query.GetCorrect(), 1);
}

}  // namespace
