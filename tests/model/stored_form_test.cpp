#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

#include "tests/model/memory_storage.h"
#include "tests/model/small_host.h"
#include "tests/platform/print_string.h"

// The whole table of the stored form, in both directions: which sections and keys, in which order, with which
// defaults.
namespace {

using zr::test::Database;
using zr::test::Factory;
using zr::test::Field;
using zr::test::Filter;
using zr::test::FilterItem;
using zr::test::Index;
using zr::test::MemoryStorage;
using zr::test::Query;
using zr::test::Table;
using Calls = std::vector<std::string>;

constexpr const char* kCommonKeys =
    "Name,Type,TypeMapped,TypeMappedString,SrcName,Length,LengthMapped,Scale,ScaleMapped,DataType,State,"
    "Correct,"
    "DbTypeSrcLast,DbTypeSrcCur,AutoIncrMapped,UnsignedMapped,IndexOff";
constexpr const char* kTableOptions =
    "Selected,LowerCase,CopyStructure,CopyIndexes,CopyForeignKeys,CopyData,OverwriteTable,TruncateTable,"
    "ModifyFields,"
    "ModifyIndexes,ModifyForeignKeys,SyncInsert,SyncUpdate,SyncDrop";
constexpr const char* kDatabaseOptions =
    "Selected,LowerCase,OverwriteDatabase,CloseExistingConnections,OverwriteTables,AutoStructureUpdate,"
    "CreateLogsEnabled,CreateDiff,CreateUndiff,BulkInsert,Quant,CaseState,MaxThreads,MaxQuant,"
    "UseHistoryCopyData,"
    "UseTriggersOnlyMaster,BidirectionalSync,CleanHistoryAfterUse,ModifiedTriggers,WithTriggers,"
    "WithBidirectional,"
    "HandleSelectedObjects";

TEST(StoredObject, WritesTwoSectionsInOrder) {
    Field object;
    object.Name = u" Raw ";
    object.LowerCase = -1;
    object.SrcName = u"src";
    object.Type = u"Type";
    MemoryStorage storage;
    object.Save(storage);
    EXPECT_EQ(storage.calls, (Calls{"open Options 1",
                                    "int Selected=1",
                                    "int LowerCase=-1",
                                    "close",
                                    "open Common 1",
                                    "text Name=' Raw ' 0",
                                    "text Type='Type' 0",
                                    "text TypeMapped='' 0",
                                    "text TypeMappedString='' 0",
                                    "text SrcName='src' 0",
                                    "int Length=-1",
                                    "int LengthMapped=-1",
                                    "int Scale=0",
                                    "int ScaleMapped=0",
                                    "int DataType=0",
                                    "int State=1",
                                    "int Correct=0",
                                    "int DbTypeSrcLast=0",
                                    "int DbTypeSrcCur=0",
                                    "int AutoIncrMapped=0",
                                    "int UnsignedMapped=0",
                                    "int IndexOff=0",
                                    "close"}));
}

TEST(StoredObject, ReadsWithItsDefaults) {
    MemoryStorage storage;
    Field object;
    object.Length = 5;
    object.LengthMapped = 6;
    object.Scale = 7;
    object.ScaleMapped = 8;
    Factory factory;
    object.Load(storage, factory);
    EXPECT_EQ(storage.calls, (Calls{"open Options 0",
                                    "text SrcName?'' 0",
                                    "int Selected?1",
                                    "int LowerCase?0",
                                    "close",
                                    "open Common 0",
                                    "text Name?'' 0",
                                    "text Type?'' 0",
                                    "text TypeMapped?'' 0",
                                    "text TypeMappedString?'' 0",
                                    "text SrcName?'' 0",
                                    "int Length?5",
                                    "int LengthMapped?6",
                                    "int Scale?7",
                                    "int ScaleMapped?8",
                                    "int DataType?0",
                                    "int State?0",
                                    "int Correct?0",
                                    "int DbTypeSrcLast?0",
                                    "int DbTypeSrcCur?0",
                                    "int AutoIncrMapped?0",
                                    "int UnsignedMapped?0",
                                    "int IndexOff?0",
                                    "close"}));
}

TEST(StoredObject, HasStateZeroWithoutTheKey) {
    MemoryStorage storage;
    Factory factory;
    Field object;
    EXPECT_EQ(object.State, 1);
    object.Load(storage, factory);
    EXPECT_EQ(object.State, 0);
    EXPECT_EQ(object.Selected, 1);
    EXPECT_EQ(object.Length, -1);
}

TEST(StoredObject, SourceNameOfTheOptionsIsADefaultOnly) {
    MemoryStorage storage;
    storage.root.add(u"Options").set(u"SrcName", CString(u"old place"));
    Factory factory;
    Field object;
    object.Load(storage, factory);
    EXPECT_EQ(object.SrcName, u"old place");
    storage.root.add(u"Common").set(u"SrcName", CString(u"new place"));
    object.Load(storage, factory);
    EXPECT_EQ(object.SrcName, u"new place");
}

TEST(StoredObject, SourceNameSurvivesThroughTheCommonSectionAlone) {
    Field object;
    object.SrcName = u"src";
    MemoryStorage storage;
    object.Save(storage);
    EXPECT_FALSE(storage.root.at("Options")->has(u"SrcName"));
    Factory factory;
    Field loaded;
    loaded.Load(storage, factory);
    EXPECT_EQ(loaded.SrcName, u"src");
}

TEST(StoredObject, NameIsStoredRawUnderAFoldingRule) {
    Field object;
    object.SetName(u"Abc");
    object.SetLowerCase(1);
    MemoryStorage storage;
    object.Save(storage);
    EXPECT_EQ(object.GetName(), u"ABC");
    EXPECT_EQ(storage.root.at("Common")->textOf(u"Name"), u"Abc");
}

TEST(StoredObject, IdIsNotStored) {
    Field object;
    MemoryStorage storage;
    object.Save(storage);
    EXPECT_EQ(storage.root.dump().find(object.ID.toUtf8()), std::string::npos);
    Field loaded;
    const CString id = loaded.ID;
    Factory factory;
    loaded.Load(storage, factory);
    EXPECT_EQ(loaded.ID, id);
}

TEST(StoredTable, WritesOptionsBehindTheCommonOnes) {
    Table table(u"t");
    MemoryStorage storage;
    table.Save(storage);
    EXPECT_EQ(storage.root.childNames(), "Options,Common,Fields,Indexes,ForeignKeys");
    EXPECT_EQ(storage.root.at("Options")->keys(), kTableOptions);
    EXPECT_EQ(storage.root.at("Common")->keys(), kCommonKeys);
    const Calls behindTheBase(storage.calls.begin() + 23, storage.calls.begin() + 25);
    EXPECT_EQ(behindTheBase, (Calls{"open Options 0", "int CopyStructure=1"}));
    EXPECT_TRUE(storage.isAtRoot());
}

TEST(StoredTable, NumbersItsChildrenFromOne) {
    Table table(u"t", {u"a", u"b"});
    table.addIndex(new Index(u"ix"));
    table.addForeignKey(u"fk", u"");
    MemoryStorage storage;
    table.Save(storage);
    EXPECT_EQ(storage.root.at("Fields")->childNames(), "Field1,Field2");
    EXPECT_EQ(storage.root.at("Indexes")->childNames(), "Index1");
    EXPECT_EQ(storage.root.at("ForeignKeys")->childNames(), "ForeignKey1");
    EXPECT_EQ(storage.root.at("Fields/Field2/Common")->textOf(u"SrcName"), u"b");
}

TEST(StoredTable, ReadsItsOptionsWithTheirDefaults) {
    MemoryStorage storage;
    Factory factory;
    Table table(u"t", {u"gone"});
    table.SyncInsert = table.CopyData = 0;
    table.ModifyFields = 1;
    table.Load(storage, factory);
    EXPECT_TRUE(table.Fields.IsEmpty()) << "a table is cleared first";
    EXPECT_EQ(table.CopyStructure, 1);
    EXPECT_EQ(table.CopyIndexes, 1);
    EXPECT_EQ(table.CopyForeignKeys, 1);
    EXPECT_EQ(table.CopyData, 1);
    EXPECT_EQ(table.OverwriteTable, 0);
    EXPECT_EQ(table.TruncateTable, 0);
    EXPECT_EQ(table.ModifyFields, 0);
    EXPECT_EQ(table.ModifyIndexes, 0);
    EXPECT_EQ(table.ModifyForeignKeys, 0);
    EXPECT_EQ(table.SyncInsert, 1);
    EXPECT_EQ(table.SyncUpdate, 1);
    EXPECT_EQ(table.SyncDrop, 1);
}

TEST(StoredTable, OpensForeignKeysAndFilterOnlyWhenTheyAreThere) {
    MemoryStorage storage;
    Factory factory;
    Table table;
    table.Load(storage, factory);
    const Calls tail(storage.calls.end() - 8, storage.calls.end());
    EXPECT_EQ(tail, (Calls{"open Fields 0", "names", "close", "open Indexes 0", "names", "close",
                           "has ForeignKeys", "has Filter"}));
    EXPECT_EQ(storage.root.childNames(), "");
}

TEST(StoredTable, LoadsChildrenOfAnyNameInStoredOrder) {
    MemoryStorage storage;
    auto& fields = storage.root.add(u"Fields");
    fields.add(u"x").add(u"Common").set(u"SrcName", CString(u"first"));
    fields.add(u"Field1").add(u"Common").set(u"SrcName", CString(u"second"));
    Factory factory;
    Table table;
    table.type = DB_ORACLE;
    table.Load(storage, factory);
    ASSERT_EQ(table.Fields.GetCount(), 2);
    EXPECT_EQ(table.Fields.GetHead()->SrcName, u"first");
    EXPECT_EQ(table.Fields.GetTail()->SrcName, u"second");
    EXPECT_EQ(table.field(u"first")->owner, &table);
    EXPECT_EQ(factory.kinds, (std::vector<DBTypes>{DB_ORACLE, DB_ORACLE}));
}

TEST(StoredTable, WritesItsFilter) {
    Table table(u"t", {u"a"});
    Filter filter(DB_ORACLE);
    filter.SQLQuery = u"x > 1";
    filter.UseSQLQuery = 1;
    filter.Items.AddTail(new FilterItem(u"a", u"5"));
    table.AttachFilterCopy(&filter);
    MemoryStorage storage;
    table.Save(storage);
    zr::test::Section* section = storage.root.at("Filter");
    ASSERT_NE(section, nullptr);
    EXPECT_EQ(section->keys(), "DBType,SQLQuery,UseSQLQuery");
    EXPECT_EQ(section->intOf(u"DBType"), 16);
    EXPECT_EQ(section->childNames(), "Condition1");
    EXPECT_EQ(section->at("Condition1")->keys(), "FieldID,Condition,ConditionAdd");
    EXPECT_EQ(section->at("Condition1")->childNames(), "Value");
    EXPECT_EQ(section->at("Condition1/Value")->keys(), "IsNULL,Type,Value");
}

TEST(StoredTable, RemovesAStoredFilterThatItNoLongerHas) {
    Table table(u"t", {u"a"});
    Filter filter;
    filter.SQLQuery = u"x";
    table.AttachFilterCopy(&filter);
    MemoryStorage storage;
    table.Save(storage);
    EXPECT_NE(storage.root.at("Filter"), nullptr);
    table.AttachFilterCopy(nullptr);
    storage.forgetCalls();
    table.Save(storage);
    EXPECT_EQ(storage.root.at("Filter"), nullptr);
    const Calls tail(storage.calls.end() - 2, storage.calls.end());
    EXPECT_EQ(tail, (Calls{"has Filter", "remove Filter"}));
    storage.forgetCalls();
    table.Save(storage);
    EXPECT_EQ(storage.calls.back(), "has Filter") << "nothing to remove";
}

TEST(StoredTable, ReadsItsFilterByItsStoredKind) {
    MemoryStorage storage;
    auto& section = storage.root.add(u"Filter");
    section.set(u"DBType", 5);
    section.add(u"any name").set(u"FieldID", CString(u"unknown column"));
    Factory factory;
    Table table;
    table.Load(storage, factory);
    ASSERT_NE(table.Filter, nullptr);
    EXPECT_EQ(factory.kinds, (std::vector<DBTypes>{DB_POSTGRESQL, DB_POSTGRESQL}));
    ASSERT_EQ(table.Filter->Items.GetCount(), 1);
    EXPECT_EQ(table.Filter->Items.GetHead()->FieldID, u"unknown column");
    EXPECT_TRUE(storage.isAtRoot());
    storage.root.at("Filter")->values.clear();
    Factory second;
    table.Load(storage, second);
    EXPECT_EQ(second.kinds.front(), DB_NONE);
}

TEST(StoredFilter, ReadsWithItsDefaultsAndDropsOldConditions) {
    MemoryStorage storage;
    Factory factory;
    Filter filter;
    filter.SQLQuery = u"old";
    filter.UseSQLQuery = 1;
    filter.Items.AddTail(new FilterItem(u"old", u"1"));
    filter.Load(storage, factory);
    EXPECT_TRUE(filter.Items.IsEmpty());
    EXPECT_TRUE(filter.SQLQuery.IsEmpty());
    EXPECT_EQ(filter.UseSQLQuery, 0);
    EXPECT_EQ(storage.calls, (Calls{"text SQLQuery?'' 0", "int UseSQLQuery?0", "names"}));
}

TEST(StoredFilter, ConditionIsWrittenAndReadInOrder) {
    FilterItem item(u"a", u"text");
    item.Condition = 3;
    item.ConditionAdd = 4;
    item.ItemMark = 5;
    MemoryStorage storage;
    item.Save(storage);
    EXPECT_EQ(storage.calls,
              (Calls{"text FieldID='a' 0", "int Condition=3", "int ConditionAdd=4", "open Value 1",
                     "int IsNULL=0", "int Type=1", "text Value='text' 0", "close"}));
    storage.forgetCalls();
    FilterItem loaded;
    Factory factory;
    loaded.Load(storage, factory);
    EXPECT_EQ(storage.calls,
              (Calls{"text FieldID?'' 0", "int Condition?0", "int ConditionAdd?0", "open Value 0",
                     "int IsNULL?0", "int Type?-1", "text Value?'' 0", "close"}));
    EXPECT_EQ(loaded.ItemMark, 0);
    EXPECT_TRUE(loaded.Value.Equals(item.Value));
}

TEST(StoredFilterValue, NullIsStoredWithoutAValue) {
    CZRFilterValue value;
    value.SetNull(4);
    MemoryStorage storage;
    value.Save(storage);
    EXPECT_EQ(storage.calls, (Calls{"int IsNULL=1", "int Type=4"}));
    CZRFilterValue loaded;
    loaded.SetInt32(1, 2);
    loaded.Load(storage);
    EXPECT_TRUE(loaded.IsNull());
    EXPECT_EQ(loaded.ValueType, 4);
}

TEST(StoredFilterValue, TypeZeroLoadsAsNullOfNoType) {
    MemoryStorage storage;
    storage.root.set(u"IsNULL", 0);
    storage.root.set(u"Type", 0);
    storage.root.set(u"Value", CString(u"5"));
    CZRFilterValue value;
    value.SetInt32(1, 2);
    value.Load(storage);
    EXPECT_TRUE(value.IsNull());
    EXPECT_EQ(value.ValueType, -1);
}

TEST(StoredFilterValue, MissingKeysLoadAsAnEmptyTextOfNoType) {
    MemoryStorage storage;
    CZRFilterValue value;
    value.Load(storage);
    EXPECT_FALSE(value.IsNull());
    EXPECT_EQ(value.ValueType, -1);
    EXPECT_EQ(CString(value.GetWide()), u"");
}

TEST(StoredFilterValue, TextIsStoredAsUtf16WhateverItsEncoding) {
    CZRFilterValue value;
    value.SetText("\x80", 9, 4);
    MemoryStorage storage;
    value.Save(storage);
    EXPECT_EQ(storage.root.textOf(u"Value"), u"\u0402");
    CZRFilterValue loaded;
    loaded.Load(storage);
    EXPECT_EQ(loaded.Encoding, FE_UTF16);
    EXPECT_EQ(CString(loaded.GetWide()), u"\u0402");
}

TEST(StoredDatabase, WritesItsSectionsAndOptionsInOrder) {
    Database database;
    database.addQuery(u"q");
    database.addTable(u"t");
    database.addTable(u"u");
    database.UserFunctions[u"f"] = u"1";
    database.ExtraText = u"not stored";
    database.ExtraFlag = 12345;
    database.NameList.AddTail(u"not stored");
    MemoryStorage storage;
    database.Save(storage);
    EXPECT_EQ(storage.root.childNames(), "Options,Common,Queries,Tables");
    EXPECT_EQ(storage.root.at("Options")->keys(), kDatabaseOptions);
    EXPECT_EQ(storage.root.at("Common")->keys(),
              std::string(kCommonKeys) + ",GarbageSymbols,GarbageReplace,Version,SchemaName");
    EXPECT_EQ(storage.root.at("Queries")->childNames(), "Query1");
    EXPECT_EQ(storage.root.at("Tables")->childNames(), "Table1,Table2");
    EXPECT_EQ(storage.root.dump().find("not stored"), std::string::npos);
    EXPECT_EQ(storage.root.dump().find("12345"), std::string::npos);
    const Calls behindTheBase(storage.calls.begin() + 23, storage.calls.begin() + 25);
    EXPECT_EQ(behindTheBase, (Calls{"open Options 0", "int OverwriteDatabase=0"}));
}

TEST(StoredDatabase, SectionsAreOpenedAsTold) {
    MemoryStorage storage;
    Database database;
    database.Save(storage);
    const auto opened = [&storage](const std::string& name) {
        std::string flags;
        for (const std::string& call : storage.calls)
            if (call.starts_with("open " + name + " ")) flags += call.back();
        return flags;
    };
    EXPECT_EQ(opened("Options"), "10");
    EXPECT_EQ(opened("Common"), "10");
    EXPECT_EQ(opened("Queries"), "1");
    EXPECT_EQ(opened("Tables"), "1");
    storage.forgetCalls();
    Factory factory;
    database.Load(storage, factory);
    EXPECT_EQ(opened("Queries"), "1") << "in reading too";
    EXPECT_EQ(opened("Tables"), "0");
}

TEST(StoredDatabase, EmptyNodeGivesOtherValuesThanANewDatabaseHas) {
    MemoryStorage storage;
    Factory factory;
    Database database;
    EXPECT_EQ(database.OverwriteDatabase, 0);
    EXPECT_EQ(database.MaxQuant, 100);
    database.Load(storage, factory);
    EXPECT_EQ(database.OverwriteDatabase, 1);
    EXPECT_EQ(database.MaxQuant, 1);
    EXPECT_EQ(database.AutoStructureUpdate, 1);
    EXPECT_EQ(database.MaxThreads, 1);
    EXPECT_EQ(database.BulkInsert, 0);
    EXPECT_EQ(database.UseHistoryCopyData, 0);
    EXPECT_EQ(database.CleanHistoryAfterUse, 0);
    for (int option :
         {database.CloseExistingConnections, database.OverwriteTables, database.CreateLogsEnabled,
          database.CreateDiff, database.CreateUndiff, database.Quant, static_cast<int>(database.CaseState),
          database.UseTriggersOnlyMaster, database.BidirectionalSync, database.ModifiedTriggers,
          database.WithTriggers, database.WithBidirectional, database.HandleSelectedObjects})
        EXPECT_EQ(option, 0);
    EXPECT_EQ(storage.root.childNames(), "Queries") << "the one section that reading makes";
}

TEST(StoredDatabase, OptionsAreReadIntoTheirMembers) {
    MemoryStorage storage;
    auto& options = storage.root.add(u"Options");
    int number = 2;
    std::string keys(kDatabaseOptions);
    keys = keys.substr(keys.find("OverwriteDatabase"));
    for (std::size_t at = 0; at < keys.size();) {
        const std::size_t end = std::min(keys.find(',', at), keys.size());
        options.set(CString(keys.substr(at, end - at).c_str()), number++);
        at = end + 1;
    }
    Factory factory;
    Database database;
    database.Load(storage, factory);
    EXPECT_EQ(database.OverwriteDatabase, 2);
    EXPECT_EQ(database.CloseExistingConnections, 3);
    EXPECT_EQ(database.OverwriteTables, 4);
    EXPECT_EQ(database.AutoStructureUpdate, 5);
    EXPECT_EQ(database.CreateLogsEnabled, 6);
    EXPECT_EQ(database.CreateDiff, 7);
    EXPECT_EQ(database.CreateUndiff, 8);
    EXPECT_EQ(database.BulkInsert, 9);
    EXPECT_EQ(database.Quant, 10);
    EXPECT_EQ(database.CaseState, 11);
    EXPECT_EQ(database.MaxThreads, 12);
    EXPECT_EQ(database.MaxQuant, 13);
    EXPECT_EQ(database.UseHistoryCopyData, 14);
    EXPECT_EQ(database.UseTriggersOnlyMaster, 15);
    EXPECT_EQ(database.BidirectionalSync, 16);
    EXPECT_EQ(database.CleanHistoryAfterUse, 17);
    EXPECT_EQ(database.ModifiedTriggers, 18);
    EXPECT_EQ(database.WithTriggers, 19);
    EXPECT_EQ(database.WithBidirectional, 20);
    EXPECT_EQ(database.HandleSelectedObjects, 21);
}

TEST(StoredDatabase, LoadedObjectsBelongToTheDatabase) {
    Database database;
    database.addTable(u"t", {u"a"});
    database.addQuery(u"q");
    MemoryStorage storage;
    database.Save(storage);
    Database loaded;
    loaded.type = DB_MYSQL;
    Factory factory;
    loaded.Load(storage, factory);
    ASSERT_EQ(loaded.Tables.GetCount(), 1);
    ASSERT_EQ(loaded.Queries.GetCount(), 1);
    EXPECT_EQ(loaded.Tables.GetHead()->Database, &loaded);
    EXPECT_EQ(loaded.Queries.GetHead()->m_database, &loaded);
    EXPECT_EQ(factory.kinds, (std::vector<DBTypes>{DB_MYSQL, DB_MYSQL, DB_MSSQL}))
        << "a query, a table, and a column of that table's kind";
}

TEST(StoredDatabase, OldObjectsStayAliveWhenItIsLoadedAnew) {
    Database database;
    Table& table = database.addTable(u"t", {u"a"});
    Query& query = database.addQuery(u"q");
    MemoryStorage storage;
    database.Save(storage);
    Factory factory;
    database.Load(storage, factory);
    database.Load(storage, factory);
    EXPECT_EQ(database.Tables.GetCount(), 1);
    EXPECT_NE(database.Tables.GetHead(), &table);
    EXPECT_EQ(table.field(u"a")->SrcName, u"a");
    EXPECT_EQ(query.SrcName, u"q");
}

TEST(StoredQuery, StoresTheCommonMembersAlone) {
    Query query(u"q");
    query.SetSQL(u"SELECT 1");
    query.readsFrom(u"t").refersTo(u"t", u"a");
    MemoryStorage storage;
    query.SaveQuery(storage);
    EXPECT_EQ(storage.root.childNames(), "Options,Common");
    EXPECT_EQ(storage.root.at("Options")->keys(), "Selected,LowerCase");
    EXPECT_EQ(storage.root.at("Common")->keys(), kCommonKeys);
    Query loaded;
    Factory factory;
    loaded.Load(storage, factory);
    EXPECT_EQ(loaded.SrcName, u"q");
    EXPECT_TRUE(loaded.m_sql.IsEmpty());
}

class CountingQuery : public Query {
 public:
    void SaveQuery(CZRStorageNode& node) override {
        ++saves;
        Query::SaveQuery(node);
    }
    int saves = 0;
};

TEST(StoredDatabase, QueriesAreWrittenByTheirOwnOperation) {
    Database database;
    auto* query = new CountingQuery;
    database.Queries.AddTail(query);
    MemoryStorage storage;
    database.Save(storage);
    EXPECT_EQ(query->saves, 1);
}

class FailingStorage : public MemoryStorage {
 public:
    int ReadInt(CString name, int defaultValue) override {
        if (name == u"SyncDrop") throw std::runtime_error("broken");
        return MemoryStorage::ReadInt(name, defaultValue);
    }
};

TEST(StoredForm, SectionsAreClosedWhenAStorageRaises) {
    FailingStorage storage;
    storage.root.add(u"Tables").add(u"Table1");
    Database database;
    Factory factory;
    EXPECT_THROW(database.Load(storage, factory), std::runtime_error);
    EXPECT_TRUE(storage.isAtRoot());
    EXPECT_EQ(database.Tables.GetCount(), 1) << "owned, so that nothing leaks";
}

class EmptyFactory : public Factory {
 public:
    CZRFieldInfo* CreateField(DBTypes) override { return nullptr; }
    CZRFilterInfo* CreateFilter(DBTypes) override { return nullptr; }
};

TEST(StoredForm, WhatAFactoryDoesNotMakeIsLeftOut) {
    Table table(u"t", {u"a"});
    Filter filter;
    filter.SQLQuery = u"x";
    table.AttachFilterCopy(&filter);
    MemoryStorage storage;
    table.Save(storage);
    EmptyFactory factory;
    Table loaded;
    loaded.Load(storage, factory);
    EXPECT_TRUE(loaded.Fields.IsEmpty());
    EXPECT_EQ(loaded.Filter, nullptr);
}

}  // namespace
