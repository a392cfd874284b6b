#include "zrparsersql/table_info.h"

#include <gtest/gtest.h>

#include <memory>

#include "tests/model/small_host.h"
#include "tests/platform/print_string.h"

namespace {

using zr::test::Database;
using zr::test::Field;
using zr::test::Filter;
using zr::test::FilterItem;
using zr::test::Index;
using zr::test::Table;

TEST(TableInfo, FindsColumnsIndexesAndKeysWithoutRegardToCase) {
    Table table(u"t", {u"a", u"b"});
    table.Fields.AddTail(nullptr);
    table.Indexes.AddTail(nullptr);
    table.ForeignKeys.AddTail(nullptr);
    Field* field = table.addField(u"c");
    field->Name = u"NewC";
    Index* index = table.addIndex(new Index(u"ix"));
    index->Name = u"NewIx";
    auto* key = table.addForeignKey(u"fk", u"");
    key->Name = u"NewFk";
    EXPECT_EQ(table.FindFieldBySrcName(u"C"), field);
    EXPECT_EQ(table.FindFieldByName(u"newc"), field);
    CString id = field->ID;
    EXPECT_EQ(table.FindFieldByID(id.MakeLower()), field);
    EXPECT_EQ(table.FindFieldBySrcName(u"x"), nullptr);
    EXPECT_EQ(table.FindIndexBySrcName(u"IX"), index);
    EXPECT_EQ(table.FindIndexByName(u"newix"), index);
    EXPECT_EQ(table.FindForeignKeyBySrcName(u"FK"), key);
    EXPECT_EQ(table.FindForeignKeyByName(u"newfk"), key);
}

TEST(TableInfo, FoldingCannotChangeWhatIsFound) {
    Table table(u"t", {u"Ab"});
    table.field(u"ab")->LowerCase = 1;
    EXPECT_NE(table.FindFieldByName(u"aB"), nullptr);
}

TEST(TableInfo, ForeignKeysAreFoundByIdWithRegardToCaseAndIndexesWithout) {
    Table table(u"t");
    Index* index = table.addIndex(new Index(u"ix"));
    auto* key = table.addForeignKey(u"fk", u"");
    index->SetID(u"Abc");
    key->SetID(u"Abc");
    EXPECT_EQ(table.FindIndexByID(u"aBC"), index);
    EXPECT_EQ(table.FindForeignKeyByID(u"aBC"), nullptr);
    EXPECT_EQ(table.FindForeignKeyByID(u"Abc"), key);
}

TEST(TableInfo, ResolvesReferencesOfItsIndexesAndKeys) {
    Table table(u"t");
    Index* index = table.addIndex(new Index(u"ix"));
    auto* key = table.addForeignKey(u"fk", u"");
    table.ResolveReferences();
    EXPECT_EQ(index->resolved, 1);
    EXPECT_EQ(key->resolved, 1);
}

TEST(TableInfo, ValidationEndsAtItsOwnError) {
    Table table(u"t", {u"a"});
    table.SetCorrect(101);
    table.field(u"a")->SetCorrect(5);
    EXPECT_EQ(table.Validate(0), 101);
}

TEST(TableInfo, ValidationEndsAtTheFirstErrorOfAColumn) {
    Table table(u"t", {u"a", u"b"});
    table.field(u"a")->SetCorrect(5);
    table.field(u"b")->SetCorrect(6);
    EXPECT_EQ(table.Validate(0), 5);
}

TEST(TableInfo, ValidationCanRequireAllColumnsToBeSelected) {
    Table table(u"t", {u"a", u"b"});
    table.field(u"b")->Selected = 0;
    EXPECT_EQ(table.Validate(0), 0);
    EXPECT_EQ(table.Validate(1), 1);
}

TEST(TableInfo, ValidationStopsAtASelectedIndexWithAnError) {
    Table table(u"t");
    table.addIndex(new Index(u"first"))->SetCorrect(3);
    table.addIndex(new Index(u"second"))->SetCorrect(0);
    EXPECT_EQ(table.Validate(0), 3);
}

TEST(TableInfo, ValidationPassesOverAnUnselectedIndexUnlessItIsTheLast) {
    Table table(u"t");
    Index* first = table.addIndex(new Index(u"first"));
    Index* second = table.addIndex(new Index(u"second"));
    first->SetCorrect(3);
    first->Selected = 0;
    EXPECT_EQ(table.Validate(0), 0);
    second->SetCorrect(4);
    second->Selected = 0;
    EXPECT_EQ(table.Validate(0), 4) << "the last one's result stands";
}

TEST(TableInfo, ValidationTreatsForeignKeysLikeIndexes) {
    Table table(u"t");
    auto* first = table.addForeignKey(u"first", u"");
    auto* second = table.addForeignKey(u"second", u"");
    first->SetCorrect(3);
    first->Selected = 0;
    EXPECT_EQ(table.Validate(0), 0);
    second->SetCorrect(4);
    EXPECT_EQ(table.Validate(0), 4);
}

TEST(TableInfo, AttachedFilterIsACopyWithoutUnknownColumns) {
    Table table(u"t", {u"a", u"b"});
    Filter filter;
    filter.Items.AddTail(new FilterItem(u"A", u"1"));
    filter.Items.AddTail(new FilterItem(u"unknown", u"2"));
    filter.Items.AddTail(new FilterItem(u"b", u"3"));
    table.AttachFilterCopy(&filter);
    ASSERT_NE(table.GetFilter(), nullptr);
    EXPECT_NE(table.GetFilter(), &filter);
    ASSERT_EQ(table.Filter->Items.GetCount(), 2);
    EXPECT_EQ(table.Filter->Items.GetHead()->FieldID, u"A");
    EXPECT_EQ(table.Filter->Items.GetTail()->FieldID, u"b");
    EXPECT_EQ(filter.Items.GetCount(), 3);
    table.AttachFilterCopy(nullptr);
    EXPECT_EQ(table.Filter, nullptr);
}

TEST(TableInfo, FilterLeftWithNothingIsDroppedWhole) {
    Table table(u"t", {u"a"});
    Filter filter;
    filter.Items.AddTail(new FilterItem(u"unknown", u"2"));
    table.AttachFilterCopy(&filter);
    EXPECT_EQ(table.Filter, nullptr);
    filter.SQLQuery = u"x > 1";
    table.AttachFilterCopy(&filter);
    ASSERT_NE(table.Filter, nullptr);
    EXPECT_EQ(table.Filter->GetSQLQuery(), u"x > 1");
    EXPECT_TRUE(table.Filter->Items.IsEmpty());
}

TEST(TableInfo, MayAttachACopyOfItsOwnFilter) {
    Table table(u"t", {u"a"});
    Filter filter;
    filter.Items.AddTail(new FilterItem(u"a", u"1"));
    table.AttachFilterCopy(&filter);
    table.AttachFilterCopy(table.Filter);
    ASSERT_NE(table.Filter, nullptr);
    EXPECT_EQ(table.Filter->Items.GetCount(), 1);
}

TEST(TableInfo, ClearEmptiesEverything) {
    Table table(u"t", {u"a"});
    table.addIndex(new Index(u"ix"))->unique = 1;
    table.addForeignKey(u"fk", u"");
    table.Fields.AddTail(nullptr);
    Filter filter;
    filter.SQLQuery = u"x";
    table.AttachFilterCopy(&filter);
    EXPECT_NE(table.GetUniqueIndex(), nullptr);
    table.Clear();
    EXPECT_TRUE(table.Fields.IsEmpty());
    EXPECT_TRUE(table.Indexes.IsEmpty());
    EXPECT_TRUE(table.ForeignKeys.IsEmpty());
    EXPECT_EQ(table.Filter, nullptr);
    EXPECT_EQ(table.UniqueIndex, nullptr);
    EXPECT_EQ(table.UniqueIndexDirty, 1);
}

TEST(TableInfo, CloneBelongsToNoDatabaseAndOwnsItsChildren) {
    Database database;
    Table& table = database.addTable(u"t", {u"a"});
    table.addIndex(new Index(u"ix", {u"a"}));
    table.addForeignKey(u"fk", u"x");
    table.Fields.AddTail(nullptr);
    table.UpdateDepth = 3;
    table.SyncDrop = 0;
    Filter filter;
    filter.Items.AddTail(new FilterItem(u"a", u"1"));
    table.AttachFilterCopy(&filter);
    table.GetUniqueIndex();
    const std::unique_ptr<Table> clone(table.Clone());
    EXPECT_EQ(clone->Database, nullptr);
    EXPECT_EQ(clone->UpdateDepth, 0);
    EXPECT_EQ(clone->UniqueIndexDirty, 1);
    EXPECT_EQ(clone->SyncDrop, 0);
    EXPECT_EQ(clone->ID, table.ID);
    ASSERT_EQ(clone->Fields.GetCount(), 1);
    EXPECT_EQ(clone->field(u"a")->owner, clone.get());
    EXPECT_EQ(clone->field(u"a")->ID, table.field(u"a")->ID);
    EXPECT_NE(clone->field(u"a"), table.field(u"a"));
    EXPECT_EQ(static_cast<Index*>(clone->Indexes.GetHead())->owner, clone.get());
    EXPECT_EQ(static_cast<zr::test::ForeignKey*>(clone->ForeignKeys.GetHead())->owner, clone.get());
    ASSERT_NE(clone->Filter, nullptr);
    EXPECT_NE(clone->Filter, table.Filter);
    EXPECT_EQ(clone->Filter->Items.GetCount(), 1);
}

TEST(TableInfo, CloneOfTheSelectedHoldsOnlySelectedChildren) {
    Table table(u"t", {u"a", u"b"});
    table.field(u"a")->Selected = 0;
    table.addIndex(new Index(u"ix"))->Selected = 0;
    table.addForeignKey(u"fk", u"");
    Filter filter;
    filter.Items.AddTail(new FilterItem(u"a", u"1"));
    table.AttachFilterCopy(&filter);
    const std::unique_ptr<Table> clone(table.Clone(1));
    EXPECT_EQ(clone->Fields.GetCount(), 1);
    EXPECT_TRUE(clone->Indexes.IsEmpty());
    EXPECT_EQ(clone->ForeignKeys.GetCount(), 1);
    EXPECT_EQ(clone->Filter, nullptr) << "its only column is gone";
    EXPECT_EQ(clone->Database, nullptr);
}

TEST(TableInfo, CopyFromTakesSettingsAsTheyStand) {
    Table other(u"other", {u"a"});
    other.CopyStructure = 0;
    other.OverwriteTable = 1;
    other.SyncInsert = 0;
    other.Selected = 0;
    Table table(u"t", {u"a"});
    table.CopyFrom(other, DB_MSSQL);
    EXPECT_EQ(table.CopyStructure, 0);
    EXPECT_EQ(table.OverwriteTable, 1);
    EXPECT_EQ(table.SyncInsert, 0);
    EXPECT_EQ(table.SyncUpdate, 1);
    EXPECT_EQ(table.Selected, 0);
    EXPECT_EQ(table.Name, u"other");
    EXPECT_EQ(table.SrcName, u"t");
    EXPECT_EQ(table.CopyIndexes, 0) << "the other table has no indexes";
    EXPECT_EQ(table.CopyForeignKeys, 0);
}

TEST(TableInfo, CopyFromMergesChildrenBySourceName) {
    Database database;
    Table& table = database.addTable(u"t", {u"a", u"b"});
    table.addIndex(new Index(u"ix"));
    table.addIndex(new Index(u"only"));
    table.addForeignKey(u"fk", u"");
    Table other(u"t", {u"A"});
    other.field(u"a")->Length = 7;
    other.addIndex(new Index(u"IX"))->Length = 8;
    other.addForeignKey(u"FK", u"")->Length = 9;
    table.CopyFrom(other, DB_MSSQL);
    EXPECT_EQ(table.field(u"a")->Length, 7);
    EXPECT_EQ(table.field(u"b")->Selected, 0) << "AutoStructureUpdate is off";
    table.Indexes.AddTail(nullptr);
    EXPECT_EQ(table.FindIndexBySrcName(u"ix")->Length, 8);
    EXPECT_EQ(table.FindIndexBySrcName(u"only")->Selected, 0);
    EXPECT_EQ(table.ForeignKeys.GetHead()->Length, 9);
    database.AutoStructureUpdate = 1;
    table.CopyFrom(other, DB_MSSQL);
    EXPECT_EQ(table.field(u"b")->Selected, 1);
}

TEST(TableInfo, CopyFromTakesAFilterOfThatKindOnly) {
    Table other(u"t", {u"a"});
    Filter filter(DB_ORACLE);
    filter.Items.AddTail(new FilterItem(u"a", u"1"));
    other.AttachFilterCopy(&filter);
    Table table(u"t", {u"a"});
    table.CopyFrom(other, DB_ORACLE);
    EXPECT_NE(table.Filter, nullptr);
    table.CopyFrom(other, DB_MSSQL);
    EXPECT_EQ(table.Filter, nullptr);
}

TEST(TableInfo, DialectTextsAreEmptyAndIgnored) {
    Table table(u"t");
    table.SetDialectText1(u"x");
    table.SetDialectText2(u"x");
    table.SetDialectText3(u"x");
    table.SetDialectText4(u"x");
    table.ResetDialectState();
    EXPECT_TRUE(table.GetDialectText1().IsEmpty());
    EXPECT_TRUE(table.GetDialectText2().IsEmpty());
    EXPECT_TRUE(table.GetDialectText3().IsEmpty());
    EXPECT_TRUE(table.GetDialectText4().IsEmpty());
}

}  // namespace
