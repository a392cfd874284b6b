#include "host/catalog_reader.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sqlite3.h>

#include <filesystem>
#include <fstream>

#include "host/dump_reader.h"

namespace zr::host {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;

class CatalogReading : public testing::Test {
 protected:
    CatalogReading() : folder_(testing::TempDir() + "catalog_reader_XXXXXX") {
        EXPECT_NE(mkdtemp(folder_.data()), nullptr);
    }
    ~CatalogReading() override { std::filesystem::remove_all(folder_); }

    std::string path(const std::string& name) const { return folder_ + "/" + name; }

    std::string sqlite(const char* sql) {
        sqlite3* handle = nullptr;
        EXPECT_EQ(sqlite3_open(path("made.db").c_str(), &handle), SQLITE_OK);
        EXPECT_EQ(sqlite3_exec(handle, sql, nullptr, nullptr, nullptr), SQLITE_OK) << sqlite3_errmsg(handle);
        sqlite3_close(handle);
        return path("made.db");
    }

    void dump(const std::string& bytes) { DumpReader("dump", bytes).read(rows); }
    Database& make(DBTypes kind = DB_MSSQL, const CString& schema = {}) {
        database_ = makeDatabase(rows, kind, schema);
        return *database_;
    }

    // "name type length scale" of each column.
    std::vector<std::string> columns(const CString& table) {
        std::vector<std::string> all;
        const CZRTableInfo* found = database_->FindTableBySrcName(table);
        if (!found) return {"no table"};
        for (const CZRFieldInfo* field : found->Fields)
            all.push_back(field->GetSrcName().toUtf8() + " " + field->Type.toUtf8() + " " +
                          std::to_string(field->Length) + " " + std::to_string(field->Scale));
        return all;
    }

    // "name: columns" of each index, and "name: column=table.column" of each foreign key.
    std::vector<std::string> keys(const CString& table) {
        std::vector<std::string> all;
        const CZRTableInfo* found = database_->FindTableBySrcName(table);
        for (const CZRIndexInfo* index : found->Indexes) {
            all.push_back(index->GetSrcName().toUtf8() + (index->IsPrimaryKey() ? " primary:" : " unique:"));
            for (const CZRIndexColumn* column : index->Columns)
                all.back() += " " + column->GetColumnID().toUtf8();
        }
        for (const CZRForeignKeyInfo* each : found->ForeignKeys) {
            const auto* key = dynamic_cast<const ForeignKey*>(each);
            all.push_back(key->GetSrcName().toUtf8() + ":");
            for (const auto& pair : key->Columns)
                all.back() += " " + pair.column.toUtf8() + "=" + key->ReferencedTable.toUtf8() + "." +
                              pair.referenced.toUtf8();
        }
        return all;
    }

    std::string sql(const CString& query) {
        const CZRQueryInfo* found = database_->FindQueryBySrcName(query);
        return found ? found->GetSQL().toUtf8() : "no query";
    }

    CatalogRows rows;

 private:
    std::string folder_;
    std::unique_ptr<Database> database_;
};

TEST_F(CatalogReading, TakesTablesKeysAndViewsOfAnSqliteDatabase) {
    readerFor(
        sqlite("CREATE TABLE customers (id INTEGER PRIMARY KEY, name VARCHAR(50), city, UNIQUE (name, city));"
               "CREATE TABLE orders (a INT, b INT, cust INT REFERENCES customers, price DECIMAL(10, 2),"
               " PRIMARY KEY (b, a));"
               "CREATE INDEX plain ON orders (cust);"
               "CREATE VIEW \"as it is\" (x) AS SELECT name FROM customers;"))
        ->read(rows);
    make();
    EXPECT_THAT(columns(u"customers"), ElementsAre("id INTEGER -1 0", "name VARCHAR 50 0", "city  -1 0"));
    EXPECT_THAT(columns(u"orders"),
                ElementsAre("a INT -1 0", "b INT -1 0", "cust INT -1 0", "price DECIMAL 10 2"));
    EXPECT_THAT(keys(u"customers"),
                ElementsAre("pk_customers primary: id", "sqlite_autoindex_customers_1 unique: name city"));
    EXPECT_THAT(keys(u"orders"), ElementsAre("pk_orders primary: b a", "fk_orders_0: cust=customers.id"));
    EXPECT_EQ(sql(u"as it is"), "SELECT name FROM customers");
    EXPECT_THAT(rows.notes, ElementsAre());
}

TEST_F(CatalogReading, LeavesTheSqliteDatabaseAsItIs) {
    const std::string file = sqlite("CREATE TABLE t (a)");
    const auto before = std::filesystem::last_write_time(file);
    readerFor(file)->read(rows);
    EXPECT_EQ(std::filesystem::last_write_time(file), before);
    EXPECT_FALSE(std::filesystem::exists(file + "-journal"));
}

TEST_F(CatalogReading, LeavesOutTablesWhoseNameIsTaken) {
    using Key = CatalogRows::Key;
    rows.columns = {{u"a", u"users", u"id", u"int"},         {u"a", u"Users", u"mail", u"text"},
                    {u"b", u"USERS", u"x", u"int"},          {u"b", u"USERS", u"y", u"int"},
                    {u"b", u"shown", u"x", u"int"},          {u"b", u"shown", u"y", u"int"},
                    {u"a", u"shown", u"of_the_view", u"int"}};
    rows.keys = {{u"a", u"users", u"users_key", Key::Kind::Primary, u"id", 1, {}, {}},
                 {u"a", u"Users", u"mail_key", Key::Kind::Primary, u"mail", 1, {}, {}}};
    rows.views = {{u"a", u"shown", u"SELECT id FROM users"}};
    make(DB_POSTGRESQL);
    EXPECT_THAT(columns(u"users"), ElementsAre("id int -1 0"));
    EXPECT_THAT(keys(u"users"), ElementsAre("users_key primary: id"));
    EXPECT_THAT(columns(u"shown"), ElementsAre("no table"));
    EXPECT_THAT(rows.notes, ElementsAre("table b.shown: left out; there is a view of that name, in a",
                                        "table a.Users: left out; there is a table users already",
                                        "table b.USERS: left out; there is one of that name already, in a",
                                        "key mail_key: left out; there is no table Users"));
}

TEST_F(CatalogReading, MakesNoQueryOfAViewThatIsOpenYetKnowsItsName) {
    rows.columns = {{u"a", u"users", u"id", u"int"}, {u"b", u"later", u"x", u"int"}};
    rows.views = {{u"a", u"first", u"SELECT id FROM users"},
                  {u"a", u"later", std::nullopt, true},
                  {u"b", u"Later", u"SELECT 1"}};
    make(DB_POSTGRESQL);
    EXPECT_EQ(sql(u"first"), "SELECT id FROM users");
    EXPECT_EQ(sql(u"later"), "no query");
    EXPECT_THAT(columns(u"later"), ElementsAre("no table"));
    EXPECT_THAT(rows.notes, ElementsAre("view b.Later: left out; there is one of that name already",
                                        "table b.later: left out; there is a view of that name, in a"));
}

TEST_F(CatalogReading, TellsWhatWasReadSoFarAndEndsWhenItIsTold) {
    const std::string file =
        sqlite("CREATE TABLE t (a, b); CREATE TABLE u (a); CREATE VIEW v AS SELECT a FROM t");
    std::vector<std::size_t> told;
    zr::host::CatalogReading reading;
    reading.look = [&](const CatalogRows& soFar) { told.push_back(soFar.columns.size()); };
    readerFor(file)->read(rows, reading);
    EXPECT_THAT(told, ElementsAre(0, 2));
    reading.look = [](const CatalogRows&) { throw std::out_of_range("ended"); };
    EXPECT_THROW(readerFor(file)->read(rows, reading), std::out_of_range);
}

TEST_F(CatalogReading, KeepsOfFunctionsOfOneNameTheOneWithTheMostParameters) {
    rows.functions = {{u"a", u"twice", 2}, {u"a", u"twice", 1}, {u"b", u"other", 0}, {u"a", u"none", 0}};
    const Database& made = make(DB_POSTGRESQL, u"a");
    EXPECT_EQ(made.UserFunctions.GetCount(), 2);
    EXPECT_EQ(*made.UserFunctions.Find(u"twice"), u"2");
    EXPECT_EQ(*made.UserFunctions.Find(u"none"), u"0");
}

TEST_F(CatalogReading, TellsWhatIsWrongWithAFile) {
    const auto complaint = [&](const std::string& file) -> std::string {
        try {
            readerFor(file)->read(rows);
        } catch (const CatalogReadError& error) {
            return error.what();
        }
        return "none";
    };
    EXPECT_THAT(complaint(path("missing")), HasSubstr("missing"));
    std::ofstream(path("other")) << "what is this\n";
    EXPECT_THAT(complaint(path("other")), HasSubstr("does not name TABLE_NAME"));
    std::ofstream(path("broken.json")) << "[{]";
    EXPECT_THAT(complaint(path("broken.json")), HasSubstr("broken.json: "));
    std::ofstream(path("quotes.csv")) << "TABLE_NAME,COLUMN_NAME\nt,\"a\n";
    EXPECT_THAT(complaint(path("quotes.csv")), HasSubstr("ends within quotes"));
    std::ofstream(path("cut.db"), std::ios::binary) << std::string("SQLite format 3\0", 16) << "cut";
    EXPECT_THAT(complaint(path("cut.db")), HasSubstr("cut.db: file is not a database"));
}

TEST_F(CatalogReading, TellsThatAnSqliteDatabaseIsLocked) {
    const std::string file = sqlite("CREATE TABLE t (a)");
    sqlite3* handle = nullptr;
    ASSERT_EQ(sqlite3_open(file.c_str(), &handle), SQLITE_OK);
    ASSERT_EQ(sqlite3_exec(handle, "BEGIN EXCLUSIVE", nullptr, nullptr, nullptr), SQLITE_OK);
    try {
        readerFor(file)->read(rows);
        ADD_FAILURE() << "was read";
    } catch (const CatalogReadError& error) {
        EXPECT_THAT(error.what(), HasSubstr("database is locked"));
    }
    sqlite3_close(handle);
}

TEST_F(CatalogReading, TakesTheInformationSchemaOfSqlServer) {
    dump(
        "TABLE_CATALOG,TABLE_SCHEMA,TABLE_NAME,COLUMN_NAME,ORDINAL_POSITION,DATA_TYPE,CHARACTER_MAXIMUM_"
        "LENGTH,"
        "NUMERIC_PRECISION,NUMERIC_SCALE\r\n"
        "shop,dbo,orders,total,2,decimal,NULL,10,2\r\n"
        "shop,dbo,orders,id,1,int,NULL,10,0\r\n"
        "shop,dbo,all_orders,id,1,int,NULL,10,0\r\n"
        "shop,dbo,customers,\"na\"\"me, all\",1,varchar,50,NULL,NULL\r\n");
    dump(
        "[{\"TABLE_SCHEMA\":\"dbo\",\"TABLE_NAME\":\"all_orders\",\"VIEW_DEFINITION\":\"CREATE VIEW "
        "[dbo].[all_orders]\\r\\nWITH SCHEMABINDING\\r\\nAS\\r\\nSELECT id FROM dbo.orders;\"},"
        "{\"TABLE_SCHEMA\":\"dbo\",\"TABLE_NAME\":\"secret\",\"VIEW_DEFINITION\":null}]");
    dump(
        "TABLE_SCHEMA,TABLE_NAME,CONSTRAINT_NAME,CONSTRAINT_TYPE,COLUMN_NAME,ORDINAL_POSITION,"
        "REFERENCED_TABLE_NAME,REFERENCED_COLUMN_NAME\n"
        "dbo,orders,pk,PRIMARY KEY,id,1,,\n"
        "dbo,orders,fk,FOREIGN KEY,total,1,customers,id\n"
        "dbo,orders,ck,CHECK,total,1,,\n");
    make();
    EXPECT_THAT(columns(u"orders"), ElementsAre("id int 10 0", "total decimal 10 2"));
    EXPECT_THAT(columns(u"customers"), ElementsAre("na\"me, all varchar 50 0"));
    EXPECT_THAT(columns(u"all_orders"), ElementsAre("no table"));
    EXPECT_EQ(sql(u"all_orders"), "SELECT id FROM dbo.orders");
    EXPECT_THAT(keys(u"orders"), ElementsAre("pk primary: id", "fk: total=customers.id"));
    EXPECT_THAT(rows.notes, ElementsAre("view secret: left out; the catalogue does not tell its text"));
}

TEST_F(CatalogReading, TakesTheAllViewsOfOracle) {
    dump(
        "{\"columns\":[{\"OWNER\":\"SHOP\",\"TABLE_NAME\":\"ORDERS\",\"COLUMN_NAME\":\"ID\",\"DATA_TYPE\":"
        "\"NUMBER\",\"DATA_LENGTH\":22,\"DATA_PRECISION\":10,\"DATA_SCALE\":2,\"COLUMN_ID\":1},"
        "{\"OWNER\":\"HR\",\"TABLE_NAME\":\"ORDERS\",\"COLUMN_NAME\":\"OTHER\",\"COLUMN_ID\":1}],"
        "\"views\":[{\"OWNER\":\"SHOP\",\"VIEW_NAME\":\"V\",\"TEXT\":\"SELECT ID FROM ORDERS\"}],"
        "\"keys\":[{\"OWNER\":\"SHOP\",\"TABLE_NAME\":\"ORDERS\",\"CONSTRAINT_NAME\":\"PK\","
        "\"CONSTRAINT_TYPE\":\"P\",\"COLUMN_NAME\":\"ID\",\"POSITION\":1}]}");
    make(DB_ORACLE);
    EXPECT_THAT(columns(u"ORDERS"), ElementsAre("ID NUMBER 10 2"));
    EXPECT_THAT(keys(u"ORDERS"), ElementsAre("PK primary: ID"));
    EXPECT_EQ(sql(u"V"), "SELECT ID FROM ORDERS");
    EXPECT_THAT(rows.notes,
                ElementsAre("table HR.ORDERS: left out; there is one of that name already, in SHOP"));
    rows.notes.clear();
    make(DB_ORACLE, u"hr");
    EXPECT_THAT(columns(u"ORDERS"), ElementsAre("OTHER  -1 0"));
    EXPECT_EQ(sql(u"V"), "no query");
    EXPECT_THAT(rows.notes, ElementsAre());
}

TEST_F(CatalogReading, NotesRowsThatItCantTake) {
    dump("TABLE_NAME;COLUMN_NAME\nt;a\nt\n;b\nt;a\n");
    make();
    EXPECT_THAT(columns(u"t"), ElementsAre("a  -1 0"));
    EXPECT_THAT(rows.notes, ElementsAre("dump, line 3: left out; it has 1 cells, and 2 are named",
                                        "dump, line 4: left out; it is no column, key or view",
                                        "column t.a: left out; it is told twice"));
}

TEST(QueryOfView, IsWhatStandsBehindAs) {
    EXPECT_EQ(queryOfView(u"CREATE VIEW v AS SELECT 1 ;\n"), u"SELECT 1");
    EXPECT_EQ(queryOfView(u"create or replace view [x as y] (a, b) /* as */ as -- as\n select a as b from t"),
              u"-- as\n select a as b from t");
    EXPECT_EQ(queryOfView(u" SELECT a AS b FROM t"), u"SELECT a AS b FROM t");
    EXPECT_EQ(queryOfView(u"CREATE VIEW cut /* off"), u"");
    EXPECT_EQ(queryOfView(u""), u"");
}

}  // namespace
}  // namespace zr::host
