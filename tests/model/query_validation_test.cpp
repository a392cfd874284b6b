#include <gtest/gtest.h>

#include "tests/model/small_host.h"
#include "tests/platform/print_string.h"

namespace {

using zr::test::Database;
using zr::test::Query;

class QueryValidation : public testing::Test {
 protected:
    QueryValidation() : table(database.addTable(u"t", {u"a", u"b"})), query(database.addQuery(u"q")) {
        query.readsFrom(u"t");
    }
    int validate() {
        query.ResolveSources();
        return query.GetCorrect();
    }

    Database database;
    zr::test::Table& table;
    Query& query;
};

TEST_F(QueryValidation, QueryOfKnownColumnsIsValidAndResolved) {
    query.refersTo(u"t", u"a").refersTo(u"", u"b");
    EXPECT_EQ(validate(), 0);
    EXPECT_EQ(query.Resolved, 1);
    EXPECT_EQ(query.Validate(1), 0);
}

TEST_F(QueryValidation, UnknownColumnIsAnError) {
    query.refersTo(u"t", u"c");
    EXPECT_EQ(validate(), 1);
    EXPECT_EQ(query.Resolved, 0);
    EXPECT_EQ(query.CheckFieldRefs(), 1);
    EXPECT_EQ(query.Validate(0), 1);
}

TEST_F(QueryValidation, UnknownColumnThatIsAnAliasIsNone) {
    query.refersTo(u"t", u"total").addAlias(u"Total");
    EXPECT_EQ(validate(), 0);
}

TEST_F(QueryValidation, ColumnThatIsNotSelectedIsAnError) {
    query.refersTo(u"t", u"a");
    table.field(u"a")->Selected = 0;
    EXPECT_EQ(validate(), 1);
}

TEST_F(QueryValidation, StarIsNotLookedUp) {
    query.refersTo(u"", u"*").refersTo(u"nowhere", u"*");
    EXPECT_EQ(query.CheckFieldRefs(), 0);
    EXPECT_EQ(query.Correct, 0) << "not even asked for";
}

TEST_F(QueryValidation, YesAndNoWithoutATableAreConstants) {
    query.refersTo(u"", u"Yes").refersTo(u"", u"NO");
    EXPECT_EQ(validate(), 0);
    query.refersTo(u"t", u"Yes");
    EXPECT_EQ(validate(), 1) << "with a table it is a column";
}

TEST_F(QueryValidation, ReferenceWithoutAColumnIsNoError) {
    query.refersTo(u"t", u"");
    query.m_fields[u"null"] = nullptr;
    EXPECT_EQ(validate(), 0);
}

TEST_F(QueryValidation, UnknownSourceIsAnError) {
    query.readsFrom(u"nowhere");
    EXPECT_EQ(validate(), 1);
}

TEST_F(QueryValidation, SourceThatIsNotSelectedIsAnErrorUnlessAnAliasHasItsId) {
    table.Selected = 0;
    EXPECT_EQ(validate(), 1);
    query.addAlias(table.ID);
    EXPECT_EQ(validate(), 0);
}

TEST_F(QueryValidation, StarAmongTheSourcesEndsTheirWalk) {
    query.m_sourceTables.RemoveAll();
    query.readsFrom(u"*").readsFrom(u"nowhere");
    EXPECT_EQ(validate(), 0);
    EXPECT_EQ(query.Resolved, 1);
}

TEST_F(QueryValidation, ErrorOfASourceIsTheQuerys) {
    table.SetCorrect(7);
    EXPECT_EQ(validate(), 7);
    EXPECT_EQ(query.Resolved, 0);
}

TEST_F(QueryValidation, WarningOfASourceStandsButResolvesNothing) {
    table.SetCorrect(101);
    EXPECT_EQ(validate(), 101);
    EXPECT_EQ(query.Resolved, 0);
}

TEST_F(QueryValidation, ResultOfTheLastSourceStands) {
    table.SetCorrect(101);
    database.addTable(u"u");
    query.readsFrom(u"u");
    EXPECT_EQ(validate(), 0);
}

TEST_F(QueryValidation, SourceThatIsAQueryIsValidatedToo) {
    auto& inner = database.addQuery(u"inner");
    inner.readsFrom(u"t").refersTo(u"t", u"c");
    inner.ResolveSources();
    query.readsFrom(u"inner");
    EXPECT_EQ(validate(), 1);
    delete inner.m_fields[u"tc"];
    inner.m_fields.RemoveAll();
    EXPECT_EQ(validate(), 0);
    EXPECT_EQ(inner.Resolved, 1);
}

TEST_F(QueryValidation, ErrorOfANestedQueryIsTheQuerys) {
    auto* good = new Query;
    auto* bad = new Query;
    bad->refersTo(u"nowhere", u"x");
    for (Query* nested : {good, bad}) {
        nested->SetDatabase(&database);
        query.m_subQueries.AddTail(nested);
    }
    EXPECT_EQ(validate(), 1);
    EXPECT_EQ(good->Resolved, 1);
    EXPECT_EQ(query.Resolved, 0);
}

TEST_F(QueryValidation, NestedQueriesWithoutErrorsTakeAWarningAway) {
    table.SetCorrect(101);
    query.m_subQueries.AddTail(new Query);
    EXPECT_EQ(validate(), 0);
    EXPECT_EQ(query.Resolved, 1);
}

TEST_F(QueryValidation, QueryThatIsNotSelectedIsUnresolvedFirst) {
    query.refersTo(u"t", u"c");
    query.Resolved = 1;
    query.Selected = 0;
    EXPECT_EQ(validate(), 1);
    EXPECT_EQ(query.Resolved, 0);
}

TEST_F(QueryValidation, OwnMarkIsNotTheResult) {
    query.SetCorrect(1);
    EXPECT_EQ(validate(), 0);
    EXPECT_EQ(query.Correct, 1);
}

TEST_F(QueryValidation, QueriesThatReadFromEachOtherCountAsValidToEachOther) {
    auto& other = database.addQuery(u"other").readsFrom(u"q");
    query.readsFrom(u"other");
    other.ResolveSources();
    EXPECT_EQ(validate(), 0);
}

}  // namespace
