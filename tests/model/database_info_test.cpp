#include "zrparsersql/database_info.h"

#include <gtest/gtest.h>

#include <memory>

#include "tests/model/small_host.h"
#include "tests/platform/print_string.h"

namespace {

using zr::test::Database;
using zr::test::Query;
using zr::test::Table;

TEST(DatabaseInfo, NewDatabaseHasItsDefaults) {
    const Database database;
    EXPECT_EQ(database.MaxThreads, 1);
    EXPECT_EQ(database.MaxQuant, 100);
    EXPECT_EQ(database.BulkInsert, 1);
    EXPECT_EQ(database.UseHistoryCopyData, 1);
    EXPECT_EQ(database.CleanHistoryAfterUse, 1);
    EXPECT_EQ(database.OverwriteDatabase, 0);
    EXPECT_EQ(database.AutoStructureUpdate, 0);
    EXPECT_EQ(database.UpdateDepth, 0);
    EXPECT_TRUE(database.Tables.IsEmpty());
    EXPECT_TRUE(database.UserFunctions.IsEmpty());
}

TEST(DatabaseInfo, DialectAnswersAreNothing) {
    Database database;
    EXPECT_FALSE(database.GetDialectFlag1());
    EXPECT_FALSE(database.GetDialectFlag2());
    EXPECT_EQ(database.GetDialectFlag3(), 0);
    EXPECT_EQ(database.GetDialectValue1(), 0);
    EXPECT_EQ(database.GetDialectValue2(), 0);
    EXPECT_EQ(database.GetDialectValue3(), 0);
    database.ResetDialectState();
    const zr::DialectRecord record = database.GetDialectRecord();
    EXPECT_EQ(record.first + record.second + record.third, 0);
}

TEST(DatabaseInfo, FindsTheFirstMatchWithoutRegardToCase) {
    Database database;
    Table& first = database.addTable(u"Same");
    database.addTable(u"same");
    first.Name = u"Target";
    Query& query = database.addQuery(u"View");
    database.Tables.AddTail(nullptr);
    EXPECT_EQ(database.FindTableBySrcName(u"SAME"), &first);
    EXPECT_EQ(database.FindTableByName(u"target"), &first);
    CString id = first.ID;
    EXPECT_EQ(database.FindTableByID(id.MakeLower()), &first);
    EXPECT_EQ(database.FindQueryBySrcName(u"VIEW"), &query);
    EXPECT_EQ(database.FindQueryByID(query.ID), &query);
    EXPECT_EQ(database.FindTableBySrcName(u"none"), nullptr);
    EXPECT_EQ(database.FindQueryBySrcName(u"same"), nullptr);
}

TEST(DatabaseInfo, LookUpsFollowEveryChange) {
    Database database;
    Table& table = database.addTable(u"old");
    EXPECT_EQ(database.FindTableBySrcName(u"old"), &table);
    EXPECT_EQ(database.FindTableBySrcName(u"new"), nullptr);
    table.SrcName = u"new";
    EXPECT_EQ(database.FindTableBySrcName(u"old"), nullptr);
    EXPECT_EQ(database.FindTableBySrcName(u"new"), &table);
    Table& second = database.addTable(u"second");
    EXPECT_EQ(database.FindTableBySrcName(u"second"), &second);
    table.SrcName = u"second";
    EXPECT_EQ(database.FindTableBySrcName(u"second"), &table) << "the first in list order";
    database.Tables.RemoveAt(database.Tables.GetHeadPosition());
    EXPECT_EQ(database.FindTableBySrcName(u"second"), &second);
    delete &table;
}

TEST(DatabaseInfo, SelectingSelectsTheTables) {
    Database database;
    Table& table = database.addTable(u"t", {u"a"});
    database.SetSelected(0);
    EXPECT_EQ(database.Selected, 0);
    EXPECT_EQ(table.Selected, 0);
    EXPECT_EQ(database.UpdateDepth, 0);
    database.SetSelected(1);
    EXPECT_EQ(table.Selected, 1);
    table.Selected = 0;
    database.SetSelected(1);
    EXPECT_EQ(table.Selected, 0) << "no change, nothing passed on";
}

class WatchedDatabase : public Database {
 public:
    void RecalcSelected() override {
        Database::RecalcSelected();
        seen.push_back(Selected);
    }
    std::vector<int> seen;
};

TEST(DatabaseInfo, RecalculatingWhileSelectingChangesNothing) {
    WatchedDatabase database;
    database.addTable(u"t", {u"a"});
    database.SetSelected(0);
    ASSERT_FALSE(database.seen.empty());
    for (int selected : database.seen) EXPECT_EQ(selected, 1) << "the old value stood until the end";
    EXPECT_EQ(database.Selected, 0);
}

TEST(DatabaseInfo, IsSelectedWhenATableIs) {
    Database database;
    database.RecalcSelected();
    EXPECT_EQ(database.Selected, 0);
    Table& table = database.addTable(u"t");
    database.addTable(u"u").Selected = 0;
    database.RecalcSelected();
    EXPECT_EQ(database.Selected, 1);
    table.Selected = 0;
    database.RecalcSelected();
    EXPECT_EQ(database.Selected, 0);
}

TEST(DatabaseInfo, OverwritingIsPassedOnWhenSwitchedOn) {
    Database database;
    Table& table = database.addTable(u"t");
    database.SetOverwriteDatabase(1);
    EXPECT_EQ(database.OverwriteDatabase, 1);
    EXPECT_EQ(table.OverwriteTable, 1);
    table.OverwriteTable = 0;
    database.SetOverwriteDatabase(2);
    EXPECT_EQ(database.OverwriteDatabase, 2);
    EXPECT_EQ(table.OverwriteTable, 0) << "it was on already";
    database.SetOverwriteDatabase(0);
    EXPECT_EQ(database.OverwriteDatabase, 0);
}

TEST(DatabaseInfo, ResolvesReferencesOfAllTables) {
    Database database;
    auto* index = database.addTable(u"t").addIndex(new zr::test::Index(u"ix"));
    auto* key = database.addTable(u"u").addForeignKey(u"fk", u"");
    database.ResolveReferences();
    EXPECT_EQ(index->resolved, 1);
    EXPECT_EQ(key->resolved, 1);
}

TEST(DatabaseInfo, CloneCopiesModelAndOptions) {
    Database database;
    database.SchemaName = u"s";
    database.GarbageSymbols = u"g";
    database.GarbageReplace = u"r";
    database.ExtraText = u"e";
    database.Version = u"v";
    database.MaxThreads = 7;
    database.CaseState = -3;
    database.ExtraFlag = 5;
    database.UpdateDepth = 2;
    database.NameList.AddTail(u"not copied");
    database.UserFunctions[u"f"] = u"2";
    database.addTable(u"t", {u"a"});
    database.addQuery(u"q");
    const std::unique_ptr<Database> clone(database.Clone());
    EXPECT_EQ(clone->SchemaName, u"s");
    EXPECT_EQ(clone->GarbageSymbols, u"g");
    EXPECT_EQ(clone->GarbageReplace, u"r");
    EXPECT_EQ(clone->ExtraText, u"e");
    EXPECT_EQ(clone->Version, u"v");
    EXPECT_EQ(clone->MaxThreads, 7);
    EXPECT_EQ(clone->CaseState, -3);
    EXPECT_EQ(clone->ExtraFlag, 5);
    EXPECT_EQ(clone->UpdateDepth, 0);
    EXPECT_TRUE(clone->NameList.IsEmpty());
    EXPECT_EQ(clone->UserFunctions[u"f"], u"2");
    EXPECT_EQ(clone->ID, database.ID);
    ASSERT_EQ(clone->Tables.GetCount(), 1);
    EXPECT_EQ(clone->Tables.GetHead()->Database, clone.get());
    EXPECT_EQ(clone->Tables.GetHead()->ID, database.Tables.GetHead()->ID);
    ASSERT_EQ(clone->Queries.GetCount(), 1);
    EXPECT_EQ(clone->Queries.GetHead()->m_database, clone.get());
}

TEST(DatabaseInfo, NestedQueriesOfACloneLookIntoTheClone) {
    auto database = std::make_unique<Database>();
    database->addTable(u"t");
    Query& query = database->addQuery(u"q");
    CZRQueryInfo* at = &query;
    for (int level = 0; level < 3; ++level) {
        auto* branch = new SelectItemUnion;
        branch->m_query = new CZRQueryInfo;
        branch->m_query->SetDatabase(database.get());
        at->m_unionItems.AddTail(branch);
        at = branch->m_query;
    }
    auto* nested = new CZRQueryInfo;
    nested->SetDatabase(database.get());
    nested->m_sourceTables[u"t"] = u"t";
    query.m_subQueries.AddTail(nested);
    const auto nestedQuery = [&database] {
        auto* made = new CZRQueryInfo;
        made->SetDatabase(database.get());
        return made;
    };
    auto* record = new CZRQueryUnionInfo;
    record->Query = nestedQuery();
    query.m_unions.AddTail(record);
    auto* inAlias = new SelectItemSubQuery;
    inAlias->m_query = nestedQuery();
    query.addAlias(u"a").Expression = zr::test::functionItem(u"f", {inAlias});
    auto* inWhere = new SelectItemSubQuery;
    inWhere->m_query = nestedQuery();
    query.m_whereItem = zr::test::functionItem(u"", {inWhere});
    const std::unique_ptr<Database> clone(database->Clone());
    database.reset();
    CZRQueryInfo* copy = clone->Queries.GetHead();
    copy->ResolveSources();
    EXPECT_EQ(copy->m_subQueries.GetHead()->m_sourceTables[u"t"], clone->Tables.GetHead()->ID);
    EXPECT_EQ(copy->m_unions.GetHead()->Query->m_database, clone.get());
    for (const SelectItem* root : {copy->m_aliases[u"a"]->Expression, copy->m_whereItem})
        EXPECT_EQ(static_cast<SelectItemSubQuery*>(root->m_items.GetHead())->m_query->m_database,
                  clone.get());
    for (int level = 0; level < 3; ++level) {
        copy = static_cast<SelectItemUnion*>(copy->m_unionItems.GetHead())->m_query;
        EXPECT_EQ(copy->m_database, clone.get());
    }
}

TEST(DatabaseInfo, CloneStillResolvesTheIdsThatItsQueriesHold) {
    Database database;
    database.addTable(u"t", {u"a"});
    Query& query = database.addQuery(u"q").readsFrom(u"t").refersTo(u"t", u"a");
    query.ResolveSources();
    const std::unique_ptr<Database> clone(database.Clone());
    EXPECT_EQ(clone->Queries.GetHead()->FindField(u"", u"a"), clone->Tables.GetHead()->Fields.GetHead());
}

TEST(DatabaseInfo, CloneOfTheSelectedLeavesTheOthersOut) {
    Database database;
    database.addTable(u"out").Selected = 0;
    database.addTable(u"in", {u"a", u"b"}).field(u"a")->Selected = 0;
    database.addQuery(u"out").Selected = 0;
    database.addQuery(u"in");
    const std::unique_ptr<Database> clone(database.Clone(1));
    ASSERT_EQ(clone->Tables.GetCount(), 1);
    EXPECT_EQ(clone->Tables.GetHead()->SrcName, u"in");
    EXPECT_EQ(clone->Tables.GetHead()->Fields.GetCount(), 1);
    ASSERT_EQ(clone->Queries.GetCount(), 1);
    EXPECT_EQ(clone->Queries.GetHead()->SrcName, u"in");
    EXPECT_EQ(std::unique_ptr<Database>(database.Clone())->Tables.GetCount(), 2);
}

}  // namespace
