#include <gtest/gtest.h>

#include <random>
#include <string>

#include "tests/model/small_host.h"

namespace {

using zr::test::Database;
using zr::test::Query;

std::string sorted(Database& database) {
    for (CZRQueryInfo* query : database.Queries) query->ResolveSources();
    database.SortQueries();
    std::string names;
    for (const CZRQueryInfo* query : database.Queries) names += query->GetSrcName().toUtf8();
    return names;
}

TEST(DatabaseOrder, QueryStandsBehindTheOnesItReadsFrom) {
    Database database;
    database.addQuery(u"c").readsFrom(u"b");
    database.addQuery(u"b").readsFrom(u"a");
    database.addQuery(u"a");
    EXPECT_EQ(sorted(database), "abc");
}

TEST(DatabaseOrder, QueryBroughtForwardIsLookedAtAgain) {
    Database database;
    database.addQuery(u"c").readsFrom(u"b");
    database.addQuery(u"a");
    database.addQuery(u"b").readsFrom(u"a");
    EXPECT_EQ(sorted(database), "abc");
}

TEST(DatabaseOrder, IndependentQueriesKeepTheirOrder) {
    Database database;
    for (const char16_t* name : {u"d", u"a", u"c", u"b"}) database.addQuery(name);
    EXPECT_EQ(sorted(database), "dacb");
}

TEST(DatabaseOrder, SourcesOfUnionBranchesCountAtAnyDepth) {
    Database database;
    Query& query = database.addQuery(u"c");
    CZRQueryInfo* at = &query;
    for (int level = 0; level < 3; ++level) {
        auto* branch = new SelectItemUnion;
        branch->m_query = new CZRQueryInfo;
        branch->m_query->SetDatabase(&database);
        at->m_unionItems.AddTail(branch);
        at = branch->m_query;
    }
    database.addQuery(u"a");
    at->m_sourceTables[u"a"] = u"a";
    at->ResolveSources();
    EXPECT_EQ(sorted(database), "ac");
}

TEST(DatabaseOrder, SourcesOfUnionBranchesDoNotCountForOracle) {
    Database database;
    database.type = DB_ORACLE;
    Query& query = database.addQuery(u"c");
    auto* branch = new SelectItemUnion;
    branch->m_query = new CZRQueryInfo;
    branch->m_query->SetDatabase(&database);
    query.m_unionItems.AddTail(branch);
    database.addQuery(u"a");
    branch->m_query->m_sourceTables[u"a"] = u"a";
    branch->m_query->ResolveSources();
    EXPECT_EQ(sorted(database), "ca");
}

TEST(DatabaseOrder, QueriesThatReadFromEachOtherStayInSomeOrder) {
    Database database;
    database.addQuery(u"a").readsFrom(u"b").readsFrom(u"a");
    database.addQuery(u"b").readsFrom(u"a");
    database.addQuery(u"c").readsFrom(u"b");
    EXPECT_EQ(sorted(database).size(), 3u);
    EXPECT_EQ(database.Queries.GetTail()->GetSrcName(), u"c");
}

TEST(DatabaseOrder, RandomDependenciesEndUpInOrder) {
    std::mt19937 random(11);
    for (int round = 0; round < 50; ++round) {
        Database database;
        constexpr int kCount = 40;
        std::vector<int> rank(kCount);
        for (int number = 0; number < kCount; ++number) rank[static_cast<std::size_t>(number)] = number;
        std::shuffle(rank.begin(), rank.end(), random);
        const auto nameOf = [](int number) {
            CString name;
            name.Format(u"q%d", number);
            return name;
        };
        for (int number : rank) {
            Query& query = database.addQuery(nameOf(number));
            for (int edges = 0; edges < 3 && number > 0; ++edges)
                query.readsFrom(nameOf(static_cast<int>(random() % static_cast<unsigned>(number))));
        }
        sorted(database);
        zr::StringMap<int> seen;
        for (const CZRQueryInfo* query : database.Queries) {
            for (const auto& source : query->m_sourceTables) ASSERT_TRUE(seen.Contains(source.value));
            seen[query->GetID()] = 1;
        }
        EXPECT_EQ(seen.GetCount(), kCount);
    }
}

TEST(DatabaseOrder, LongChainsInReverseAreSortedInTime) {
    Database database;
    constexpr int kCount = 1000;
    for (int number = kCount; number > 0; --number) {
        CString name;
        CString source;
        name.Format(u"q%d", number);
        source.Format(u"q%d", number - 1);
        database.addQuery(name).readsFrom(source);
    }
    sorted(database);
    EXPECT_EQ(database.Queries.GetHead()->GetSrcName(), u"q1");
    EXPECT_EQ(database.Queries.GetTail()->GetSrcName(), u"q1000");
}

}  // namespace
