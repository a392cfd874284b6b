#include "zrparsersql/filter_info.h"

#include <gtest/gtest.h>

#include "tests/model/small_host.h"
#include "tests/platform/print_string.h"

namespace {

using zr::test::Filter;
using zr::test::FilterItem;

TEST(FilterItemInfo, HasItsDefaults) {
    const FilterItem item;
    EXPECT_TRUE(item.FieldID.IsEmpty());
    EXPECT_EQ(item.Condition, 0);
    EXPECT_EQ(item.ConditionAdd, 0);
    EXPECT_EQ(item.ItemMark, 0);
    EXPECT_TRUE(item.Value.IsNull());
}

TEST(FilterItemInfo, SetAllCopiesTheValue) {
    CZRFilterValue value;
    value.SetText("\x80", 9, 4);
    value.SetBlob("\1", 1);
    FilterItem item;
    item.SetAll(u"field", 2, value, 3);
    EXPECT_EQ(item.GetFieldID(), u"field");
    EXPECT_EQ(item.GetCondition(), 2);
    EXPECT_EQ(item.GetConditionAdd(), 3);
    EXPECT_TRUE(item.GetValue().Equals(value));
    EXPECT_EQ(item.GetValue().Encoding, 9);
    EXPECT_NE(item.GetValue().Data, value.Data);
}

TEST(FilterItemInfo, AccessorsReadAndWriteTheirMembers) {
    FilterItem item;
    item.SetFieldID(u"f");
    item.SetCondition(1);
    item.SetConditionAdd(2);
    item.SetItemMark(std::int64_t{1} << 40);
    CZRFilterValue value;
    value.SetInt32(5, 2);
    item.SetValue(value);
    EXPECT_EQ(item.GetFieldID(), u"f");
    EXPECT_EQ(item.GetCondition(), 1);
    EXPECT_EQ(item.GetConditionAdd(), 2);
    EXPECT_EQ(item.GetItemMark(), std::int64_t{1} << 40);
    EXPECT_TRUE(item.GetValue().Equals(value));
}

TEST(FilterInfo, CopyClonesEachItem) {
    Filter filter;
    filter.SetSQLQuery(u"x");
    filter.SetUseSQLQuery(1);
    auto* item = new FilterItem(u"a", u"1");
    item->ItemMark = 9;
    filter.GetItems().AddTail(item);
    filter.GetItems().AddTail(nullptr);
    Filter* copy = filter.Clone();
    EXPECT_EQ(copy->GetSQLQuery(), u"x");
    EXPECT_EQ(copy->GetUseSQLQuery(), 1);
    ASSERT_EQ(copy->Items.GetCount(), 1);
    EXPECT_NE(copy->Items.GetHead(), item);
    EXPECT_EQ(copy->Items.GetHead()->FieldID, u"a");
    EXPECT_EQ(copy->Items.GetHead()->ItemMark, 9);
    CZRFilterInfo::destroy(copy);
    CZRFilterInfo::destroy(nullptr);
    CZRFilterItemInfo::destroy(nullptr);
}

}  // namespace
