#include "host/catalog.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "tests/host/projects.h"

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

TEST(CatalogFile, MayBeAListOrAProjectOfEitherForm) {
    const test::Folder folder;
    test::writeBytes(folder.path("list"), R"([{"table": "orders", "columns": ["id"]}])");
    saveProject(*test::smallProject(), folder.path("json"), StorageForm::Json);
    saveProject(*test::smallProject(), folder.path("sqlite"), StorageForm::Sqlite);
    for (const char* name : {"list", "json", "sqlite"}) {
        const auto catalog = openCatalog(folder.path(name));
        CZRTableInfo* table = catalog->FindTableBySrcName(u"orders");
        ASSERT_NE(table, nullptr) << name;
        EXPECT_EQ(table->GetID(), u"{orders}") << name;
        EXPECT_EQ(table->FindFieldBySrcName(u"id")->GetID(), u"{orders.id}") << name;
    }
    const auto catalog = openCatalog(folder.path("sqlite"));
    EXPECT_EQ(catalog->FindQueryBySrcName(u"all_orders")->GetID(), u"{all_orders}");
    EXPECT_EQ(catalog->FindTableBySrcName(u"orders")->ForeignKeys.GetHead()->GetReferencedTableID(),
              u"{customers}");
}

TEST(CatalogFile, ThatIsBrokenIsNamed) {
    const test::Folder folder;
    const auto complaint = [&](const std::string& bytes) -> std::string {
        test::writeBytes(folder.path("c"), bytes);
        try {
            openCatalog(folder.path("c"));
        } catch (const CatalogError& error) {
            return error.what();
        }
        return {};
    };
    for (const char* bytes : {"", "[", "[{}]", "{", "{}", "{\"Format\": 5}", "7"})
        EXPECT_THAT(complaint(bytes), testing::StartsWith(folder.path("c") + ": ")) << bytes;
    EXPECT_THROW(openCatalog(folder.path("none")), CatalogError);
    EXPECT_THROW(openCatalog(folder.path("")), CatalogError);
}

TEST(Catalog, NestedTenThousandDeepIsRefused) {
    const std::string deep = std::string(10000, '[') + std::string(10000, ']');
    EXPECT_THROW(readCatalog(deep), CatalogError);
    EXPECT_THROW(readCatalog(deep.substr(0, 10000)), CatalogError);
}

}  // namespace
}  // namespace zr::host
