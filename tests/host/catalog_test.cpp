#include "host/catalog.h"

#include <gtest/gtest.h>

namespace zr::host {
namespace {

TEST(Catalog, KnowsTablesAndColumnsWithoutRegardToCase) {
    const auto database = readCatalog(R"([{"table": "Orders", "columns": ["Id", "größe"]}, {"table": "t"}])");
    ASSERT_EQ(database->Tables.GetCount(), 2);
    CZRTableInfo* orders = database->FindTableBySrcName(u"orders");
    ASSERT_NE(orders, nullptr);
    EXPECT_EQ(orders->GetName(), u"Orders");
    EXPECT_EQ(orders->GetDatabase(), database.get());
    EXPECT_NE(orders->FindFieldBySrcName(u"ID"), nullptr);
    EXPECT_NE(orders->FindFieldBySrcName(u"GRÖßE"), nullptr);
    EXPECT_EQ(orders->FindFieldBySrcName(u"other"), nullptr);
    EXPECT_TRUE(database->FindTableBySrcName(u"T")->Fields.IsEmpty());
}

TEST(Catalog, GivesTheIdToldOrElseTheNameInBraces) {
    const auto database = readCatalog(R"([{"table": "a", "columns": ["x"]}, {"table": "b", "id": "{1-2}"}])");
    EXPECT_EQ(database->FindTableBySrcName(u"a")->GetID(), u"{a}");
    EXPECT_EQ(database->FindTableBySrcName(u"a")->FindFieldBySrcName(u"x")->GetID(), u"{a.x}");
    EXPECT_EQ(database->FindTableBySrcName(u"b")->GetID(), u"{1-2}");
}

TEST(Catalog, ClonesKeepIdsAndBelongToThemselves) {
    const auto database = readCatalog(R"([{"table": "a", "columns": ["x"]}])");
    const std::unique_ptr<Database> clone(database->Clone());
    CZRTableInfo* table = clone->FindTableBySrcName(u"a");
    ASSERT_NE(table, nullptr);
    EXPECT_NE(table, database->FindTableBySrcName(u"a"));
    EXPECT_EQ(table->GetID(), u"{a}");
    EXPECT_EQ(table->GetDatabase(), clone.get());
    auto* field = dynamic_cast<Field*>(table->FindFieldBySrcName(u"x"));
    ASSERT_NE(field, nullptr);
    EXPECT_EQ(field->GetOwner(), table);
}

TEST(Catalog, OfNoTablesIsEmpty) {
    EXPECT_TRUE(readCatalog("[]")->Tables.IsEmpty());
}

class BrokenCatalog : public testing::TestWithParam<const char*> {};

TEST_P(BrokenCatalog, IsRefused) {
    EXPECT_THROW(readCatalog(GetParam()), CatalogError);
}

INSTANTIATE_TEST_SUITE_P(Texts, BrokenCatalog,
                         testing::Values("", "[", "{}", "7", "[7]", "[{}]", R"([{"table": 7}])",
                                         R"([{"table": "t", "columns": "a"}])",
                                         R"([{"table": "t", "columns": [1]}])",
                                         R"([{"table": "t", "id": 1}])"));

TEST(Catalog, ARefusalTellsWhichTable) {
    try {
        readCatalog(R"([{"table": "a"}, {"columns": []}])");
        FAIL();
    } catch (const CatalogError& problem) {
        EXPECT_STREQ(problem.what(), "table 2 of the catalogue: \"table\" has to be a text");
    }
}

}  // namespace
}  // namespace zr::host
