// What library and host hand each other across the edge of the shared library. Each side has its own copy of
// the descriptors' code; run-time type tests, virtual calls, exceptions and destruction have to work all the
// same.

#include <gtest/gtest.h>
#include <zrparsersql/analysis.h>
#include <zrparsersql/diagnostics.h>
#include <zrparsersql/nested_queries.h>
#include <zrparsersql/parse_exception.h>
#include <zrparsersql/sql_parsers.h>

#include <cstring>
#include <memory>
#include <string>
#include <typeinfo>

#include "tests/model/small_host.h"

namespace zr::test {
namespace {

/// The virtual table that an object points to.
const void* tableOf(const void* object) {
    const void* table = nullptr;
    std::memcpy(&table, object, sizeof table);
    return table;
}

class Boundary : public testing::Test {
 protected:
    Boundary() { query.SetDatabase(&database); }

    void analyse(const char16_t* sql) {
        query.SetSQL(sql);
        BuildQueryInfo(&query, DB_MSSQL);
    }

    /// The comparison of a WHERE clause of one, and its right side.
    SelectItem* comparison() { return query.m_whereItem->m_items.GetHead(); }
    SelectItem* rightSide() { return comparison()->m_items.GetTail(); }

    Database database;
    Query query;
};

constexpr const char16_t* kNested = u"SELECT a FROM t WHERE x = (SELECT b FROM u) UNION SELECT c FROM v";

TEST_F(Boundary, EachSideHasItsOwnCodeOfOneClass) {
    analyse(u"SELECT a FROM t");
    ASSERT_EQ(query.m_selectItems.GetCount(), 1);
    const SelectItem* theirs = query.m_selectItems.GetHead();
    const SelectItemField ours;
    EXPECT_EQ(typeid(*theirs), typeid(ours));
    EXPECT_NE(tableOf(theirs), tableOf(&ours)) << "otherwise the tests below cross no boundary";
}

TEST_F(Boundary, AHostTellsTheClassesOfItemsThatTheLibraryMade) {
    analyse(kNested);
    SelectItem* field = query.m_selectItems.GetHead();
    EXPECT_NE(dynamic_cast<SelectItemField*>(field), nullptr);
    EXPECT_EQ(dynamic_cast<SelectItemSubQuery*>(field), nullptr);
    EXPECT_EQ(dynamic_cast<SelectItemUnion*>(field), nullptr);
    EXPECT_EQ(dynamic_cast<SelectItemField*>(comparison()), nullptr);
    EXPECT_NE(dynamic_cast<SelectItemSubQuery*>(rightSide()), nullptr);
    EXPECT_EQ(dynamic_cast<SelectItemField*>(rightSide()), nullptr);
    EXPECT_NE(dynamic_cast<SelectItemUnion*>(query.m_unionItems.GetHead()), nullptr);
}

TEST_F(Boundary, ANestedQueryOfTheLibraryIsASourceToTheHost) {
    analyse(kNested);
    auto* item = dynamic_cast<SelectItemSubQuery*>(rightSide());
    ASSERT_NE(item, nullptr);
    CZRObjectInfo* object = item->m_query;
    EXPECT_NE(dynamic_cast<CZRSourceInfo*>(object), nullptr);
    EXPECT_NE(dynamic_cast<CZRQueryInfo*>(object), nullptr);
    EXPECT_EQ(dynamic_cast<Query*>(object), nullptr) << "the host's own class is not what the library makes";
    EXPECT_EQ(dynamic_cast<CZRTableInfo*>(object), nullptr);
    EXPECT_EQ(withNestedQueries(query).size(), 3U) << "the host's code, over objects of both sides";
}

TEST_F(Boundary, TheLibraryTellsTheClassesOfAHostsSources) {
    const Table& table = database.addTable(u"t", {u"a"});
    const Query& view = database.addQuery(u"v");
    analyse(u"SELECT a FROM t, v, w");
    EXPECT_EQ(query.m_sourceTables[u"t"], table.GetID());
    EXPECT_EQ(query.m_sourceTables[u"v"], view.GetID());
    EXPECT_EQ(query.m_sourceTables[u"w"], u"w");
}

TEST_F(Boundary, TheLibraryWritesIntoTheHostsDatabase) {
    analyse(u"SELECT dbo.f(a, b) FROM t");
    EXPECT_EQ(database.UserFunctions.GetCount(), 1);
}

TEST_F(Boundary, AHostClonesWhatTheLibraryMadeAndDeletesBoth) {
    analyse(kNested);
    const std::unique_ptr<Query> copy(query.Clone());
    EXPECT_EQ(copy->m_selectItems.GetCount(), 1);
    EXPECT_NE(dynamic_cast<SelectItemUnion*>(copy->m_unionItems.GetHead()), nullptr);
    const std::unique_ptr<SelectItem> item(rightSide()->Clone());
    EXPECT_NE(dynamic_cast<SelectItemSubQuery*>(item.get()), nullptr);
}

TEST_F(Boundary, AHostReplacesWhatTheLibraryMade) {
    analyse(u"SELECT a FROM t");
    delete query.m_selectItems.GetHead();
    query.m_selectItems.RemoveAll();
    query.m_selectItems.AddTail(fieldItem(u"t", u"b"));
    analyse(u"SELECT c, d FROM t");
    EXPECT_EQ(query.m_selectItems.GetCount(), 2);
}

TEST_F(Boundary, AnExceptionOfTheLibrarysCodeReachesTheHost) {
    analyse(u"SELECT a + 1 FROM t");
    SelectItem* sum = query.m_selectItems.GetHead();
    ASSERT_NE(tableOf(sum), tableOf(std::make_unique<SelectItem>().get()));
    ASSERT_EQ(sum->m_isOperator, 1);
    sum->ClearItems();
    EXPECT_THROW(sum->GetExpressionText(), CInvalidArgException);
    EXPECT_THROW(sum->GetExpressionText(), std::exception);
}

class HostError : public CZRParseSQLException {
 public:
    HostError() : CZRParseSQLException(u"text", 5) {}
    CString GetErrMessage() override { return u"of the host"; }
};

TEST_F(Boundary, AnExceptionIsCaughtByEachOfItsBases) {
    EXPECT_THROW(throw HostError(), CZRParseSQLException);
    EXPECT_THROW(throw HostError(), CZRException);
    try {
        throw HostError();
    } catch (CZRException& error) {
        EXPECT_EQ(error.GetErrMessage(), u"of the host");
        EXPECT_EQ(error.GetErrCode(), 5);
        EXPECT_NE(dynamic_cast<HostError*>(&error), nullptr);
        EXPECT_NE(dynamic_cast<CZRParseSQLException*>(&error), nullptr);
    }
}

TEST_F(Boundary, ABlankBoxReachesTheFunctionThatTheHostSet) {
    static int shown;
    shown = 0;
    const auto before = zrSetMessageBoxFunction([](void*, const char16_t*, const char16_t*, std::uint32_t) {
        ++shown;
        return 1;
    });
    HostError().DoMessageBox(nullptr);
    zrSetMessageBoxFunction(before);
    EXPECT_EQ(shown, 1);
}

TEST_F(Boundary, ReportsReachTheFunctionThatTheHostSet) {
    int reports = 0;
    zrSetDiagnosticFunction([](void* user, const char16_t*, std::uint32_t) { ++*static_cast<int*>(user); },
                            &reports);
    analyse(u"SELECT a FROM t");
    zrSetDiagnosticFunction(nullptr, nullptr);
    EXPECT_EQ(reports, 3) << "one for each blank";
}

int pressNo(void*, const char16_t*, const char16_t*, std::uint32_t) {
    return 7;
}
void countReport(void* user, const char16_t*, std::uint32_t) {
    ++*static_cast<int*>(user);
}

/// What is set now.
ZRDiagnostics settings() {
    ZRDiagnostics now{};
    zrSetDiagnostics(0, &now);
    return now;
}

TEST_F(Boundary, WhatWasSetIsHandedBackAndCanBeRestored) {
    const ZRDiagnostics initial = settings();
    EXPECT_EQ(initial.report, nullptr);
    EXPECT_EQ(initial.user, nullptr);
    EXPECT_EQ(initial.box, nullptr);

    int reports = 0;
    ZRDiagnostics mine{&countReport, &reports, &pressNo};
    zrSetDiagnostics(ZR_SET_REPORTS | ZR_SET_BOX, &mine);
    EXPECT_EQ(mine.report, nullptr);
    EXPECT_EQ(mine.box, nullptr);
    EXPECT_EQ(settings().report, &countReport);
    EXPECT_EQ(settings().user, &reports);
    EXPECT_EQ(settings().box, &pressNo);

    zrSetDiagnostics(ZR_SET_REPORTS | ZR_SET_BOX, &mine);
    EXPECT_EQ(settings().report, nullptr);
    EXPECT_EQ(settings().user, nullptr);
    EXPECT_EQ(settings().box, nullptr);
}

TEST_F(Boundary, ReportsAndTheBoxAreSetApart) {
    int reports = 0;
    zrSetDiagnosticFunction(&countReport, &reports);
    EXPECT_EQ(zrSetMessageBoxFunction(&pressNo), nullptr);
    EXPECT_EQ(settings().report, &countReport);
    zrSetDiagnosticFunction(nullptr, nullptr);
    EXPECT_EQ(settings().box, &pressNo);
    zrDiagnosticsToStandardError(1);
    EXPECT_NE(settings().report, nullptr);
    EXPECT_EQ(settings().box, &pressNo);
    EXPECT_EQ(zrSetMessageBoxFunction(nullptr), &pressNo);
    EXPECT_NE(settings().report, nullptr);
    zrDiagnosticsToStandardError(0);
    EXPECT_EQ(settings().report, nullptr);
}

TEST_F(Boundary, AFacadeIsKnownAndDeletedByItsBase) {
    CString text = u"SELECT a FROM t";
    std::unique_ptr<CZRSQLParser> parser(new CZRMSSQLParser);
    EXPECT_EQ(dynamic_cast<CZROracleParser*>(parser.get()), nullptr);
    auto* facade = dynamic_cast<CZRMSSQLParser*>(parser.get());
    ASSERT_NE(facade, nullptr);
    facade->SetSQL(text);
    parser->ParseSQL();
    CZRSQLTree* tree = nullptr;
    facade->GetSQLTree(&tree);
    ASSERT_NE(tree, nullptr);
    EXPECT_EQ(tree->GetText(), u"SELECT_QUERY_");
    delete tree;
}

}  // namespace
}  // namespace zr::test
