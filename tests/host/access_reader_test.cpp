// No free program writes a database of MS Access. What the reader makes of the output of mdbtools is
// therefore tested with stand-ins, put before the programs in PATH, that answer in the forms in which
// mdbtools 1.0 does. The programs themselves run, where they are installed, on files that are no whole
// database.

#include "host/access_reader.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>

#include "host/analysis_order.h"
#include "host/column_tracer.h"

namespace zr::host {
namespace {

using testing::AllOf;
using testing::ElementsAre;
using testing::EndsWith;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::StartsWith;

namespace fs = std::filesystem;

constexpr const char* kSchema =
    "-- ----------------------------------------------------------\n"
    "-- MDB Tools - A library for reading MS Access database files\n"
    "-- ----------------------------------------------------------\n\n"
    "-- That file uses encoding UTF-8\n\n"
    "CREATE TABLE [customers]\n (\n"
    "\t[id]\t\t\tLong Integer, \n"
    "\t[full name]\t\t\tText (50)\n"
    ");\n\n"
    "CREATE TABLE [Bestellungen ä]\n (\n"
    "\t[id]\t\t\tLong Integer, \n"
    "\t[customer]\t\t\tLong Integer, \n"
    "\t[price]\t\t\tNumeric (18, 4), \n"
    "\t[notes]\t\t\tMemo/Hyperlink (255), \n"
    "\t[paid, or not]\t\t\tBoolean\n"
    ");\n\n\n";

constexpr const char* kKeys =
    "CREATE TABLE `customers`\n (\n\t`id`\t\t\tint, \n\t`full name`\t\t\tvarchar (50)\n);\n\n"
    "-- CREATE INDEXES ...\n"
    "ALTER TABLE `customers` ADD UNIQUE INDEX `by_name` (`full name` DESC, `id`);\n"
    "ALTER TABLE `customers` ADD PRIMARY KEY (`id`);\n\n"
    "-- CREATE INDEXES ...\n"
    "ALTER TABLE `Bestellungen ä` ADD PRIMARY KEY (`id`, `customer`);\n"
    "ALTER TABLE `Bestellungen ä` ADD INDEX `price` (`price`);\n\n";

constexpr const char* kRelationships =
    "ccolumn,grbit,icolumn,szColumn,szObject,szReferencedColumn,szReferencedObject,szRelationship\n"
    "1,4352,0,\"customer\",\"Bestellungen ä\",\"id\",\"customers\",\"customersBestellungen\"\n"
    "1,2,0,\"price\",\"Bestellungen ä\",\"id\",\"customers\",\"a \"\"hint\"\"\"\n"
    "1,0,0,\"GroupID\",\"MSysNavPaneGroups\",\"Id\",\"MSysNavPaneGroupCategories\",\"own\"\n";

constexpr const char* kObjects =
    "Connect,Database,DateCreate,DateUpdate,Flags,ForeignName,Id,Name,Owner,ParentId,Type\n"
    ",,\"01/02/20 03:04:05\",\"01/02/20 03:04:05\",0,,4,\"customers\",,251658241,1\n"
    ",,\"01/02/20 03:04:05\",\"01/02/20 03:04:05\",0,,-2147483640,\"named\",,251658241,5\n"
    ",,\"01/02/20 03:04:05\",\"01/02/20 03:04:05\",48,,-2147483639,\"raise\",,251658241,5\n";

constexpr const char* kParts =
    "Attribute,Expression,Flag,LvExtra,Name1,Name2,ObjectId,Order\n"
    "0,,,,,,-2147483640,\n"
    "1,,1,,,,-2147483640,\n"
    "5,,,,\"customers\",\"c\",-2147483640,\n"
    "5,,,,\"Bestellungen ä\",\"b\",-2147483640,\n"
    "1,,4,,\"customers\",,-2147483639,\n"
    "6,\"b.price * IIf(c.[full name] = \"\"x\"\",\n  2, 1)\",0,,\"dear\",,-2147483640,\n"
    "6,\"c.id\",0,,,,-2147483640,\n"
    "7,\"c.id = b.customer\",2,,\"c\",\"b\",-2147483640,\n"
    "255,,,,,,-2147483640,\n";

class AccessReading : public testing::Test {
 protected:
    AccessReading() : folder_(testing::TempDir() + "access_reader_XXXXXX"), oldPath_(getenv("PATH")) {
        EXPECT_NE(mkdtemp(folder_.data()), nullptr);
        file = path("shop.mdb");
        write("shop.mdb", std::string("\0\1\0\0Standard Jet DB\0", 20));
    }
    ~AccessReading() override {
        setenv("PATH", oldPath_.c_str(), 1);
        fs::remove_all(folder_);
    }

    std::string path(const std::string& name) const { return folder_ + "/" + name; }
    void write(const std::string& name, const std::string& bytes) const {
        std::ofstream(path(name), std::ios::binary) << bytes;
    }
    // Lets a program be this script.
    void standIn(const std::string& program, const std::string& script) const {
        write(program, "#!/bin/sh\n" + script);
        fs::permissions(path(program), fs::perms::owner_all);
        setenv("PATH", (folder_ + ":" + oldPath_).c_str(), 1);
    }
    // Lets both programs answer with the file that is called as their last word.
    void standInForAll() const {
        for (const char* program : {"mdb-schema", "mdb-export"})
            standIn(program, "echo \"$(basename $0) $LC_ALL $*\" >>'" + path("calls") +
                                 "'\nfor last; do :; done\nexec cat '" + folder_ + "'/answer_$last\n");
        write("answer_access", kSchema);
        write("answer_mysql", kKeys);
        write("answer_MSysRelationships", kRelationships);
        write("answer_MSysObjects", kObjects);
        write("answer_MSysQueries", kParts);
    }
    Database& make() {
        readerFor(file)->read(rows);
        database_ = makeDatabase(rows, DB_MSACCESS, {});
        return *database_;
    }
    std::string complaint() {
        try {
            readerFor(file)->read(rows);
        } catch (const CatalogReadError& error) {
            return error.what();
        }
        return "none";
    }

    std::string file;
    CatalogRows rows;

 private:
    std::string folder_;
    std::string oldPath_;
    std::unique_ptr<Database> database_;
};

std::vector<std::string> columnsOf(const CZRTableInfo& table) {
    std::vector<std::string> all;
    for (const CZRFieldInfo* field : table.Fields)
        all.push_back(field->GetSrcName().toUtf8() + ": " + field->Type.toUtf8() + " " +
                      std::to_string(field->Length) + " " + std::to_string(field->Scale));
    return all;
}

std::vector<std::string> keysIn(const CatalogRows& rows) {
    std::vector<std::string> all;
    for (const CatalogRows::Key& key : rows.keys)
        all.push_back(key.table.toUtf8() + " " + key.name.toUtf8() + " " + "PUF"[static_cast<int>(key.kind)] +
                      " " + key.column.toUtf8() + " " + std::to_string(key.place) + " " +
                      key.referencedTable.toUtf8() + "." + key.referencedColumn.toUtf8());
    return all;
}

// "name: sources" of each result column.
std::vector<std::string> originsIn(Database& database, const CString& query) {
    ColumnTracer tracer(database);
    std::vector<std::string> all;
    for (const ResultColumn& column : tracer.columnsOf(*database.FindQueryBySrcName(query))) {
        all.push_back(column.name.toUtf8() + ":");
        for (const ColumnOrigin& origin : column.origins)
            all.back() += " " + origin.source.toUtf8() + "." + origin.column.toUtf8();
    }
    return all;
}

TEST_F(AccessReading, TakesTablesWithTheTypesOfAccess) {
    standInForAll();
    const Database& database = make();
    EXPECT_EQ(database.Tables.GetCount(), 2);
    EXPECT_THAT(columnsOf(*database.FindTableBySrcName(u"customers")),
                ElementsAre("id: Long Integer -1 0", "full name: Text 50 0"));
    EXPECT_THAT(columnsOf(*database.FindTableBySrcName(u"Bestellungen ä")),
                ElementsAre("id: Long Integer -1 0", "customer: Long Integer -1 0", "price: Numeric 18 4",
                            "notes: Memo/Hyperlink -1 0", "paid, or not: Boolean -1 0"));
}

TEST_F(AccessReading, TakesKeysAndTheRelationshipsThatAreEnforced) {
    standInForAll();
    make();
    EXPECT_THAT(keysIn(rows),
                ElementsAre("customers by_name U full name 1 .", "customers by_name U id 2 .",
                            "customers pk_customers P id 1 .", "Bestellungen ä pk_Bestellungen ä P id 1 .",
                            "Bestellungen ä pk_Bestellungen ä P customer 2 .",
                            "Bestellungen ä customersBestellungen F customer 0 customers.id"));
}

TEST_F(AccessReading, MakesQueriesOfTheirPartsThatCanBeFollowed) {
    standInForAll();
    Database& database = make();
    const CZRQueryInfo* named = database.FindQueryBySrcName(u"named");
    ASSERT_TRUE(named);
    EXPECT_EQ(
        named->m_sql.toUtf8(),
        "SELECT b.price * IIf(c.[full name] = \"x\",\n  2, 1) AS [dear], c.id\nFROM [customers] AS [c] LEFT "
        "JOIN [Bestellungen ä] AS [b] ON c.id = b.customer");
    EXPECT_THAT(rows.notes, ElementsAre("query raise: left out; it changes data"));

    analyseQueries(database);
    EXPECT_THAT(originsIn(database, u"named"),
                ElementsAre("dear: Bestellungen ä.price customers.full name", "id: customers.id"));
}

TEST_F(AccessReading, RunsTheProgramsWithTheFileAsOneWordAndInUtf8) {
    standInForAll();
    file = path("it's $HOME; a name.mdb");
    fs::copy_file(path("shop.mdb"), file);
    make();
    std::ifstream calls(path("calls"));
    std::string first;
    std::getline(calls, first);
    EXPECT_THAT(first, AllOf(StartsWith("mdb-schema C.UTF-8 --"), EndsWith("-- " + file + " access")));
}

TEST_F(AccessReading, GoesOnWithoutWhatAFileDoesNotTell) {
    standInForAll();
    fs::remove(path("answer_MSysRelationships"));
    fs::remove(path("answer_MSysQueries"));
    EXPECT_EQ(make().Tables.GetCount(), 2);
    EXPECT_THAT(
        rows.notes,
        ElementsAre(AllOf(StartsWith("relationships: left out; " + file + ": mdb-export failed: cat: "),
                          HasSubstr("answer_MSysRelationships")),
                    HasSubstr("answer_MSysQueries")));
}

TEST_F(AccessReading, TellsWhichPackageIsMissing) {
    fs::create_directory(path("empty"));
    setenv("PATH", path("empty").c_str(), 1);
    EXPECT_EQ(complaint(),
              file +
                  ": mdb-schema is not installed; databases of MS Access are read by the programs "
                  "of mdbtools (Debian: apt-get install mdbtools)");
}

TEST_F(AccessReading, EndsAProgramThatHangs) {
    standIn("mdb-schema", "exec sleep 60\n");
    try {
        AccessReader(file, std::chrono::seconds(1)).read(rows);
        ADD_FAILURE() << "was read";
    } catch (const CatalogReadError& error) {
        EXPECT_EQ(error.what(), file + ": mdb-schema did not end in 1 seconds");
    }
}

TEST_F(AccessReading, TellsWhatAProgramComplainsAbout) {
    standIn("mdb-schema", "echo 'first line' >&2\necho second >&2\nexit 3\n");
    EXPECT_EQ(complaint(), file + ": mdb-schema failed: first line second");
    standIn("mdb-schema", "kill -SEGV $$\n");
    EXPECT_THAT(complaint(), StartsWith(file + ": mdb-schema failed"));
}

TEST_F(AccessReading, KnowsTheFilesByTheirContentAndTheirKind) {
    write("new", std::string("\0\1\0\0Standard ACE DB\0", 20));
    EXPECT_EQ(kindOfSource(path("new")), DB_MSACCESS);
    EXPECT_EQ(kindOfSource(file), DB_MSACCESS);
    write("other.accdb", "TABLE_NAME,COLUMN_NAME\nt,a\n");
    file = path("other.accdb");
    EXPECT_EQ(kindOfSource(file), std::nullopt);
    EXPECT_EQ(complaint(), file + ": is no database of MS Access");
    file = path("gone.mdb");
    EXPECT_THAT(complaint(), AllOf(StartsWith(file), testing::Not(HasSubstr("MS Access"))));
}

// These run the programs of mdbtools.
class AccessPrograms : public AccessReading, public testing::WithParamInterface<const char*> {
 protected:
    void SetUp() override {
        if (std::system("command -v mdb-schema mdb-export >/dev/null") != 0)
            GTEST_SKIP() << "mdbtools is not installed (Debian: apt-get install mdbtools)";
    }
    // Lets the file be the beginning of the whole one.
    void cutTo(std::size_t bytes) {
        file = path(std::string("cut") + GetParam());
        fs::copy_file(std::string(ZR_ACCESS_DIR "/shop") + GetParam(), file);
        fs::resize_file(file, bytes);
    }
};

// The formats of Access 2000 and of 2007.
INSTANTIATE_TEST_SUITE_P(Formats, AccessPrograms, testing::Values(".mdb", ".accdb"),
                         [](const auto& ending) { return std::string(ending.param + 1); });

TEST_P(AccessPrograms, TellTheSameOfAWholeFile) {
    file = std::string(ZR_ACCESS_DIR "/shop") + GetParam();
    Database& database = make();
    EXPECT_EQ(database.Tables.GetCount(), 3);
    EXPECT_THAT(
        columnsOf(*database.FindTableBySrcName(u"customers")),
        ElementsAre("id: Long Integer -1 0", "name: Text 50 0", "Straße: Text 80 0", "vip: Boolean -1 0"));
    EXPECT_THAT(columnsOf(*database.FindTableBySrcName(u"orders")),
                ElementsAre("id: Long Integer -1 0", "year: Integer -1 0", "customer: Long Integer -1 0",
                            "total: Currency -1 0", "note: Memo/Hyperlink -1 0"));
    EXPECT_THAT(columnsOf(*database.FindTableBySrcName(u"order lines")),
                ElementsAre("order: Long Integer -1 0", "year: Integer -1 0", "price: Numeric 18 4",
                            "at: DateTime -1 0"));
    EXPECT_THAT(keysIn(rows),
                ElementsAre("customers pk_customers P id 1 .", "customers by name U name 1 .",
                            "customers by name U Straße 2 .", "orders pk_orders P id 1 .",
                            "orders pk_orders P year 2 .", "orders customersorders F customer 0 customers.id",
                            "order lines ordersorder lines F order 0 orders.id",
                            "order lines ordersorder lines F year 1 orders.year"));
    analyseQueries(database);
    EXPECT_THAT(originsIn(database, u"named orders"),
                ElementsAre("id: orders.id", "wer: customers.name customers.Straße", "gross: orders.total"));
    EXPECT_THAT(originsIn(database, u"all names"), ElementsAre("name: customers.name customers.Straße"));
    EXPECT_THAT(rows.notes, ElementsAre("query forget: left out; it changes data"));
}

TEST_P(AccessPrograms, RefuseAFileThatIsCutOff) {
    cutTo(20);
    EXPECT_THAT(complaint(), StartsWith(file + ": mdb-schema failed: "));
    EXPECT_THAT(rows.columns, IsEmpty());
}

TEST_P(AccessPrograms, RefuseAFileThatHoldsNothing) {
    cutTo(21);
    fs::resize_file(file, 20000);
    EXPECT_THAT(complaint(), StartsWith(file + ": mdb-schema failed: "));
}

}  // namespace
}  // namespace zr::host
