#include <gtest/gtest.h>

#include <memory>

#include "tests/model/memory_storage.h"
#include "tests/model/small_host.h"
#include "tests/platform/print_string.h"

namespace {

using zr::test::Database;
using zr::test::Table;

TEST(DatabaseMerge, TakesOptionsAndVersionButNotTheNames) {
    Database other;
    other.SchemaName = u"s";
    other.GarbageSymbols = u"g";
    other.GarbageReplace = u"r";
    other.ExtraText = u"e";
    other.Version = u"v";
    other.SetName(u"other");
    other.MaxThreads = 7;
    other.BulkInsert = 0;
    other.WithBidirectional = 1;
    Database database;
    database.MergeFrom(other, DB_MSSQL);
    EXPECT_TRUE(database.SchemaName.IsEmpty());
    EXPECT_TRUE(database.GarbageSymbols.IsEmpty());
    EXPECT_TRUE(database.GarbageReplace.IsEmpty());
    EXPECT_TRUE(database.ExtraText.IsEmpty());
    EXPECT_TRUE(database.Name.IsEmpty());
    EXPECT_EQ(database.Version, u"v");
    EXPECT_EQ(database.MaxThreads, 7);
    EXPECT_EQ(database.BulkInsert, 0);
    EXPECT_EQ(database.WithBidirectional, 1);
}

TEST(DatabaseMerge, QueriesArePairedByNameWithTheOthersSourceNames) {
    Database other;
    auto& partner = other.addQuery(u"Target");
    partner.Length = 5;
    Database database;
    auto& query = database.addQuery(u"source");
    query.Name = u"target";
    auto& lonely = database.addQuery(u"Target");
    lonely.Name = u"unknown";
    database.MergeFrom(other, DB_MSSQL);
    EXPECT_EQ(query.Length, 5);
    EXPECT_EQ(query.Selected, 1);
    EXPECT_EQ(lonely.Selected, 0);
}

TEST(DatabaseMerge, TablesArePairedBySourceName) {
    Database other;
    other.addTable(u"T", {u"a"}).SyncDrop = 0;
    Database database;
    Table& table = database.addTable(u"t", {u"a"});
    Table& lonely = database.addTable(u"lonely", {u"a"});
    database.MergeFrom(other, DB_MSSQL);
    EXPECT_EQ(table.SyncDrop, 0);
    EXPECT_EQ(lonely.Selected, 0) << "AutoStructureUpdate is off";
}

TEST(DatabaseMerge, NewTablesFollowWhatTheOthersSelectedTablesDo) {
    Database other;
    other.AutoStructureUpdate = 1;
    other.addTable(u"structure").CopyData = 0;
    Table& unselected = other.addTable(u"unselected");
    unselected.Selected = 0;
    Database database;
    Table& table = database.addTable(u"new", {u"a"});
    database.MergeFrom(other, DB_MSSQL);
    EXPECT_EQ(database.AutoStructureUpdate, 1);
    EXPECT_EQ(table.Selected, 1);
    EXPECT_EQ(table.CopyData, 0) << "none of the selected ones copies data";
    EXPECT_EQ(table.CopyStructure, 1);
    EXPECT_EQ(table.OverwriteTable, 0);
}

TEST(DatabaseMerge, NewTablesAreOverwrittenWhereTablesAre) {
    Database other;
    other.AutoStructureUpdate = 1;
    other.OverwriteTables = 1;
    other.addTable(u"t");
    Database database;
    Table& table = database.addTable(u"new", {u"a"});
    database.MergeFrom(other, DB_MSSQL);
    EXPECT_EQ(table.OverwriteTable, 1);
    EXPECT_EQ(table.SyncInsert, 0);
}

TEST(DatabaseMerge, UserFunctionsAreAdded) {
    Database other;
    other.UserFunctions[u"f"] = u"2";
    other.UserFunctions[u"g"] = u"3";
    Database database;
    database.UserFunctions[u"f"] = u"1";
    database.UserFunctions[u"h"] = u"4";
    database.MergeFrom(other, DB_MSSQL);
    EXPECT_EQ(database.UserFunctions[u"f"], u"2");
    EXPECT_EQ(database.UserFunctions[u"g"], u"3");
    EXPECT_EQ(database.UserFunctions[u"h"], u"4");
}

TEST(DatabaseMerge, MergingIntoACloneChangesNothing) {
    Database database;
    database.UserFunctions[u"f"] = u"2";
    Table& table = database.addTable(u"t", {u"a", u"b"});
    table.addIndex(new zr::test::Index(u"ix", {u"a"}))->unique = 1;
    table.addForeignKey(u"fk", table.ID);
    table.field(u"b")->SetSelected(0);
    database.addTable(u"off").SetSelected(0);
    database.addQuery(u"q").readsFrom(u"t").refersTo(u"t", u"a").ResolveSources();
    const std::unique_ptr<Database> clone(database.Clone());
    const auto stored = [](Database& from) {
        zr::test::MemoryStorage storage;
        from.Save(storage);
        return storage.root.dump();
    };
    // What a table without indexes has to say of them comes from its getters, which look into its lists.
    database.Tables.GetTail()->CopyIndexes = clone->Tables.GetTail()->CopyIndexes = 0;
    database.Tables.GetTail()->CopyForeignKeys = clone->Tables.GetTail()->CopyForeignKeys = 0;
    const std::string before = stored(*clone);
    clone->MergeFrom(database, DB_MSSQL);
    EXPECT_EQ(stored(*clone), before);
}

}  // namespace
