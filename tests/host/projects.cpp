#include "tests/host/projects.h"

#include <gtest/gtest.h>
#include <sqlite3.h>
#include <unistd.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <random>
#include <sstream>

#include "host/json_form.h"

namespace zr::host::test {

Folder::Folder() : path_(testing::TempDir() + "zr_project_XXXXXX") {
    EXPECT_NE(mkdtemp(path_.data()), nullptr);
}

Folder::~Folder() {
    std::error_code failed;
    std::filesystem::remove_all(path_, failed);
}

std::string Folder::files() const {
    std::vector<std::string> names;
    for (const auto& entry : std::filesystem::directory_iterator(path_))
        names.push_back(entry.path().filename().string());
    std::sort(names.begin(), names.end());
    std::string all;
    for (const std::string& name : names) all += (all.empty() ? "" : ",") + name;
    return all;
}

std::string bytesOf(const std::string& path) {
    std::ifstream file(path, std::ios::binary);
    EXPECT_TRUE(file) << path;
    std::ostringstream bytes;
    bytes << file.rdbuf();
    return bytes.str();
}

void writeBytes(const std::string& path, const std::string& bytes) {
    std::ofstream file(path, std::ios::binary | std::ios::trunc);
    file << bytes;
    EXPECT_TRUE(file) << path;
}

namespace {

template <class Object>
std::unique_ptr<Object> named(std::unique_ptr<Object> object, const CString& name) {
    setNames(*object, name);
    return object;
}

}  // namespace

std::unique_ptr<Database> smallProject() {
    auto database = std::make_unique<Database>(DB_MSSQL);
    database->SchemaName = u"größe";
    database->MaxThreads = 4;

    auto customers = named(std::make_unique<Table>(DB_MSSQL), u"customers");
    for (const char16_t* name : {u"id", u"name"}) customers->addField(named(std::make_unique<Field>(), name));
    auto key = named(std::make_unique<Index>(), u"pk_customers");
    key->PrimaryKey = 1;
    key->addColumn(u"id");
    customers->addIndex(std::move(key));
    database->addTable(std::move(customers));

    auto orders = named(std::make_unique<Table>(DB_MSSQL), u"orders");
    for (const char16_t* name : {u"id", u"customer_id"}) {
        auto field = named(std::make_unique<Field>(), name);
        field->SetType(u"decimal");
        field->Length = 10;
        field->Scale = 2;
        field->Collation = u"Latin1";
        field->ExcludedFromKey = 1;
        orders->addField(std::move(field));
    }
    auto index = named(std::make_unique<Index>(), u"ux_orders");
    index->Unique = 1;
    index->addColumn(u"id");
    index->addColumn(u"customer_id");
    orders->addIndex(std::move(index));
    auto reference = named(std::make_unique<ForeignKey>(), u"fk_orders");
    reference->ReferencedTable = u"customers";
    reference->Columns.AddTail({u"customer_id", u"id"});
    orders->addForeignKey(std::move(reference));
    Filter filter(DB_MSSQL);
    filter.SQLQuery = u"id > 1";
    auto* item = new FilterItem(DB_MSSQL);
    item->FieldID = u"customer_id";
    item->Value.SetWide(u"O'Hara", FV_TEXT);
    filter.Items.AddTail(item);
    orders->AttachFilterCopy(&filter);
    database->addTable(std::move(orders));

    auto query = named(std::make_unique<Query>(DB_MSSQL), u"all_orders");
    query->SetSQL(u"SELECT * FROM orders\nWHERE id > 1");
    database->addQuery(std::move(query));
    database->ResolveReferences();
    return database;
}

namespace {

class ProjectMaker {
 public:
    explicit ProjectMaker(unsigned seed) : random_(seed) {}

    std::unique_ptr<Database> make() {
        static constexpr DBTypes kinds[] = {DB_MYSQL, DB_MSACCESS, DB_POSTGRESQL,
                                            DB_MSSQL, DB_ORACLE,   DB_MSSQL_20};
        kind_ = kinds[upTo(5)];
        auto database = std::make_unique<Database>(kind_);
        fill(*database);
        database->SchemaName = text();
        database->GarbageSymbols = text();
        database->GarbageReplace = text();
        database->Version = text();
        database->MaxThreads = static_cast<std::uint8_t>(number());
        database->CaseState = static_cast<std::int16_t>(number());
        database->MaxQuant = number();
        for (int count = upTo(4); count > 0; --count) {
            auto query = std::make_unique<Query>(kind_);
            fill(*query);
            query->m_sql = text();
            database->addQuery(std::move(query));
        }
        for (int count = upTo(4); count > 0; --count) database->addTable(makeTable());
        database->ResolveReferences();
        return database;
    }

 private:
    int upTo(int limit) { return static_cast<int>(random_() % static_cast<unsigned>(limit + 1)); }
    int number() { return static_cast<int>(random_()); }
    CString text() {
        std::u16string units;
        for (int length = upTo(12); length > 0; --length)
            units += static_cast<char16_t>(random_() % 3 ? u'a' + random_() % 26 : random_() % 0x10000);
        return CString(units);
    }
    void fill(CZRObjectInfo& object) {
        CString name;
        name.Format(u"%d %s", ++names_, text());
        object.SrcName = name;
        object.Name = text();
        object.Type = text();
        object.TypeMapped = text();
        object.TypeMappedString = text();
        object.Length = number();
        object.Scale = number();
        object.DataType = number();
        object.State = number();
        object.Correct = upTo(200);
        object.Selected = upTo(1);
        object.LowerCase = static_cast<std::int16_t>(number());
    }
    std::unique_ptr<Table> makeTable() {
        auto table = std::make_unique<Table>(kind_);
        fill(*table);
        table->CopyStructure = upTo(1);
        table->SyncDrop = number();
        for (int count = upTo(5); count > 0; --count) {
            auto field = std::make_unique<Field>();
            fill(*field);
            field->Collation = text();
            field->ExcludedFromKey = upTo(1);
            table->addField(std::move(field));
        }
        for (int count = upTo(3); count > 0; --count) {
            auto index = std::make_unique<Index>();
            fill(*index);
            index->PrimaryKey = upTo(1);
            index->Unique = number();
            for (int columns = upTo(3); columns > 0; --columns) index->addColumn(text());
            table->addIndex(std::move(index));
        }
        for (int count = upTo(3); count > 0; --count) {
            auto key = std::make_unique<ForeignKey>();
            fill(*key);
            key->ReferencedTable = text();
            for (int columns = upTo(3); columns > 0; --columns) key->Columns.AddTail({text(), text()});
            table->addForeignKey(std::move(key));
        }
        if (upTo(1)) table->Filter = makeFilter(*table);
        return table;
    }
    CZRFilterInfo* makeFilter(const Table& table) {
        auto* filter = new Filter(upTo(1) ? kind_ : DB_NONE);
        filter->SQLQuery = text() + u"x";  // a filter of nothing would not be cloned
        filter->UseSQLQuery = number();
        if (table.Fields.IsEmpty()) return filter;
        for (int count = upTo(3); count > 0; --count) {
            auto* item = new FilterItem(kind_);
            item->FieldID = table.Fields.GetHead()->SrcName;
            item->Condition = number();
            item->ConditionAdd = number();
            item->Value.SetWide(text().GetString(), 1 + upTo(9));
            if (upTo(3) == 0) item->Value.SetNull(4);
            filter->Items.AddTail(item);
        }
        return filter;
    }

    std::mt19937 random_;
    DBTypes kind_ = DB_NONE;
    int names_ = 0;
};

}  // namespace

std::unique_ptr<Database> randomProject(unsigned seed) {
    return ProjectMaker(seed).make();
}

std::string stored(Database& database) {
    StoredTree tree;
    TreeStorage storage(tree, TreeStorage::Use::Save);
    database.Save(storage);
    std::string json;
    appendJson(json, tree.root);
    return json;
}

void runSql(const std::string& path, const std::string& statements) {
    sqlite3* handle = nullptr;
    ASSERT_EQ(sqlite3_open(path.c_str(), &handle), SQLITE_OK);
    char* error = nullptr;
    EXPECT_EQ(sqlite3_exec(handle, statements.c_str(), nullptr, nullptr, &error), SQLITE_OK) << error;
    sqlite3_free(error);
    sqlite3_close(handle);
}

std::string complaintOf(const std::string& path) {
    try {
        loadProject(path);
    } catch (const ProjectError& error) {
        return error.what();
    }
    ADD_FAILURE() << "the project was taken for a whole one";
    return {};
}

}  // namespace zr::host::test
