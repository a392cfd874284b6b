// What parse, analysis and copy do when memory runs out, at each of their allocations in turn: nothing ends
// the process or leaks, and the descriptor can be read, copied and destroyed.
#include <gtest/gtest.h>

#include <memory>
#include <new>
#include <string>

#include "tests/analysis/analysed.h"
#include "tests/analysis/plain_descriptor.h"
#include "tests/faults/failing_heap.h"
#include "zrparsersql/query_text.h"
#include "zrparsersql/sql_parsers.h"

namespace zr::faults {
namespace {

struct Case {
    const char* name;
    DBTypes kind;
    const char16_t* sql;
    void (*parse)(CString& text);
};

// What a host does with a facade. Its trees tell of an exhausted heap, the facade itself does not.
template <class Facade>
void parse(CString& text) {
    Facade facade;
    facade.SetSQL(text);
    facade.ParseSQL();
    facade.ParseSQL();
    CZRSQLTree* tree = nullptr;
    facade.GetSQLTree(&tree);
    const std::unique_ptr<CZRSQLTree> owned(tree);
    if (!tree) return;
    try {
        for (CZRSQLTree* node = tree; node->GetChildCount(); node = node->GetChild(0)) node->GetText();
    } catch (const std::bad_alloc&) {
    }
}

/// The quick search has to remember to read this.
const Case kManyReadings = {
    "MssqlManyReadings", DB_MSSQL,
    u"SELECT city, COUNT(id), SUM(total), MAX(total) FROM orders WHERE status = 'open' GROUP BY city HAVING "
    u"COUNT(id) > 5 ORDER BY city",
    &parse<CZRMSSQLParser>};

/// Left to the full search by the quick one.
const Case kManyEnds = {"MssqlManyEnds", DB_MSSQL,
                        u"SELECT ABS(ABS(ABS(ABS(ABS(ABS(ABS(ABS(ABS(ABS(ABS(ABS("
                        u"ABS(ABS(ABS(ABS(ABS(ABS(ABS(ABS(ABS(ABS(ABS(ABS(a))))))))))))"
                        u")))))))))))) FROM t WHERE b = 1",
                        &parse<CZRMSSQLParser>};

const Case kCases[] = {
    {"Mssql", DB_MSSQL,
     u"SELECT TOP 5 a AS x, t.b + 'c d', {fn UCASE(e)}, CAST(f AS VARCHAR(3)), dbo.g(1) FROM t INNER JOIN u "
     u"ON t.h = u.i WHERE j IN (SELECT k FROM v WHERE l = 1 ORDER BY m DESC) UNION ALL SELECT n FROM w",
     &parse<CZRMSSQLParser>},
    kManyReadings,
    kManyEnds,
    {"Mysql", DB_MYSQL,
     u"SELECT DISTINCT a AS x, t.b + 1, ABS(c) FROM t AS y INNER JOIN u ON t.h = u.i WHERE j IN "
     u"(SELECT k FROM v) GROUP BY a ORDER BY a DESC LIMIT 5",
     &parse<CZRMySQLParcer>},
    {"Oracle", DB_ORACLE,
     u"SELECT a AS x, t.b || c, UPPER(d) FROM t, (SELECT e FROM f) s WHERE t.g = s.e AND h IN (1, 2) "
     u"ORDER BY a",
     &parse<CZROracleParser>},
    {"Postgresql", DB_POSTGRESQL,
     u"SELECT a AS x, t.b + 1 AS y, ABS(t.c) AS z FROM s.t AS t INNER JOIN u ON t.h = u.i WHERE j IN "
     u"(SELECT k FROM v) ORDER BY a LIMIT 5",
     &parse<CZRPostgreParser>},
    {"PostgresqlInsert", DB_POSTGRESQL, u"INSERT INTO t (a, b) VALUES (1, 'x')", &parse<CZRPostgreParser>},
    {"Msaccess", DB_MSACCESS,
     u"SELECT [t.a] AS x, Left(b, 2) AS y, x & y AS z FROM t INNER JOIN u ON t.h = u.i WHERE (((j) In "
     u"(SELECT k FROM v)) AND ((l) Like 'm*')) ORDER BY a DESC",
     &parse<CZRMSAccessSQL_v3Parcer>},
    {"NoStatement", DB_MSSQL, u"WITH x AS (SELECT 1) SELECT", &parse<CZRMSSQLParser>},
};

struct Attempted {
    Case what;
    Failure::Lasts lasts;
};

class Exhausted : public testing::TestWithParam<Attempted> {
 protected:
    const Case& what() const { return GetParam().what; }
    Failure failure(long successes) const { return Failure(successes, GetParam().lasts); }
};

std::string analysed(CZRQueryInfo& query, const Case& what) {
    query.SetSQL(what.sql);
    BuildQueryInfo(&query, what.kind);
    return plainDescriptor(query);
}

/// What a thread keeps for its next text must be fit for that, however the last one ended.
TEST_P(Exhausted, TheNextTextsOfTheThreadAreReadAsEver) {
    const auto descriptorOf = [](const Case& next) {
        CZRQueryInfo query;
        return analysed(query, next);
    };
    const std::string expected = descriptorOf(kManyReadings) + descriptorOf(kManyEnds);
    const std::string expectedOwn = descriptorOf(what());
    const long allocations = failEach([&](long successes) {
        bool happened = false;
        {
            CZRQueryInfo query;
            query.SetSQL(what().sql);
            const Failure failing = failure(successes);
            BuildQueryInfo(&query, what().kind);
            happened = failing.happened();
        }
        EXPECT_EQ(descriptorOf(kManyReadings) + descriptorOf(kManyEnds), expected) << successes;
        EXPECT_EQ(descriptorOf(what()), expectedOwn) << successes;
        return happened && !testing::Test::HasFailure();
    });
    EXPECT_GT(allocations, 5);
}

TEST_P(Exhausted, AnAnalysisLeavesADescriptorThatCanBeReadCopiedAndAnalysedAnew) {
    TestDatabase whole;
    CZRQueryInfo wanted;
    wanted.SetDatabase(&whole);
    const std::string expected = analysed(wanted, what());
    const long allocations = failEach([&](long successes) {
        TestDatabase database;
        CZRQueryInfo query;
        query.SetDatabase(&database);
        query.SetSQL(what().sql);
        bool happened = false;
        {
            const Failure failing = failure(successes);
            EXPECT_NO_THROW(BuildQueryInfo(&query, what().kind)) << successes;
            happened = failing.happened();
        }
        const std::string left = plainDescriptor(query);
        const std::unique_ptr<CZRQueryInfo> copy(query.Clone());
        EXPECT_EQ(plainDescriptor(*copy), left) << successes;
        if (!happened) {
            EXPECT_EQ(left, expected);
        }
        BuildQueryInfo(&query, what().kind);
        EXPECT_FALSE(plainDescriptor(query).empty());
        return happened && !testing::Test::HasFailure();
    });
    EXPECT_GT(allocations, 5);
}

TEST_P(Exhausted, AFacadeNeitherThrowsNorLeaks) {
    const long allocations = failEach([&](long successes) {
        CString text = what().sql;
        const Failure failing = failure(successes);
        EXPECT_NO_THROW(what().parse(text)) << successes;
        return failing.happened();
    });
    EXPECT_GT(allocations, 5);
}

TEST_P(Exhausted, ACopyIsWholeOrThrows) {
    TestDatabase database;
    CZRQueryInfo query;
    query.SetDatabase(&database);
    const std::string expected = analysed(query, what());
    failEach([&](long successes) {
        std::unique_ptr<CZRQueryInfo> copy;
        bool happened = false;
        {
            const Failure failing = failure(successes);
            try {
                copy.reset(query.Clone());
            } catch (const std::bad_alloc&) {
            }
            happened = failing.happened();
        }
        EXPECT_EQ(copy == nullptr, happened) << successes;
        if (copy) {
            EXPECT_EQ(plainDescriptor(*copy), expected) << successes;
        }
        EXPECT_EQ(plainDescriptor(query), expected) << successes;
        return happened && !testing::Test::HasFailure();
    });
}

TEST_P(Exhausted, AnEndNeedsNoMemory) {
    TestDatabase database;
    auto query = std::make_unique<CZRQueryInfo>();
    query->SetDatabase(&database);
    analysed(*query, what());
    query->m_unions.AddTail(new CZRQueryUnionInfo);
    query->m_unions.GetTail()->Query = query->Clone();
    analysed(*query, what());  // so that something is retired
    std::unique_ptr<CZRQueryInfo> copy(query->Clone());
    const Failure failing(0, Failure::Lasts::ToTheEnd);
    query.reset();
    copy.reset();
    EXPECT_FALSE(failing.happened());
}

TEST(ExhaustedHeap, TheEndOfADeepDescriptorNeedsNoMemory) {
    constexpr int kDepth = 10'000;
    std::u16string sql;
    for (int i = 0; i < kDepth; ++i) sql += u"SELECT a FROM t WHERE b IN (";
    sql += u"SELECT c FROM u";
    sql.append(kDepth, u')');
    auto query = std::make_unique<Analysed>(sql);
    EXPECT_NE(query->query.m_whereItem, nullptr);
    const Failure failing(0, Failure::Lasts::ToTheEnd);
    query.reset();
    EXPECT_FALSE(failing.happened());
}

TEST_P(Exhausted, WorkOnRawTextThrowsAndLeavesTheQueryWhole) {
    const CString text = CString(what().sql) + u" UNION ALL SELECT b FROM u UNION SELECT c FROM v";
    failEach([&](long successes) {
        TestDatabase database;
        CZRQueryInfo query;
        query.SetDatabase(&database);
        query.SetSQL(text);
        bool happened = false;
        {
            const Failure failing = failure(successes);
            try {
                PrepareAccessQueryText(text);
                FindJoinPart(text);
                GetFromClauseText(text);
                SplitUnions(text, &query);
            } catch (const std::bad_alloc&) {
            }
            happened = failing.happened();
        }
        for (const CZRQueryUnionInfo* branch : query.m_unions) EXPECT_NE(branch->Query, nullptr) << successes;
        return happened && !testing::Test::HasFailure();
    });
}

std::vector<Attempted> attempts() {
    std::vector<Attempted> all;
    for (const Case& what : kCases)
        for (const Failure::Lasts lasts : {Failure::Lasts::Once, Failure::Lasts::ToTheEnd})
            all.push_back({what, lasts});
    return all;
}

INSTANTIATE_TEST_SUITE_P(Heap, Exhausted, testing::ValuesIn(attempts()), [](const auto& attempted) {
    return std::string(attempted.param.what.name) +
           (attempted.param.lasts == Failure::Lasts::Once ? "Once" : "FromThenOn");
});

}  // namespace
}  // namespace zr::faults
