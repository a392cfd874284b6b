#include <gtest/gtest.h>

#include "tests/model/small_host.h"

namespace {

using zr::test::Index;
using zr::test::Table;

Index* uniqueIndex(Table& table, const CString& name, std::initializer_list<const char16_t*> columns) {
    Index* index = table.addIndex(new Index(name, columns));
    index->unique = 1;
    return index;
}

Index* primaryKey(Table& table, std::initializer_list<const char16_t*> columns) {
    Index* index = table.addIndex(new Index(u"pk", columns));
    index->primaryKey = 1;
    return index;
}

TEST(TableKeys, PrimaryKeyIsTheFirstIndexThatIsOne) {
    Table table(u"t");
    EXPECT_EQ(table.GetPrimaryKey(), nullptr);
    table.Indexes.AddTail(nullptr);
    table.addIndex(new Index(u"plain"));
    Index* first = primaryKey(table, {});
    primaryKey(table, {});
    EXPECT_EQ(table.GetPrimaryKey(), first);
}

TEST(TableKeys, UniqueIndexIsRememberedUntilMarkedDirty) {
    Table table(u"t");
    EXPECT_EQ(table.GetUniqueIndex(), nullptr);
    Index* index = uniqueIndex(table, u"u", {u"a"});
    EXPECT_EQ(table.GetUniqueIndex(), nullptr) << "remembered";
    table.UniqueIndexDirty = 1;
    EXPECT_EQ(table.GetUniqueIndex(), index);
    EXPECT_EQ(table.UniqueIndexDirty, 0);
}

TEST(TableKeys, BestKeyIsThePrimaryKey) {
    Table table(u"t");
    uniqueIndex(table, u"u", {u"a"});
    Index* key = primaryKey(table, {u"a", u"b", u"c"});
    EXPECT_EQ(table.GetBestKey(), key);
}

TEST(TableKeys, BestKeyIsTheFirstOfTheShortestUniqueIndexes) {
    Table table(u"t");
    EXPECT_EQ(table.GetBestKey(), nullptr);
    table.addIndex(new Index(u"plain", {u"a"}));
    uniqueIndex(table, u"three", {u"a", u"b", u"c"});
    Index* two = uniqueIndex(table, u"two", {u"a", u"b"});
    uniqueIndex(table, u"other two", {u"b", u"c"});
    EXPECT_EQ(table.GetBestKey(), two);
    Index* one = uniqueIndex(table, u"one", {u"a"});
    EXPECT_EQ(table.GetBestKey(), one);
    uniqueIndex(table, u"none", {});
    EXPECT_EQ(table.GetBestKey(), one) << "one column ends the search";
}

class KeyForSelection : public testing::Test {
 protected:
    KeyForSelection() : table(u"t", {u"a", u"b", u"c"}) {}
    std::vector<CString> collected() {
        CMapStringToPtr columns;
        table.CollectKeyColumns(columns);
        std::vector<CString> names;
        for (const auto& entry : columns) {
            EXPECT_EQ(entry.value, nullptr);
            names.push_back(entry.key);
        }
        return names;
    }
    using Names = std::vector<CString>;

    Table table;
};

TEST_F(KeyForSelection, IsNoneWithoutKeys) {
    EXPECT_EQ(table.FindKeyForSelection(), nullptr);
    EXPECT_TRUE(collected().empty());
}

TEST_F(KeyForSelection, IsThePrimaryKeyWhenOneOfItsColumnsIsSelected) {
    uniqueIndex(table, u"u", {u"c"});
    Index* key = primaryKey(table, {u"a", u"b"});
    table.field(u"a")->Selected = 0;
    table.field(u"b")->excludedFromKey = 1;
    EXPECT_EQ(table.FindKeyForSelection(), key) << "exclusion does not matter to the primary key";
    EXPECT_EQ(collected(), Names{u"b"});
}

TEST_F(KeyForSelection, IsAUniqueIndexWhenThePrimaryKeyIsNotSelected) {
    primaryKey(table, {u"a", u"unknown"});
    table.field(u"a")->Selected = 0;
    Index* index = uniqueIndex(table, u"u", {u"a", u"b", u"c"});
    EXPECT_EQ(table.FindKeyForSelection(), index);
    EXPECT_EQ(collected(), (Names{u"b", u"c"}));
}

TEST_F(KeyForSelection, PrefersAUniqueIndexWithAColumnThatIsNotExcluded) {
    table.field(u"a")->excludedFromKey = 1;
    Index* excluded = uniqueIndex(table, u"first", {u"a"});
    EXPECT_EQ(table.FindKeyForSelection(), excluded);
    EXPECT_EQ(collected(), Names{u"a"});
    Index* usable = uniqueIndex(table, u"second", {u"a", u"b"});
    uniqueIndex(table, u"third", {u"c"});
    EXPECT_EQ(table.FindKeyForSelection(), usable);
    EXPECT_EQ(collected(), Names{u"b"}) << "the first such index alone, and its usable columns alone";
}

TEST_F(KeyForSelection, IsNoneWhenNoColumnIsSelected) {
    primaryKey(table, {u"a"});
    uniqueIndex(table, u"u", {u"b"});
    for (CZRFieldInfo* field : table.Fields) field->Selected = 0;
    EXPECT_EQ(table.FindKeyForSelection(), nullptr);
    EXPECT_TRUE(collected().empty());
}

}  // namespace
