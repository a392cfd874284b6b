#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <vector>

#include "tests/model/memory_storage.h"
#include "tests/model/small_host.h"
#include "tests/platform/print_string.h"

// Each key of the stored form with the member behind it, in both directions, and the whole road of a saved
// and a loaded database, call by call.
namespace {

using zr::test::Database;
using zr::test::Factory;
using zr::test::Field;
using zr::test::Filter;
using zr::test::FilterItem;
using zr::test::ForeignKey;
using zr::test::Index;
using zr::test::MemoryStorage;
using zr::test::Query;
using zr::test::Section;
using zr::test::Table;
using Calls = std::vector<std::string>;

// A key, and how its member is read and written.
template <class Object, class Value>
struct Key {
    const char16_t* section;
    const char16_t* name;
    std::function<Value(Object&)> get;
    std::function<void(Object&, Value)> set;
};

template <class Object, class Member>
Key<Object, int> number(const char16_t* section, const char16_t* name, Member member) {
    return {section, name, [member](Object& object) { return static_cast<int>(object.*member); },
            [member](Object& object, int value) {
                object.*member = static_cast<std::remove_reference_t<decltype(object.*member)>>(value);
            }};
}

template <class Object, class Member>
Key<Object, CString> text(const char16_t* section, const char16_t* name, Member member) {
    return {section, name, [member](Object& object) { return object.*member; },
            [member](Object& object, CString value) { object.*member = std::move(value); }};
}

// The common keys, for each class that has them.
template <class Object>
std::vector<Key<Object, int>> commonNumbers() {
    const char16_t* common = u"Common";
    return {number<Object>(u"Options", u"Selected", &CZRObjectInfo::Selected),
            number<Object>(u"Options", u"LowerCase", &CZRObjectInfo::LowerCase),
            number<Object>(common, u"Length", &CZRObjectInfo::Length),
            number<Object>(common, u"LengthMapped", &CZRObjectInfo::LengthMapped),
            number<Object>(common, u"Scale", &CZRObjectInfo::Scale),
            number<Object>(common, u"ScaleMapped", &CZRObjectInfo::ScaleMapped),
            number<Object>(common, u"DataType", &CZRObjectInfo::DataType),
            number<Object>(common, u"State", &CZRObjectInfo::State),
            number<Object>(common, u"Correct", &CZRObjectInfo::Correct),
            number<Object>(common, u"DbTypeSrcLast", &CZRObjectInfo::DbTypeSrcLast),
            number<Object>(common, u"DbTypeSrcCur", &CZRObjectInfo::DbTypeSrcCur),
            number<Object>(common, u"AutoIncrMapped", &CZRObjectInfo::AutoIncrMapped),
            number<Object>(common, u"UnsignedMapped", &CZRObjectInfo::UnsignedMapped),
            number<Object>(common, u"IndexOff", &CZRObjectInfo::IndexOff)};
}

template <class Object>
std::vector<Key<Object, CString>> commonTexts() {
    return {text<Object>(u"Common", u"Name", &CZRObjectInfo::Name),
            text<Object>(u"Common", u"Type", &CZRObjectInfo::Type),
            text<Object>(u"Common", u"TypeMapped", &CZRObjectInfo::TypeMapped),
            text<Object>(u"Common", u"TypeMappedString", &CZRObjectInfo::TypeMappedString),
            text<Object>(u"Common", u"SrcName", &CZRObjectInfo::SrcName)};
}

CString numberedText(int number) {
    CString result;
    result.Format(u"text %d", number);
    return result;
}

// Gives every member a value of its own and looks for it under its key; then the other way round.
template <class Object>
void checkKeys(const std::vector<Key<Object, int>>& numbers, const std::vector<Key<Object, CString>>& texts) {
    Object saved;
    int value = 20;
    for (const auto& key : numbers) key.set(saved, ++value);
    for (const auto& key : texts) key.set(saved, numberedText(++value));
    MemoryStorage storage;
    saved.Save(storage);
    value = 20;
    for (const auto& key : numbers)
        EXPECT_EQ(storage.root.child(key.section)->intOf(key.name), ++value) << CString(key.name).toUtf8();
    for (const auto& key : texts)
        EXPECT_EQ(storage.root.child(key.section)->textOf(key.name), numberedText(++value))
            << CString(key.name).toUtf8();

    MemoryStorage written;
    value = 60;
    for (const auto& key : numbers) written.root.add(key.section).set(key.name, ++value);
    for (const auto& key : texts) written.root.add(key.section).set(key.name, numberedText(++value));
    Object loaded;
    Factory factory;
    loaded.Load(written, factory);
    value = 60;
    for (const auto& key : numbers) EXPECT_EQ(key.get(loaded), ++value) << CString(key.name).toUtf8();
    for (const auto& key : texts)
        EXPECT_EQ(key.get(loaded), numberedText(++value)) << CString(key.name).toUtf8();
}

TEST(StoredKeys, OfACommonObject) {
    checkKeys<Field>(commonNumbers<Field>(), commonTexts<Field>());
}

TEST(StoredKeys, OfAQuery) {
    checkKeys<Query>(commonNumbers<Query>(), commonTexts<Query>());
}

TEST(StoredKeys, OfATable) {
    auto numbers = commonNumbers<Table>();
    const auto add = [&numbers](const char16_t* name, int CZRTableInfo::*member) {
        numbers.push_back(number<Table>(u"Options", name, member));
    };
    add(u"CopyStructure", &CZRTableInfo::CopyStructure);
    add(u"CopyIndexes", &CZRTableInfo::CopyIndexes);
    add(u"CopyForeignKeys", &CZRTableInfo::CopyForeignKeys);
    add(u"CopyData", &CZRTableInfo::CopyData);
    add(u"OverwriteTable", &CZRTableInfo::OverwriteTable);
    add(u"TruncateTable", &CZRTableInfo::TruncateTable);
    add(u"ModifyFields", &CZRTableInfo::ModifyFields);
    add(u"ModifyIndexes", &CZRTableInfo::ModifyIndexes);
    add(u"ModifyForeignKeys", &CZRTableInfo::ModifyForeignKeys);
    add(u"SyncInsert", &CZRTableInfo::SyncInsert);
    add(u"SyncUpdate", &CZRTableInfo::SyncUpdate);
    add(u"SyncDrop", &CZRTableInfo::SyncDrop);
    checkKeys<Table>(numbers, commonTexts<Table>());
}

TEST(StoredKeys, OfADatabase) {
    auto numbers = commonNumbers<Database>();
    const auto add = [&numbers](const char16_t* name, auto member) {
        numbers.push_back(number<Database>(u"Options", name, member));
    };
    add(u"OverwriteDatabase", &CZRDatabaseInfo::OverwriteDatabase);
    add(u"CloseExistingConnections", &CZRDatabaseInfo::CloseExistingConnections);
    add(u"OverwriteTables", &CZRDatabaseInfo::OverwriteTables);
    add(u"AutoStructureUpdate", &CZRDatabaseInfo::AutoStructureUpdate);
    add(u"CreateLogsEnabled", &CZRDatabaseInfo::CreateLogsEnabled);
    add(u"CreateDiff", &CZRDatabaseInfo::CreateDiff);
    add(u"CreateUndiff", &CZRDatabaseInfo::CreateUndiff);
    add(u"BulkInsert", &CZRDatabaseInfo::BulkInsert);
    add(u"Quant", &CZRDatabaseInfo::Quant);
    add(u"CaseState", &CZRDatabaseInfo::CaseState);
    add(u"MaxThreads", &CZRDatabaseInfo::MaxThreads);
    add(u"MaxQuant", &CZRDatabaseInfo::MaxQuant);
    add(u"UseHistoryCopyData", &CZRDatabaseInfo::UseHistoryCopyData);
    add(u"UseTriggersOnlyMaster", &CZRDatabaseInfo::UseTriggersOnlyMaster);
    add(u"BidirectionalSync", &CZRDatabaseInfo::BidirectionalSync);
    add(u"CleanHistoryAfterUse", &CZRDatabaseInfo::CleanHistoryAfterUse);
    add(u"ModifiedTriggers", &CZRDatabaseInfo::ModifiedTriggers);
    add(u"WithTriggers", &CZRDatabaseInfo::WithTriggers);
    add(u"WithBidirectional", &CZRDatabaseInfo::WithBidirectional);
    add(u"HandleSelectedObjects", &CZRDatabaseInfo::HandleSelectedObjects);
    auto texts = commonTexts<Database>();
    texts.push_back(text<Database>(u"Common", u"GarbageSymbols", &CZRDatabaseInfo::GarbageSymbols));
    texts.push_back(text<Database>(u"Common", u"GarbageReplace", &CZRDatabaseInfo::GarbageReplace));
    texts.push_back(text<Database>(u"Common", u"Version", &CZRDatabaseInfo::Version));
    texts.push_back(text<Database>(u"Common", u"SchemaName", &CZRDatabaseInfo::SchemaName));
    checkKeys<Database>(numbers, texts);
}

TEST(StoredKeys, OfAFilterAndItsConditions) {
    Filter filter;
    filter.SQLQuery = u"x > 1";
    filter.UseSQLQuery = 21;
    auto* item = new FilterItem(u"field", u"value");
    item->Condition = 22;
    item->ConditionAdd = 23;
    item->Value.ValueType = 24;
    filter.Items.AddTail(item);
    MemoryStorage storage;
    filter.Save(storage);
    EXPECT_EQ(storage.root.dump(),
              "SQLQuery = 'x > 1'\nUseSQLQuery = 21\nCondition1\n  FieldID = 'field'\n  Condition = 22\n"
              "  ConditionAdd = 23\n  Value\n    IsNULL = 0\n    Type = 24\n    Value = 'value'\n");
    Filter loaded;
    Factory factory;
    loaded.Load(storage, factory);
    EXPECT_EQ(loaded.SQLQuery, u"x > 1");
    EXPECT_EQ(loaded.UseSQLQuery, 21);
    ASSERT_EQ(loaded.Items.GetCount(), 1);
    CZRFilterItemInfo& condition = *loaded.Items.GetHead();
    EXPECT_EQ(condition.FieldID, u"field");
    EXPECT_EQ(condition.Condition, 22);
    EXPECT_EQ(condition.ConditionAdd, 23);
    EXPECT_EQ(condition.Value.ValueType, 24);
    EXPECT_EQ(CString(condition.Value.GetWide()), u"value");
}

// A database with one of everything.
void fill(Database& database) {
    database.addQuery(u"q");
    Table& table = database.addTable(u"t", {u"a"});
    table.addIndex(new Index(u"i"));
    table.addForeignKey(u"k", u"");
    Filter filter;
    filter.SQLQuery = u"s";
    filter.Items.AddTail(new FilterItem(u"a", u"v"));
    table.AttachFilterCopy(&filter);
}

// The calls of one kind of access, without the values: "Selected", "[Options", "]", "?Filter", "names".
Calls road(const MemoryStorage& storage) {
    Calls steps;
    for (const std::string& call : storage.calls) {
        const std::string verb = call.substr(0, call.find(' '));
        std::string name = call == verb ? "" : call.substr(verb.size() + 1);
        name = name.substr(0, name.find_first_of("=? "));
        steps.push_back(verb == "open"    ? "[" + name
                        : verb == "close" ? "]"
                        : verb == "has"   ? "?" + name
                        : verb == "names" ? verb
                                          : name);
    }
    return steps;
}

Calls joined(std::initializer_list<Calls> parts) {
    Calls all;
    for (const Calls& part : parts) all.insert(all.end(), part.begin(), part.end());
    return all;
}

Calls split(const std::string& words) {
    Calls all;
    std::string word;
    for (const char c : words + " ") {
        if (c != ' ') {
            word += c;
        } else if (!word.empty()) {
            all.push_back(word);
            word.clear();
        }
    }
    return all;
}

const Calls kCommon = split(
    "[Common Name Type TypeMapped TypeMappedString SrcName Length LengthMapped Scale ScaleMapped DataType "
    "State "
    "Correct DbTypeSrcLast DbTypeSrcCur AutoIncrMapped UnsignedMapped IndexOff ]");
const Calls kWrittenObject = joined({split("[Options Selected LowerCase ]"), kCommon});
const Calls kReadObject = joined({split("[Options SrcName Selected LowerCase ]"), kCommon});
const Calls kTableOptions = split(
    "[Options CopyStructure CopyIndexes CopyForeignKeys CopyData OverwriteTable TruncateTable ModifyFields "
    "ModifyIndexes ModifyForeignKeys SyncInsert SyncUpdate SyncDrop ]");
const Calls kDatabaseSettings = split(
    "[Options OverwriteDatabase CloseExistingConnections OverwriteTables AutoStructureUpdate "
    "CreateLogsEnabled "
    "CreateDiff CreateUndiff BulkInsert Quant CaseState MaxThreads MaxQuant UseHistoryCopyData "
    "UseTriggersOnlyMaster BidirectionalSync CleanHistoryAfterUse ModifiedTriggers WithTriggers "
    "WithBidirectional HandleSelectedObjects ] [Common GarbageSymbols GarbageReplace Version SchemaName ]");
const Calls kFilter = split("FieldID Condition ConditionAdd [Value IsNULL Type Value ]");

TEST(StoredForm, WholeDatabaseIsWrittenInOrder) {
    Database database;
    fill(database);
    MemoryStorage storage;
    database.Save(storage);
    EXPECT_EQ(
        road(storage),
        joined({kWrittenObject, kDatabaseSettings, split("[Queries [Query1"), kWrittenObject,
                split("] ] [Tables [Table1"), kWrittenObject, kTableOptions, split("[Fields [Field1"),
                kWrittenObject, split("] ] [Indexes [Index1"), kWrittenObject,
                split("] ] [ForeignKeys [ForeignKey1"), kWrittenObject,
                split("] ] [Filter DBType SQLQuery UseSQLQuery [Condition1"), kFilter, split("] ] ] ]")}));
}

TEST(StoredForm, WholeDatabaseIsReadInOrder) {
    Database database;
    fill(database);
    MemoryStorage storage;
    database.Save(storage);
    storage.forgetCalls();
    Factory factory;
    Database loaded;
    loaded.Load(storage, factory);
    EXPECT_EQ(road(storage),
              joined({kReadObject, kDatabaseSettings, split("[Queries names [Query1"), kReadObject,
                      split("] ] [Tables names [Table1"), kReadObject, kTableOptions,
                      split("[Fields names [Field1"), kReadObject, split("] ] [Indexes names [Index1"),
                      kReadObject, split("] ] ?ForeignKeys [ForeignKeys names [ForeignKey1"), kReadObject,
                      split("] ] ?Filter [Filter DBType SQLQuery UseSQLQuery names [Condition1"), kFilter,
                      split("] ] ] ]")}));
}

}  // namespace
