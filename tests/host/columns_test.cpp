#include <gtest/gtest.h>

#include "host/kinds.h"
#include "tests/host/projects.h"

namespace zr::host::test {
namespace {

class HostColumns : public testing::Test {
 protected:
    Table& table(const char16_t* name) { return *static_cast<Table*>(database->FindTableBySrcName(name)); }
    std::unique_ptr<Database> database = smallProject();
};

TEST_F(HostColumns, TypeDefinitionIsTheMappedTypeWithItsSize) {
    Field field;
    field.SetType(u"number");
    EXPECT_EQ(field.GetTypeDefinition(), u"number");
    field.Length = 10;
    EXPECT_EQ(field.GetTypeDefinition(), u"number(10)");
    field.Scale = 2;
    EXPECT_EQ(field.GetTypeDefinition(), u"number(10, 2)");
    field.SetTypeMapped(u"int");
    EXPECT_EQ(field.GetTypeDefinition(), u"int");
    field.LengthMapped = 4;
    EXPECT_EQ(field.GetTypeDefinition(), u"int(4)");
    field.Collation = u"binary";
    field.BuildTypeMappedString();
    EXPECT_EQ(field.GetTypeMappedString(), u"int(4), COLLATE binary");
}

TEST_F(HostColumns, ChangedSelectionReachesTheTable) {
    Table& orders = table(u"orders");
    for (CZRFieldInfo* field : orders.Fields) field->SetSelected(0);
    EXPECT_EQ(orders.CopyData, 0);
    EXPECT_EQ(orders.Selected, 1) << "its index is still selected";
    orders.Indexes.GetHead()->SetSelected(0);
    orders.ForeignKeys.GetHead()->SetSelected(0);
    EXPECT_EQ(orders.Selected, 0);
    orders.ForeignKeys.GetHead()->SetSelected(1);
    EXPECT_EQ(orders.Selected, 1);
    EXPECT_EQ(orders.CopyForeignKeys, 1);
    EXPECT_EQ(orders.CopyIndexes, 0);
}

TEST_F(HostColumns, UnchangedSelectionDoesNot) {
    Table& orders = table(u"orders");
    orders.CopyIndexes = 0;
    orders.Fields.GetHead()->SetSelected(1);
    EXPECT_EQ(orders.CopyIndexes, 0) << "nothing was calculated anew";
}

TEST_F(HostColumns, KeysAreFoundByTheirColumns) {
    Table& orders = table(u"orders");
    EXPECT_EQ(table(u"customers").GetBestKey()->GetSrcName(), u"pk_customers");
    EXPECT_EQ(orders.GetPrimaryKey(), nullptr);
    EXPECT_EQ(orders.GetUniqueIndex()->GetSrcName(), u"ux_orders");
    CMapStringToPtr columns;
    orders.CollectKeyColumns(columns);
    EXPECT_EQ(columns.GetCount(), 2) << "excluded columns where there are no others";
}

TEST_F(HostColumns, PrimaryKeyIsUniqueToo) {
    Index index;
    EXPECT_EQ(index.IsUnique(), 0);
    index.PrimaryKey = 1;
    EXPECT_EQ(index.IsUnique(), 1);
}

TEST_F(HostColumns, ReferencesAreResolvedThroughTheDatabase) {
    const CZRForeignKeyInfo& key = *table(u"orders").ForeignKeys.GetHead();
    EXPECT_EQ(key.GetReferencedTableID(), table(u"customers").GetID());
    EXPECT_EQ(key.Resolved, 1);
    EXPECT_EQ(table(u"orders").Indexes.GetHead()->Resolved, 1);
    table(u"orders").SetProcessed(0);
    EXPECT_EQ(table(u"customers").AreReferencingTablesProcessed(), 0);
    EXPECT_EQ(table(u"orders").AreReferencedTablesProcessed(), 0);
    table(u"customers").SetProcessed(1);
    EXPECT_EQ(table(u"orders").AreReferencedTablesProcessed(), 1);
}

TEST_F(HostColumns, ReferencesThatAreNotThereStayOpen) {
    auto key = std::make_unique<ForeignKey>();
    key->ResolveReferences();
    EXPECT_EQ(key->Resolved, 0);
    key->ReferencedTable = u"nowhere";
    ForeignKey& open = table(u"customers").addForeignKey(std::move(key));
    open.ResolveReferences();
    EXPECT_TRUE(open.GetReferencedTableID().IsEmpty());
    open.ReferencedTable = u"orders";
    open.Columns.AddTail({u"id", u"nothing"});
    open.ResolveReferences();
    EXPECT_EQ(open.GetReferencedTableID(), table(u"orders").GetID());
    EXPECT_EQ(open.Resolved, 0) << "a column is missing";
    Index& index = table(u"customers").addIndex(std::make_unique<Index>());
    index.addColumn(u"nothing");
    index.ResolveReferences();
    EXPECT_EQ(index.Resolved, 0);
}

TEST_F(HostColumns, ClonesHaveColumnsOfTheirOwn) {
    const std::unique_ptr<Database> clone(database->Clone());
    auto* copy = static_cast<Table*>(clone->FindTableBySrcName(u"orders"));
    EXPECT_NE(copy->Indexes.GetHead()->Columns.GetHead(),
              table(u"orders").Indexes.GetHead()->Columns.GetHead());
    EXPECT_EQ(copy->Indexes.GetHead()->ColumnCount, 2);
    EXPECT_EQ(static_cast<Field*>(copy->Fields.GetHead())->GetOwner(), copy);
    EXPECT_EQ(copy->ForeignKeys.GetHead()->GetReferencedTableID(), table(u"customers").GetID())
        << "a clone keeps all IDs";
    EXPECT_EQ(clone->Queries.GetHead()->GetSQL(), database->Queries.GetHead()->GetSQL());
}

class HostKinds : public testing::TestWithParam<DBTypes> {};

TEST_P(HostKinds, AreMadeByTheFactory) {
    const DBTypes kind = GetParam();
    Factory factory;
    const std::unique_ptr<CZRTableInfo> table(factory.CreateTable(kind));
    EXPECT_EQ(table->GetDBType(), kind);
    const std::unique_ptr<CZRQueryInfo> query(factory.CreateQuery(kind));
    EXPECT_EQ(query->GetDBType(), kind);
    const std::unique_ptr<CZRFieldInfo> field(factory.CreateField(kind));
    const std::unique_ptr<CZRIndexInfo> index(factory.CreateIndex(kind));
    const std::unique_ptr<CZRForeignKeyInfo> key(factory.CreateForeignKey(kind));
    EXPECT_TRUE(field && index && key);
    CZRFilterInfo* filter = factory.CreateFilter(kind);
    EXPECT_EQ(filter->GetDBType(), kind);
    filter->Items.AddTail(factory.CreateFilterItem(kind));
    CZRFilterInfo::destroy(filter);
}

INSTANTIATE_TEST_SUITE_P(Known, HostKinds,
                         testing::Values(DB_NONE, DB_MYSQL, DB_MSACCESS, DB_POSTGRESQL, DB_MSSQL, DB_ORACLE,
                                         DB_MSSQL_20));

TEST(HostKind, ThatIsUnknownIsRefusedByTheFactory) {
    Factory factory;
    for (const int number : {-1, 3, 9, 21, 77}) {
        const auto kind = static_cast<DBTypes>(number);
        EXPECT_FALSE(isKnownKind(kind));
        EXPECT_THROW(factory.CreateTable(kind), UnknownKind);
        EXPECT_THROW(factory.CreateQuery(kind), UnknownKind);
        EXPECT_THROW(factory.CreateField(kind), UnknownKind);
        EXPECT_THROW(factory.CreateIndex(kind), UnknownKind);
        EXPECT_THROW(factory.CreateForeignKey(kind), UnknownKind);
        EXPECT_THROW(factory.CreateFilter(kind), UnknownKind);
        EXPECT_THROW(factory.CreateFilterItem(kind), UnknownKind);
    }
}

CString textOf(DBTypes kind, const char16_t* column, int condition, const char16_t* value, int type) {
    FilterItem item(kind);
    item.FieldID = column;
    item.Condition = condition;
    item.Value.SetWide(value, type);
    return item.GetConditionText();
}

TEST(HostFilter, QuotesNamesAsTheKindDoes) {
    EXPECT_EQ(textOf(DB_MYSQL, u"a`b", FC_EQUAL, u"1", FV_INTEGER), u"`a``b` = 1");
    EXPECT_EQ(textOf(DB_MSACCESS, u"a", FC_LESS, u"1", FV_DECIMAL), u"[a] < 1");
    EXPECT_EQ(textOf(DB_MSSQL, u"a]b", FC_GREATER_OR_EQUAL, u"1.5", FV_FLOATING), u"[a]]b] >= 1.5");
    EXPECT_EQ(textOf(DB_POSTGRESQL, u"a", FC_LIKE, u"x%", FV_TEXT), u"\"a\" LIKE 'x%'");
    EXPECT_EQ(textOf(DB_ORACLE, u"a", FC_NOT_EQUAL, u"O'Hara", FV_LONG_TEXT), u"\"a\" <> 'O''Hara'");
    EXPECT_EQ(textOf(DB_MSSQL, u"a", 99, u"1", FV_INTEGER), u"");
}

TEST(HostFilter, ComparesNullByItsOwnWords) {
    EXPECT_EQ(textOf(DB_MSSQL, u"a", FC_EQUAL, nullptr, FV_TEXT), u"[a] IS NULL");
    EXPECT_EQ(textOf(DB_MSSQL, u"a", FC_NOT_EQUAL, nullptr, FV_TEXT), u"[a] IS NOT NULL");
}

TEST(HostFilter, JoinsConditionsAsEachSays) {
    Filter filter(DB_MSSQL);
    for (const int join : {FJ_OR, FJ_AND, FJ_OR}) {
        auto* item = new FilterItem(DB_MSSQL);
        item->FieldID = u"a";
        item->ConditionAdd = join;
        item->Value.SetInt32(1, FV_INTEGER);
        filter.Items.AddTail(item);
    }
    EXPECT_EQ(filter.GetFilterText(), u"[a] = 1 OR [a] = 1 AND [a] = 1");
    filter.SQLQuery = u"b = 2";
    filter.UseSQLQuery = 1;
    EXPECT_EQ(filter.GetFilterText(), u"b = 2");
}

TEST(HostFilter, ValueOfTypeZeroIsStoredAndLoadsAsNull) {
    const Folder folder;
    const auto project = smallProject();
    project->FindTableBySrcName(u"orders")->Filter->Items.GetHead()->Value.ValueType = 0;
    saveProject(*project, folder.path("p.json"), StorageForm::Json);
    const auto loaded = loadProject(folder.path("p.json"));
    CZRFilterValue& value = loaded->FindTableBySrcName(u"orders")->Filter->Items.GetHead()->Value;
    EXPECT_TRUE(value.IsNull());
    EXPECT_EQ(value.ValueType, -1);
}

}  // namespace
}  // namespace zr::host::test
