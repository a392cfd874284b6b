#include <gtest/gtest.h>

#include <memory>

#include "tests/model/small_host.h"
#include "tests/platform/print_string.h"

// A leak checker over these tests tells whether everything that is retired is freed in the end.
namespace {

using zr::test::functionItem;
using zr::test::Query;
using zr::test::valueItem;

TEST(RetiredObjects, EmptiedListStaysAliveAsLongAsItsQuery) {
    CZRQueryInfo query;
    SelectItem* item = functionItem(u"f", {valueItem(u"x")});
    query.m_selectItems.AddTail(item);
    query.RetireItems(query.m_selectItems);
    EXPECT_TRUE(query.m_selectItems.IsEmpty());
    EXPECT_EQ(item->GetExpressionText(), u"f(x)");
    query.RetireItems(query.m_selectItems);
    query.RetireItem(nullptr);
}

TEST(RetiredObjects, ReplacedMapEntriesStayAlive) {
    CZRQueryInfo query;
    auto* first = new CFieldObject;
    first->m_field = u"first";
    query.ReplaceFieldObject(u"k", first);
    query.ReplaceFieldObject(u"k", first);
    query.ReplaceFieldObject(u"k", new CFieldObject);
    EXPECT_EQ(first->m_field, u"first");
    auto* alias = new CZRAliasInfo;
    alias->Expression = functionItem(u"f");
    query.ReplaceAlias(u"a", alias);
    query.ReplaceAlias(u"a", new CZRAliasInfo);
    EXPECT_EQ(alias->Expression->m_name, u"f");
}

TEST(RetiredObjects, EverythingRetiredIsFreedWithTheQuery) {
    auto query = std::make_unique<CZRQueryInfo>();
    query->RetireItem(new SelectItemSubQuery);
    query->RetireFieldObject(new CFieldObject);
    query->RetireAlias(new CZRAliasInfo);
    auto* nested = new CZRQueryInfo;
    nested->RetireItem(valueItem(u"x"));
    query->RetireQuery(nested);
    query->RetireFieldObject(nullptr);
    query->RetireAlias(nullptr);
    query->RetireQuery(nullptr);
    query.reset();
}

TEST(RetiredObjects, RecordsOfUnionsOutliveTheQueryForWhoHoldsOn) {
    auto query = std::make_unique<CZRQueryInfo>();
    auto* record = new CZRQueryUnionInfo;
    record->Query = new Query(u"branch");
    query->m_unions.AddTail(record);
    SelectItem* item = valueItem(u"retired");
    query->RetireItem(item);
    std::shared_ptr<zr::RetiredObjects> held = query->HoldRetired();
    query.reset();
    EXPECT_EQ(record->Query->Name, u"branch");
    EXPECT_EQ(item->m_text, u"retired");
    held.reset();
}

TEST(RetiredObjects, NestedQueryLeavesItsRetiredObjectsToWhoHoldsOn) {
    auto query = std::make_unique<CZRQueryInfo>();
    auto* nested = new CZRQueryInfo;
    query->m_subQueries.AddTail(nested);
    SelectItem* item = valueItem(u"x");
    nested->RetireItem(item);
    std::shared_ptr<zr::RetiredObjects> held = nested->HoldRetired();
    query.reset();
    EXPECT_EQ(item->m_text, u"x");
}

TEST(RetiredObjects, AreNotCopied) {
    CZRQueryInfo query;
    query.RetireItem(valueItem(u"x"));
    const std::unique_ptr<CZRQueryInfo> clone(query.Clone());
    EXPECT_TRUE(clone->m_selectItems.IsEmpty());
}

}  // namespace
