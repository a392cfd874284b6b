#include "host/analysis_order.h"

#include <gtest/gtest.h>

#include <vector>

#include "tests/host/projects.h"

namespace zr::host::test {
namespace {

class AnalysisOrder : public testing::Test {
 protected:
    void add(const char16_t* name, const char16_t* sql) {
        auto query = std::make_unique<Query>(DB_MSSQL);
        setNames(*query, name);
        query->SetSQL(sql);
        database->addQuery(std::move(query));
    }
    std::string order() const {
        std::string names;
        for (const CZRQueryInfo* query : database->Queries)
            names += (names.empty() ? "" : " ") + query->GetSrcName().toUtf8();
        return names;
    }
    std::string complaint() {
        try {
            analyseQueries(*database);
        } catch (const CyclicQueries& ring) {
            return ring.what();
        }
        return {};
    }
    std::unique_ptr<Database> database = [] {
        auto project = smallProject();
        delete project->Queries.GetHead();
        project->Queries.RemoveAll();
        return project;
    }();
};

TEST_F(AnalysisOrder, QueriesStandBehindThoseThatTheyReadFrom) {
    add(u"c", u"SELECT id FROM b");
    add(u"b", u"SELECT id FROM A");
    add(u"a", u"SELECT id FROM orders");
    analyseQueries(*database);
    EXPECT_EQ(order(), "a b c");
    for (CZRQueryInfo* query : database->Queries) {
        EXPECT_EQ(query->m_selectItems.GetCount(), 1);
        EXPECT_EQ(query->m_sourceTables.GetCount(), 1) << "what the analysis found, and nothing besides";
        EXPECT_EQ(query->GetCorrect(), 0);
    }
    EXPECT_NE(database->FindQueryBySrcName(u"c")->FindFieldBySrcName(u"id"), nullptr)
        << "found through two queries in a table";
}

TEST_F(AnalysisOrder, TellsHowFarItIsAndCanBeEnded) {
    add(u"b", u"SELECT id FROM a");
    add(u"a", u"SELECT id FROM orders");
    std::string steps;
    const auto note = [&](std::size_t done, std::size_t all) {
        steps += std::to_string(done) + "/" + std::to_string(all) + " ";
    };
    analyseQueries(*database, note);
    EXPECT_EQ(steps, "0/2 1/2 ");
    steps.clear();
    analyseQueriesInRings(*database, note);
    EXPECT_EQ(steps, "0/2 1/2 ");
    const auto end = [](std::size_t done, std::size_t) {
        if (done == 1) throw std::out_of_range("ended");
    };
    EXPECT_THROW(analyseQueries(*database, end), std::out_of_range);
}

TEST_F(AnalysisOrder, NestedQueriesAndBranchesOfUnionsCount) {
    add(u"d", u"SELECT id FROM orders UNION SELECT id FROM c");
    add(u"c", u"SELECT id FROM orders WHERE id IN (SELECT id FROM b)");
    add(u"b", u"SELECT x.id FROM (SELECT id FROM a) x");
    add(u"a", u"SELECT id FROM orders");
    analyseQueries(*database);
    EXPECT_EQ(order(), "a b c d");
}

TEST_F(AnalysisOrder, RingsAreNamedAndLeaveTheOrder) {
    add(u"a", u"SELECT id FROM b");
    add(u"b", u"SELECT id FROM c");
    add(u"c", u"SELECT id FROM d, b");
    add(u"d", u"SELECT id FROM orders");
    EXPECT_EQ(complaint(), "queries read from each other in a ring: b reads from c reads from b");
    EXPECT_EQ(order(), "a b c d");
}

TEST_F(AnalysisOrder, RingsThroughNestedQueriesAreFound) {
    add(u"a", u"SELECT id FROM orders WHERE id IN (SELECT id FROM b)");
    add(u"b", u"SELECT id FROM orders UNION ALL SELECT id FROM a");
    EXPECT_EQ(complaint(), "queries read from each other in a ring: a reads from b reads from a");
}

TEST_F(AnalysisOrder, AQueryThatReadsFromItselfIsARing) {
    add(u"a", u"SELECT id FROM a");
    EXPECT_EQ(complaint(), "queries read from each other in a ring: a reads from a");
}

TEST_F(AnalysisOrder, ATableComesBeforeAQueryOfItsName) {
    add(u"orders", u"SELECT id FROM orders");
    EXPECT_EQ(complaint(), "");
}

TEST_F(AnalysisOrder, LongChainsAreOrdered) {
    constexpr int count = 2000;
    for (int number = count; number > 0; --number) {
        CString name;
        CString sql;
        name.Format(u"q%d", number);
        if (number == 1)
            sql = u"SELECT id FROM orders";
        else
            sql.Format(u"SELECT id FROM q%d", number - 1);
        add(name.GetString(), sql.GetString());
    }
    analyseQueries(*database);
    int number = 0;
    for (const CZRQueryInfo* query : database->Queries) {
        CString name;
        name.Format(u"q%d", ++number);
        EXPECT_EQ(query->GetSrcName(), name);
    }
    EXPECT_EQ(database->Queries.GetTail()->GetCorrect(), 0);
    CZRQueryInfo* first = database->Queries.GetHead();
    first->SetSQL(u"SELECT id FROM q2000");
    EXPECT_NE(complaint(), "");
}

TEST_F(AnalysisOrder, WrongTextsAreNoFailure) {
    add(u"a", u"what is this");
    add(u"b", u"");
    add(u"c", u"SELECT id FROM a");
    EXPECT_EQ(complaint(), "");
    EXPECT_EQ(order(), "a b c");
}

}  // namespace
}  // namespace zr::host::test
