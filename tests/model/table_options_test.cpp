#include <gtest/gtest.h>

#include "tests/model/small_host.h"

namespace {

using zr::test::Database;
using zr::test::Field;
using zr::test::Index;
using zr::test::Table;

class TableOptions : public testing::Test {
 protected:
    TableOptions() : table(database.addTable(u"t", {u"a", u"b"})) {
        index = table.addIndex(new Index(u"ix"));
        key = table.addForeignKey(u"fk", u"");
    }
    int selectedFields() {
        int count = 0;
        for (const CZRFieldInfo* field : table.Fields) count += field->GetSelected();
        return count;
    }

    Database database;
    Table& table;
    Index* index;
    zr::test::ForeignKey* key;
};

TEST_F(TableOptions, NewTableCopiesAndSynchronisesAndOverwritesNothing) {
    const Table fresh;
    EXPECT_EQ(fresh.CopyStructure, 1);
    EXPECT_EQ(fresh.CopyIndexes, 1);
    EXPECT_EQ(fresh.CopyForeignKeys, 1);
    EXPECT_EQ(fresh.CopyData, 1);
    EXPECT_EQ(fresh.SyncInsert, 1);
    EXPECT_EQ(fresh.SyncUpdate, 1);
    EXPECT_EQ(fresh.SyncDrop, 1);
    EXPECT_EQ(fresh.OverwriteTable, 0);
    EXPECT_EQ(fresh.TruncateTable, 0);
    EXPECT_EQ(fresh.ModifyFields, 0);
    EXPECT_EQ(fresh.ModifyIndexes, 0);
    EXPECT_EQ(fresh.ModifyForeignKeys, 0);
    EXPECT_EQ(fresh.UpdateDepth, 0);
    EXPECT_EQ(fresh.UniqueIndexDirty, 1);
    EXPECT_EQ(fresh.GetProcessed(), 0);
    EXPECT_EQ(fresh.GetDatabase(), nullptr);
}

TEST_F(TableOptions, CopyingIndexesNeedsIndexes) {
    EXPECT_EQ(table.GetCopyIndexes(), 1);
    EXPECT_EQ(table.GetCopyForeignKeys(), 1);
    const Table without;
    EXPECT_EQ(without.CopyIndexes, 1);
    EXPECT_EQ(without.GetCopyIndexes(), 0);
    EXPECT_EQ(without.GetCopyForeignKeys(), 0);
    table.CopyIndexes = 2;
    EXPECT_EQ(table.GetCopyIndexes(), 0) << "the lowest bit counts";
}

TEST_F(TableOptions, SettersWithoutLogicStoreTheValue) {
    table.SetSyncInsert(0);
    table.SetSyncUpdate(5);
    table.SetSyncDrop(0);
    table.SetTruncateTable(1);
    EXPECT_EQ(table.GetSyncInsert(), 0);
    EXPECT_EQ(table.GetSyncUpdate(), 5);
    EXPECT_EQ(table.GetSyncDrop(), 0);
    EXPECT_EQ(table.GetTruncateTable(), 1);
}

TEST_F(TableOptions, SwitchingTheStructureOffKeepsColumnsThatDataHolds) {
    table.SetCopyStructure(0);
    EXPECT_EQ(table.GetCopyStructure(), 0);
    EXPECT_EQ(table.GetCopyData(), 1);
    EXPECT_EQ(selectedFields(), 2);
    EXPECT_EQ(table.Selected, 1);
    EXPECT_EQ(table.CopyIndexes, 0);
    EXPECT_EQ(table.CopyForeignKeys, 0);
    EXPECT_EQ(index->Selected, 0);
    EXPECT_EQ(key->Selected, 0);
}

TEST_F(TableOptions, SwitchingTheStructureOffWithoutDataDeselectsTheColumns) {
    table.SetCopyData(0);
    EXPECT_EQ(selectedFields(), 2);
    EXPECT_EQ(table.Selected, 1);
    table.SetCopyStructure(0);
    EXPECT_EQ(selectedFields(), 0);
    EXPECT_EQ(table.Selected, 0);
    EXPECT_EQ(database.Selected, 0) << "the database is told";
}

TEST_F(TableOptions, SwitchingTheStructureOffClearsThreeOptions) {
    table.OverwriteTable = table.TruncateTable = table.ModifyFields = 1;
    table.ModifyIndexes = 1;
    table.CopyIndexes = 0;
    table.SetCopyStructure(0);
    EXPECT_EQ(table.OverwriteTable, 0);
    EXPECT_EQ(table.TruncateTable, 0);
    EXPECT_EQ(table.ModifyFields, 0);
    EXPECT_EQ(table.ModifyIndexes, 1);
}

TEST_F(TableOptions, SwitchingTheStructureOnSelectsIndexesAndKeys) {
    table.SetCopyStructure(0);
    table.SetCopyStructure(1);
    EXPECT_EQ(index->Selected, 1);
    EXPECT_EQ(key->Selected, 1);
    EXPECT_EQ(table.CopyIndexes, 1);
    EXPECT_EQ(table.OverwriteTable, 0);
}

TEST_F(TableOptions, DatabaseThatOverwritesTiesStructureDataAndOverwriting) {
    database.OverwriteDatabase = 1;
    table.SetCopyStructure(0);
    EXPECT_EQ(table.CopyData, 0);
    EXPECT_EQ(table.Selected, 0);
    table.SetCopyData(1);
    EXPECT_EQ(table.CopyStructure, 1);
    EXPECT_EQ(table.OverwriteTable, 1);
    EXPECT_EQ(table.SyncInsert, 0) << "overwriting leaves nothing to synchronise";
}

TEST_F(TableOptions, SwitchingDataOffClearsSynchronising) {
    table.SetCopyData(0);
    EXPECT_EQ(table.SyncInsert, 0);
    EXPECT_EQ(table.SyncUpdate, 0);
    EXPECT_EQ(table.SyncDrop, 0);
    table.SetCopyData(1);
    EXPECT_EQ(table.SyncInsert, 0) << "and does not come back";
}

TEST_F(TableOptions, SwitchingDataWithoutStructureMovesTheColumns) {
    table.SetCopyStructure(0);
    table.SetCopyData(0);
    EXPECT_EQ(selectedFields(), 0);
    EXPECT_EQ(table.Selected, 0);
    table.SetCopyData(1);
    EXPECT_EQ(selectedFields(), 2);
    EXPECT_EQ(table.Selected, 1);
    EXPECT_EQ(table.CopyStructure, 0);
}

TEST_F(TableOptions, IndexesAreNotSwitchedOnWithoutStructure) {
    table.SetCopyStructure(0);
    table.SetCopyIndexes(1);
    table.SetCopyForeignKeys(1);
    EXPECT_EQ(table.CopyIndexes, 0);
    EXPECT_EQ(table.CopyForeignKeys, 0);
    EXPECT_EQ(index->Selected, 0);
}

TEST_F(TableOptions, SwitchingIndexesOffClearsTheirModifying) {
    table.ModifyIndexes = 1;
    table.ModifyForeignKeys = 1;
    table.SetCopyIndexes(0);
    EXPECT_EQ(index->Selected, 0);
    EXPECT_EQ(table.ModifyIndexes, 0);
    EXPECT_EQ(table.ModifyForeignKeys, 1);
    table.SetCopyForeignKeys(0);
    EXPECT_EQ(key->Selected, 0);
    EXPECT_EQ(table.ModifyForeignKeys, 0);
    table.SetCopyIndexes(1);
    EXPECT_EQ(index->Selected, 1);
}

TEST_F(TableOptions, OverwritingClearsTheOtherWays) {
    table.TruncateTable = table.ModifyFields = table.ModifyIndexes = table.ModifyForeignKeys = 1;
    table.SetOverwriteTable(1);
    EXPECT_EQ(table.OverwriteTable, 1);
    EXPECT_EQ(table.TruncateTable, 0);
    EXPECT_EQ(table.ModifyFields, 0);
    EXPECT_EQ(table.ModifyIndexes, 0);
    EXPECT_EQ(table.ModifyForeignKeys, 0);
    EXPECT_EQ(table.SyncInsert, 0);
    EXPECT_EQ(table.SyncUpdate, 0);
    EXPECT_EQ(table.SyncDrop, 0);
    table.SetOverwriteTable(0);
    EXPECT_EQ(table.OverwriteTable, 0);
    EXPECT_EQ(table.SyncInsert, 0) << "not set back";
}

TEST_F(TableOptions, OverwritingNeedsStructure) {
    table.SetCopyStructure(0);
    table.SetOverwriteTable(1);
    EXPECT_EQ(table.OverwriteTable, 0);
}

TEST_F(TableOptions, DatabaseThatOverwritesKeepsItsTablesOverwritten) {
    table.SetOverwriteTable(1);
    database.OverwriteDatabase = 1;
    table.SetOverwriteTable(0);
    EXPECT_EQ(table.OverwriteTable, 1);
}

TEST_F(TableOptions, ModifyingNeedsItsOptionAndNoOverwriting) {
    table.SetModifyFields(1);
    table.SetModifyIndexes(1);
    table.SetModifyForeignKeys(1);
    EXPECT_EQ(table.GetModifyFields() + table.GetModifyIndexes() + table.GetModifyForeignKeys(), 3);
    table.SetOverwriteTable(1);
    table.SetModifyFields(1);
    table.SetModifyIndexes(1);
    table.SetModifyForeignKeys(1);
    EXPECT_EQ(table.GetModifyFields() + table.GetModifyIndexes() + table.GetModifyForeignKeys(), 0);
    table.SetOverwriteTable(0);
    table.CopyIndexes = table.CopyForeignKeys = table.CopyStructure = 0;
    table.SetModifyFields(1);
    table.SetModifyIndexes(1);
    table.SetModifyForeignKeys(1);
    EXPECT_EQ(table.GetModifyFields() + table.GetModifyIndexes() + table.GetModifyForeignKeys(), 0);
    table.ModifyFields = 1;
    table.SetModifyFields(0);
    EXPECT_EQ(table.ModifyFields, 0) << "switching off is never refused";
}

TEST_F(TableOptions, SelectingMovesStructureAndData) {
    table.SetSelected(0);
    EXPECT_EQ(table.Selected, 0);
    EXPECT_EQ(table.CopyStructure, 0);
    EXPECT_EQ(table.CopyData, 0);
    EXPECT_EQ(selectedFields(), 0);
    EXPECT_EQ(database.Selected, 0);
    table.SetSelected(1);
    EXPECT_EQ(table.Selected, 1);
    EXPECT_EQ(table.CopyStructure, 1);
    EXPECT_EQ(table.CopyData, 1);
    EXPECT_EQ(selectedFields(), 2);
    EXPECT_EQ(database.Selected, 1);
    EXPECT_EQ(table.UpdateDepth, 0);
}

TEST_F(TableOptions, SelectingWorksWithoutADatabase) {
    Table lonely(u"t", {u"a"});
    lonely.SetSelected(0);
    lonely.SetSelected(1);
    lonely.SetOverwriteTable(1);
    lonely.SetOverwriteTable(0);
    EXPECT_EQ(lonely.Selected, 1);
}

TEST_F(TableOptions, ChangedChildSwitchesTheTableOnAndOff) {
    table.CopyStructure = table.CopyData = 0;
    for (CZRFieldInfo* field : table.Fields) field->Selected = 0;
    index->Selected = key->Selected = 0;
    table.ModifyIndexes = table.ModifyForeignKeys = 1;
    table.field(u"a")->SetSelected(1);
    EXPECT_EQ(table.Selected, 1);
    EXPECT_EQ(table.CopyStructure, 1);
    EXPECT_EQ(table.CopyData, 1);
    EXPECT_EQ(table.CopyIndexes, 0);
    EXPECT_EQ(table.CopyForeignKeys, 0);
    EXPECT_EQ(table.ModifyIndexes, 0);
    EXPECT_EQ(table.ModifyForeignKeys, 0);
    table.ModifyFields = 1;
    table.field(u"a")->SetSelected(0);
    EXPECT_EQ(table.Selected, 0);
    EXPECT_EQ(table.CopyStructure, 0);
    EXPECT_EQ(table.CopyData, 0);
    EXPECT_EQ(table.ModifyFields, 0);
    EXPECT_EQ(database.Selected, 0);
}

TEST_F(TableOptions, TableWithoutSelectedColumnsCopiesNoData) {
    for (CZRFieldInfo* field : table.Fields) field->Selected = 0;
    table.RecalcFromChildren();
    EXPECT_EQ(table.Selected, 1) << "index and key are selected";
    EXPECT_EQ(table.CopyStructure, 1);
    EXPECT_EQ(table.CopyData, 0);
    EXPECT_EQ(table.CopyIndexes, 1);
}

TEST_F(TableOptions, ChildrenDoNotAnswerBackWhileASetterIsAtWork) {
    table.CopyData = 0;
    table.SetCopyStructure(0);
    EXPECT_EQ(table.CopyData, 0);
    EXPECT_EQ(table.CopyStructure, 0) << "the columns, deselected one by one, did not feed back";
    table.UpdateDepth = 1;
    table.field(u"a")->SetSelected(1);
    EXPECT_EQ(table.Selected, 0);
}

}  // namespace
