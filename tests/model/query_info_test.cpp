#include "zrparsersql/query_info.h"

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

TEST(QueryInfo, StartsEmpty) {
    const CZRQueryInfo query;
    EXPECT_EQ(query.m_database, nullptr);
    EXPECT_EQ(query.m_whereItem, nullptr);
    EXPECT_EQ(query.m_hasLimit, 0);
    EXPECT_EQ(query.m_predicate, 0);
    EXPECT_EQ(query.LimitMode, 0);
    EXPECT_EQ(query.QueryMark, 0);
    EXPECT_TRUE(query.m_sql.IsEmpty());
}

TEST(QueryInfo, StoresTextWithLineEndsAsBlanksAndTrimmedOnTheRight) {
    CZRQueryInfo query;
    query.SetSQL(u"a\r\nb  ");
    EXPECT_EQ(query.GetSQL(), u"a b");
    query.SetSQLText(u"  a\nb\r\n\r\n");
    EXPECT_EQ(query.GetSQL(), u"  a\nb");
}

TEST(QueryInfo, SetLimitStoresACountFromRowZero) {
    CZRQueryInfo query;
    query.m_limitOffset = 9;
    query.SetLimit(5);
    int offset = -1;
    int count = -1;
    EXPECT_EQ(query.GetLimit(offset, count), 1);
    EXPECT_EQ(offset, 0);
    EXPECT_EQ(count, 5);
}

TEST(QueryInfo, PlainAccessorsReadAndWriteTheirMembers) {
    CZRQueryInfo query;
    query.SetQueryFlag(1);
    query.SetQueryMark(2);
    query.SetLimitMode(3);
    query.SetPredicate(4);
    query.SetQueryOption1(5);
    query.SetQueryOption2(6);
    EXPECT_EQ(query.GetQueryFlag(), 1);
    EXPECT_EQ(query.GetQueryMark(), 2);
    EXPECT_EQ(query.GetLimitMode(), 3);
    EXPECT_EQ(query.GetPredicate(), 4);
    EXPECT_EQ(query.GetQueryOption1(), 5);
    EXPECT_EQ(query.GetQueryOption2(), 6);
    EXPECT_TRUE(query.GetDialectText1().IsEmpty());
    EXPECT_TRUE(query.GetDialectText2().IsEmpty());
}

TEST(QueryInfo, NotesUserFunctionsInItsDatabase) {
    Database database;
    Query& query = database.addQuery(u"q");
    query.AddUserFunction(u"f", 3);
    query.AddUserFunction(u"f", 12);
    EXPECT_EQ(database.UserFunctions[u"f"], u"12");
    EXPECT_EQ(database.UserFunctions.GetCount(), 1);
    CZRQueryInfo().AddUserFunction(u"f", 1);
}

TEST(QueryInfo, ResolvesSourcesToTheIdsOfTablesAndQueries) {
    Database database;
    auto& table = database.addTable(u"Orders");
    auto& view = database.addQuery(u"View");
    auto& query = database.addQuery(u"q");
    query.readsFrom(u"orders").readsFrom(u"VIEW").readsFrom(u"nowhere");
    query.ResolveSources();
    EXPECT_EQ(query.m_sourceTables[u"orders"], table.ID);
    EXPECT_EQ(query.m_sourceTables[u"VIEW"], view.ID);
    EXPECT_EQ(query.m_sourceTables[u"nowhere"], u"nowhere");
}

TEST(QueryInfo, ResolvesATableBeforeAQueryOfTheSameName) {
    Database database;
    database.addQuery(u"same");
    auto& table = database.addTable(u"same");
    auto& query = database.addQuery(u"q").readsFrom(u"same");
    query.ResolveSources();
    EXPECT_EQ(query.m_sourceTables[u"same"], table.ID);
}

TEST(QueryInfo, ResolvesSourcesOfNestedQueriesThroughTheirOwnDatabases) {
    Database database;
    auto& table = database.addTable(u"t");
    auto& query = database.addQuery(u"q");
    auto* nested = new Query;
    nested->SetDatabase(&database);
    nested->readsFrom(u"t");
    auto* homeless = new Query;
    homeless->readsFrom(u"t");
    query.m_subQueries.AddTail(nested);
    query.m_subQueries.AddTail(homeless);
    query.ResolveSources();
    EXPECT_EQ(nested->m_sourceTables[u"t"], table.ID);
    EXPECT_EQ(homeless->m_sourceTables[u"t"], u"t");
}

TEST(QueryInfo, FindsSourcesByNameAndId) {
    Database database;
    auto& table = database.addTable(u"t");
    auto& view = database.addQuery(u"v");
    EXPECT_EQ(view.FindSource(u"T"), &table);
    EXPECT_EQ(view.FindSource(u"V"), &view);
    EXPECT_EQ(view.FindSource(u"x"), nullptr);
    EXPECT_EQ(view.FindSourceByID(table.ID), &table);
    EXPECT_EQ(view.FindSourceByID(view.ID), &view);
    EXPECT_EQ(view.FindSourceByID(u""), nullptr);
    EXPECT_EQ(CZRQueryInfo().FindSource(u"t"), nullptr);
    EXPECT_EQ(CZRQueryInfo().FindSourceByID(u"t"), nullptr);
}

TEST(QueryInfo, HasNoColumnsByIdOrName) {
    Query query;
    auto& alias = query.addAlias(u"a");
    EXPECT_EQ(query.FindFieldByID(alias.ID), nullptr);
    EXPECT_EQ(query.FindFieldByName(u"a"), nullptr);
}

TEST(QueryInfo, HasAQuerySourceWhenAReferenceNamesAQuery) {
    Database database;
    database.addTable(u"t");
    database.addQuery(u"v");
    auto& query = database.addQuery(u"q");
    query.refersTo(u"t", u"a").refersTo(u"", u"b");
    query.m_fields[u"null"] = nullptr;
    EXPECT_EQ(query.HasQuerySource(), 0);
    query.refersTo(u"v", u"c");
    EXPECT_EQ(query.HasQuerySource(), 1);
}

std::unique_ptr<Query> fullQuery(CZRDatabaseInfo* database) {
    auto query = std::make_unique<Query>(u"q");
    query->SetDatabase(database);
    query->SetSQL(u"SELECT 1");
    query->QueryFlag = 1;
    query->QueryMark = 2;
    query->LimitMode = 3;
    query->QueryOption1 = 4;
    query->QueryOption2 = 5;
    query->m_predicate = 2;
    query->SetLimit(7);
    query->Resolved = 1;
    query->addAlias(u"x", u"a").Expression = functionItem(u"f");
    query->readsFrom(u"t");
    query->refersTo(u"t", u"a");
    query->m_fields[u"null"] = nullptr;
    query->m_subQueries.AddTail(new CZRQueryInfo);
    query->m_selectItems.AddTail(fieldItem(u"t", u"a"));
    query->m_fromItems.AddTail(valueItem(u"from"));
    query->m_orderItems.AddTail(valueItem(u"order"));
    query->m_groupItems.AddTail(valueItem(u"group"));
    query->m_havingItems.AddTail(valueItem(u"having"));
    auto* branch = new SelectItemUnion;
    branch->m_query = new CZRQueryInfo;
    query->m_unionItems.AddTail(branch);
    query->m_whereItem = functionItem(u"", {valueItem(u"where")});
    auto* record = new CZRQueryUnionInfo;
    record->Query = new CZRQueryInfo;
    record->UnionKind = 1;
    record->Text = u"never copied";
    query->m_unions.AddTail(record);
    return query;
}

TEST(QueryInfo, CloneCopiesEverythingButMarkAndSecondOption) {
    Database database;
    const std::unique_ptr<Query> query = fullQuery(&database);
    const std::unique_ptr<CZRQueryInfo> clone(query->Clone());
    EXPECT_EQ(clone->ID, query->ID);
    EXPECT_EQ(clone->m_database, &database);
    EXPECT_EQ(clone->m_sql, u"SELECT 1");
    EXPECT_EQ(clone->QueryFlag, 1);
    EXPECT_EQ(clone->QueryMark, 0);
    EXPECT_EQ(clone->LimitMode, 3);
    EXPECT_EQ(clone->QueryOption1, 4);
    EXPECT_EQ(clone->QueryOption2, 0);
    EXPECT_EQ(clone->m_predicate, 2);
    EXPECT_EQ(clone->m_hasLimit, 1);
    EXPECT_EQ(clone->m_limitOffset, 0);
    EXPECT_EQ(clone->m_limitCount, 7);
    EXPECT_EQ(clone->Resolved, 1);
    ASSERT_TRUE(clone->m_aliases.Contains(u"x"));
    EXPECT_EQ(clone->m_aliases[u"x"]->AliasField, u"a");
    EXPECT_EQ(clone->m_aliases[u"x"]->Expression->m_name, u"f");
    EXPECT_EQ(clone->m_sourceTables[u"t"], u"t");
    EXPECT_EQ(clone->m_fields[u"ta"]->m_field, u"a");
    EXPECT_TRUE(clone->m_fields.Contains(u"null"));
    EXPECT_EQ(clone->m_fromItems.GetHead()->m_text, u"from");
    EXPECT_EQ(clone->m_orderItems.GetHead()->m_text, u"order");
    EXPECT_EQ(clone->m_groupItems.GetHead()->m_text, u"group");
    EXPECT_EQ(clone->m_havingItems.GetHead()->m_text, u"having");
    EXPECT_EQ(clone->m_whereItem->JoinItems(), u"where");
    ASSERT_EQ(clone->m_unions.GetCount(), 1);
    EXPECT_EQ(clone->m_unions.GetHead()->UnionKind, 1);
    EXPECT_TRUE(clone->m_unions.GetHead()->Text.IsEmpty());
}

TEST(QueryInfo, CloneSharesNothingWithItsSource) {
    const std::unique_ptr<Query> query = fullQuery(nullptr);
    const std::unique_ptr<CZRQueryInfo> clone(query->Clone());
    EXPECT_NE(clone->m_selectItems.GetHead(), query->m_selectItems.GetHead());
    EXPECT_NE(clone->m_whereItem, query->m_whereItem);
    EXPECT_NE(clone->m_aliases[u"x"], query->m_aliases[u"x"]);
    EXPECT_NE(clone->m_fields[u"ta"], query->m_fields[u"ta"]);
    EXPECT_NE(clone->m_subQueries.GetHead(), query->m_subQueries.GetHead());
    EXPECT_NE(clone->m_unions.GetHead(), query->m_unions.GetHead());
    EXPECT_NE(clone->m_unions.GetHead()->Query, query->m_unions.GetHead()->Query);
    EXPECT_NE(static_cast<SelectItemUnion*>(clone->m_unionItems.GetHead())->m_query,
              static_cast<SelectItemUnion*>(query->m_unionItems.GetHead())->m_query);
}

TEST(QueryInfo, CloneOutlivesItsSource) {
    std::unique_ptr<Query> query = fullQuery(nullptr);
    const std::unique_ptr<CZRQueryInfo> clone(query->Clone());
    query.reset();
    EXPECT_EQ(static_cast<SelectItemField*>(clone->m_selectItems.GetHead())->m_sourceField, u"a");
    const std::unique_ptr<CZRQueryInfo> second(clone->Clone());
    EXPECT_EQ(second->m_whereItem->JoinItems(), u"where");
}

TEST(QueryInfo, CloneAsksHostClassesOfQueriesForTheirOwnCopies) {
    Query query;
    auto* nested = new Query(u"nested");
    nested->type = DB_ORACLE;
    query.m_subQueries.AddTail(nested);
    const std::unique_ptr<Query> clone(query.Clone());
    auto* copy = dynamic_cast<Query*>(clone->m_subQueries.GetHead());
    ASSERT_NE(copy, nullptr);
    EXPECT_EQ(copy->type, DB_ORACLE);
}

class HostAlias : public CZRAliasInfo {
 public:
    HostAlias* Clone(int = 0) const override { return new HostAlias(*this); }
};

TEST(QueryInfo, CloneAsksHostClassesOfAliasesForTheirOwnCopies) {
    CZRQueryInfo query;
    query.m_aliases[u"a"] = new HostAlias;
    query.m_aliases[u"null"] = nullptr;
    const std::unique_ptr<CZRQueryInfo> clone(query.Clone());
    EXPECT_NE(dynamic_cast<HostAlias*>(clone->m_aliases[u"a"]), nullptr);
    EXPECT_TRUE(clone->m_aliases.Contains(u"null"));
}

TEST(QueryInfo, RecordOfAUnionIsCopiedWithItsQuery) {
    CZRQueryUnionInfo record;
    record.Query = new Query(u"branch");
    record.UnionKind = 1;
    record.Text = u"never copied";
    const CZRQueryUnionInfo copy(record);
    ASSERT_NE(copy.Query, nullptr);
    EXPECT_NE(copy.Query, record.Query);
    EXPECT_EQ(copy.Query->Name, u"branch");
    EXPECT_EQ(copy.UnionKind, 1);
    EXPECT_TRUE(copy.Text.IsEmpty());
    EXPECT_EQ(CZRQueryUnionInfo(CZRQueryUnionInfo()).Query, nullptr);
}

TEST(QueryInfo, HasNoMappedTypeToBuild) {
    CZRQueryInfo query;
    query.TypeMappedString = u"kept";
    query.BuildTypeMappedString();
    EXPECT_EQ(query.TypeMappedString, u"kept");
}

TEST(QueryInfo, BothCopyPropertiesDoTheSame) {
    Query source(u"source");
    source.Length = 5;
    Query target(u"target");
    target.CopyProperties(source, 0);
    EXPECT_EQ(target.Length, 5);
    target.Length = 0;
    target.CopyProperties(static_cast<CZRObjectInfo&>(source), 0);
    EXPECT_EQ(target.Length, 5);
    EXPECT_EQ(target.SrcName, u"target");
}

}  // namespace
