// What the analysis does when memory runs out: a program of its own, since it replaces the global operator
// new.
#include <gtest/gtest.h>

#include "tests/analysis/analysed.h"
#include "tests/analysis/descriptor_text.h"
#include "tests/analysis/failing_heap.h"
#include "zrparsersql/sql_parsers.h"

namespace {

constexpr const char16_t* kSql =
    u"SELECT TOP 5 a AS x, t.b + 'c d', {fn UCASE(e)}, CAST(f AS VARCHAR(3)), dbo.g(1) FROM t INNER JOIN u "
    u"ON t.h = u.i "
    u"WHERE j IN (SELECT k FROM v WHERE l = 1 ORDER BY m DESC) UNION ALL SELECT n FROM w";

TEST(ExhaustedHeap, AnAnalysisThatFailsAnywhereNeitherThrowsNorLeaks) {
    long failures = 0;
    for (bool isDone = false; !isDone; ++failures) {
        ASSERT_LT(failures, 100'000);
        TestDatabase database;
        CZRQueryInfo query;
        query.SetDatabase(&database);
        query.SetSQL(kSql);
        {
            OneFailure failure(failures);
            EXPECT_NO_THROW(BuildQueryInfo(&query, DB_MSSQL)) << failures;
            isDone = !failure.happened();
        }
        if (isDone) {
            EXPECT_EQ(listText(query.m_unionItems), "(8 name=UNION query)");
        }
    }
    // Every allocation of the analysis has failed once.
    EXPECT_GT(failures, 100);
}

TEST(ExhaustedHeap, AFacadeThatFailsAnywhereNeitherThrowsNorLeaks) {
    for (long successes = 0;; ++successes) {
        ASSERT_LT(successes, 100'000);
        CString text = kSql;
        OneFailure failure(successes);
        EXPECT_NO_THROW({
            CZRMSSQLParser facade;
            facade.SetSQL(text);
            facade.ParseSQL();
            CZRSQLTree* tree = nullptr;
            facade.GetSQLTree(&tree);
            delete tree;
        }) << successes;
        if (!failure.happened()) break;
    }
}

}  // namespace
