#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <functional>
#include <set>

#include "host/json_form.h"
#include "host/sqlite_form.h"
#include "tests/host/projects.h"

// What is no project, or no whole one, is refused with the place and never opened in part.
namespace zr::host::test {
namespace {

using testing::AllOf;
using testing::HasSubstr;
using testing::StartsWith;

class BrokenProject : public testing::Test {
 protected:
    // A small project's stored form.
    StoredTree tree() {
        saveProject(*smallProject(), json, StorageForm::Json);
        StoredTree read;
        JsonReader().read(bytesOf(json), read.root);
        return read;
    }
    void writeJson(const StoredTree& from) {
        std::string text;
        appendJson(text, from.root);
        writeBytes(json, text);
    }
    std::string complaintOfJson(const std::string& text) {
        writeBytes(json, text);
        return complaintOf(json);
    }
    // Runs statements on an SQLite file of a small project and tells what its opening then complains about.
    std::string complaintOfSqlite(const std::string& statements) {
        std::remove(db.c_str());
        saveProject(*smallProject(), db, StorageForm::Sqlite);
        runSql(statements);
        return complaintOf(db);
    }
    void runSql(const std::string& statements) { test::runSql(db, statements); }

    Folder folder;
    const std::string json = folder.path("p.json");
    const std::string db = folder.path("p.db");
};

TEST_F(BrokenProject, ThatIsNotThereIsNamed) {
    EXPECT_EQ(complaintOf(folder.path("none.json")),
              folder.path("none.json") + ": can't be opened: No such file or directory");
    EXPECT_THAT(complaintOf(folder.path("")), HasSubstr("Is a directory"));
}

TEST_F(BrokenProject, JsonCutAtAnyByteIsRefusedWithItsLine) {
    saveProject(*smallProject(), json, StorageForm::Json);
    const std::string whole = bytesOf(json);
    for (std::size_t length = whole.size() - 1; length-- > 0;) {
        std::filesystem::resize_file(json, length);
        const std::string complaint = complaintOf(json);
        EXPECT_THAT(complaint, AllOf(StartsWith(json + ": "), HasSubstr("line "))) << length;
        if (HasFailure()) break;
    }
    writeBytes(json, whole.substr(0, whole.size() - 1));
    EXPECT_NE(loadProject(json), nullptr) << "only the last line end is missing";
}

TEST_F(BrokenProject, SqliteCutAtAnyByteIsRefused) {
    saveProject(*smallProject(), db, StorageForm::Sqlite);
    const std::string whole = bytesOf(db);
    // Every seventh byte, and those around the ends of pages.
    constexpr std::size_t page = 4096;
    for (std::size_t length = whole.size(); length-- > 0;) {
        if (length % 7 != 0 && (length + 1) % page > 2) continue;
        std::filesystem::resize_file(db, length);
        EXPECT_THAT(complaintOf(db), StartsWith(db + ": ")) << length;
        if (HasFailure()) break;
    }
}

// Calls visit for each section of a tree, with its path.
void forEachSection(StoredSection& section, const std::string& path,
                    const std::function<void(StoredSection&, const std::string&)>& visit) {
    visit(section, path);
    for (const auto& child : section.children)
        forEachSection(*child, path.empty() ? child->name.toUtf8() : path + "/" + child->name.toUtf8(),
                       visit);
}

TEST_F(BrokenProject, AnyValueOfTheOtherTypeIsRefusedWithItsPlace) {
    StoredTree broken = tree();
    int values = 0;
    std::set<std::string> seen;
    forEachSection(broken.root, "", [&](StoredSection& section, const std::string& path) {
        for (StoredValue& value : section.values) {
            value.isText = !value.isText;
            writeJson(broken);
            EXPECT_THAT(
                complaintOf(json),
                AllOf(HasSubstr("line "), HasSubstr(path), HasSubstr("\"" + value.name.toUtf8() + "\""),
                      HasSubstr(value.isText ? "has to be a whole number, and is a text"
                                             : "has to be a text, and is a number")));
            // Each save to SQLite waits for the disk; once a name is enough.
            if (seen.insert(value.name.toUtf8()).second) {
                writeSqlite(db, broken.root);
                EXPECT_THAT(complaintOf(db), AllOf(HasSubstr("row "), HasSubstr(path)));
            }
            value.isText = !value.isText;
            ++values;
        }
    });
    EXPECT_GT(values, 200);
}

TEST_F(BrokenProject, AValueWhereASectionHasToBeIsRefusedWithItsPlace) {
    const StoredTree whole = tree();
    std::vector<std::string> paths;
    StoredTree read = tree();
    forEachSection(read.root, "", [&](StoredSection&, const std::string& path) { paths.push_back(path); });
    for (const std::string& path : paths) {
        if (path.empty()) continue;
        StoredTree broken = tree();
        const std::string parent = path.find('/') == path.npos ? "" : path.substr(0, path.rfind('/'));
        const CString name(path.substr(path.rfind('/') + 1).c_str());
        forEachSection(broken.root, "", [&](StoredSection& section, const std::string& at) {
            if (at != parent || !section.findChild(name)) return;
            section.removeChild(name);
            section.values.emplace_back();
            section.values.back().name = name;
        });
        writeJson(broken);
        EXPECT_THAT(complaintOf(json), HasSubstr("\"" + name.toUtf8() + "\"")) << path;
    }
}

TEST_F(BrokenProject, ASectionWhereAValueHasToBeIsRefusedWithItsPlace) {
    StoredTree broken = tree();
    StoredSection& common = *broken.root.findChild(u"Database")->findChild(u"Common");
    std::erase_if(common.values, [](const StoredValue& value) { return value.name == u"Length"; });
    common.addChild(u"Length");
    writeJson(broken);
    EXPECT_THAT(complaintOf(json),
                AllOf(HasSubstr("Database/Common: "), HasSubstr("\"Length\" has to be a value")));
}

TEST_F(BrokenProject, AnythingThatAProjectDoesNotHaveIsRefused) {
    StoredTree broken = tree();
    StoredSection& common = *broken.root.findChild(u"Database")->findChild(u"Common");
    common.values.emplace_back();
    common.values.back().name = u"Lenght";
    writeJson(broken);
    EXPECT_THAT(complaintOf(json),
                AllOf(HasSubstr("line "), HasSubstr("Database/Common: there is no value \"Lenght\"")));
    common.values.pop_back();
    common.addChild(u"More");
    writeJson(broken);
    EXPECT_THAT(complaintOf(json), HasSubstr("Database/Common: there is no section \"More\""));
}

TEST_F(BrokenProject, JsonValuesThatAreNeitherTextNorWholeNumberAreRefused) {
    for (const char* value : {"null", "true", "false", "1.5", "1e3", "[]", "[1]", "2147483648", "-2147483649",
                              "99999999999999999999999"}) {
        const std::string complaint = complaintOfJson(std::string("{\n\"Format\": ") + value + "}");
        EXPECT_THAT(complaint, AllOf(StartsWith(json + ": line 2"), HasSubstr("\"Format\" has to be")))
            << value;
    }
}

TEST_F(BrokenProject, JsonOfSomethingElseIsRefused) {
    EXPECT_THAT(complaintOfJson(""), HasSubstr("line 1"));
    EXPECT_THAT(complaintOfJson("[]"), HasSubstr("line 1: there is a list where a section has to be"));
    EXPECT_THAT(complaintOfJson("7"), HasSubstr("line 1: there is a value where a section has to be"));
    EXPECT_THAT(complaintOfJson("{}"), HasSubstr("this is no project"));
    EXPECT_THAT(complaintOfJson("{\"Format\": \"other\"}"), HasSubstr("line 1: this is no project"));
    EXPECT_THAT(complaintOfJson("SELECT 1"), HasSubstr("line 1, column 1"));
    EXPECT_THAT(complaintOfJson("{} {}"), HasSubstr("line 1, column 4"));
    EXPECT_THAT(complaintOfJson("{\"a\": \"\xFF\"}"), HasSubstr("line 1, column"));
}

TEST_F(BrokenProject, NamesThatStandTwiceAreRefused) {
    EXPECT_THAT(complaintOfJson("{\"a\": 1,\n\"b\": 1,\n\"a\": 1}"),
                HasSubstr("line 3: \"a\" stands twice in a section"));
    EXPECT_THAT(complaintOfJson("{\"a\": {},\n\"a\": 1}"), HasSubstr("line 2: \"a\" stands twice"));
    EXPECT_THAT(complaintOfSqlite("UPDATE section SET name = 'Options' WHERE name = 'Common'"),
                HasSubstr("\"Options\" stands twice in a section"));
}

TEST_F(BrokenProject, BrokenEscapesAreRefused) {
    for (const char* text : {"\\uffff", "\\uffffD8", "\\uffffXYZW", "\\uffff-001"})
        EXPECT_THAT(complaintOfJson(std::string("{\"a\": \"") + text + "\"}"),
                    HasSubstr("line 1: the text of \"a\" has a broken escape"))
            << text;
}

TEST_F(BrokenProject, VersionsAndKindsThatAreNotKnownAreRefused) {
    const std::string head = "{\"Format\": \"ZRParserSQL project\",\n";
    EXPECT_THAT(complaintOfJson(head + "\"Version\": 2}"), HasSubstr("line 2: the project is of version 2"));
    EXPECT_THAT(complaintOfJson(head + "\"Version\": 1,\n\"DBType\": 3}"),
                HasSubstr("line 3: there is no kind of database 3"));
    EXPECT_THAT(complaintOfJson(head + "\"Version\": 1}"), HasSubstr("there is no kind of database 0"));
    EXPECT_THAT(complaintOfJson(head + "\"Version\": 1, \"DBType\": 8}"),
                HasSubstr("there is no section \"Database\""));
}

TEST_F(BrokenProject, AFilterOfAnUnknownKindIsRefusedWithItsPlace) {
    StoredTree broken = tree();
    forEachSection(broken.root, "", [](StoredSection& section, const std::string& path) {
        if (path.ends_with("/Filter")) section.findValue(u"DBType")->number = 77;
    });
    writeJson(broken);
    EXPECT_THAT(complaintOf(json),
                AllOf(HasSubstr("line "),
                      HasSubstr("Database/Tables/Table2/Filter: there is no kind of database 77")));
}

std::string repeated(const std::string& text, int count) {
    std::string all;
    for (int at = 0; at < count; ++at) all += text;
    return all;
}

TEST_F(BrokenProject, NestingOfTenThousandIsRefusedWithItsLine) {
    EXPECT_THAT(complaintOfJson(repeated("{\"a\":\n", 10000) + "1" + repeated("}", 10000)),
                HasSubstr("line 66: sections are nested more than 64 deep"));
    EXPECT_THAT(complaintOfJson(repeated("[", 10000) + repeated("]", 10000)), HasSubstr("line 1"));
    EXPECT_THAT(complaintOfJson("{\"a\": " + repeated("[", 10000)), HasSubstr("\"a\" has to be"));
    EXPECT_THAT(
        complaintOfSqlite("WITH RECURSIVE n(i) AS (SELECT 100 UNION ALL SELECT i + 1 FROM n WHERE i < 10100)"
                          " DELETE FROM section WHERE id > 1;"
                          "WITH RECURSIVE n(i) AS (SELECT 2 UNION ALL SELECT i + 1 FROM n WHERE i < 10000)"
                          " INSERT INTO section SELECT i, i - 1, 'a', '{}' FROM n"),
        HasSubstr("row 66: sections are nested more than 64 deep"));
}

TEST_F(BrokenProject, NestingUpToTheBoundIsReadAsJson) {
    StoredSection root;
    JsonReader().read(repeated("{\"a\":", 64) + "{}" + repeated("}", 64), root);
    EXPECT_EQ(root.children.size(), 1u);
    StoredSection other;
    EXPECT_THROW(JsonReader().read(repeated("{\"a\":", 65) + "{}" + repeated("}", 65), other), StorageError);
}

TEST_F(BrokenProject, TooManyValuesInASectionAreRefused) {
    std::string text = "{";
    for (int number = 0; number <= 1000; ++number)
        text += (number ? ",\"" : "\"") + std::to_string(number) + "\":1";
    EXPECT_THAT(complaintOfJson(text + "}"), HasSubstr("more than 1000 values"));
}

TEST_F(BrokenProject, SqliteOfSomethingElseIsRefused) {
    runSql("CREATE TABLE t (a)");
    EXPECT_EQ(complaintOf(db), db + ": the database is no project");
    EXPECT_THAT(complaintOfSqlite("PRAGMA user_version = 9"), HasSubstr("the form 9"));
    EXPECT_THAT(complaintOfSqlite("DROP TABLE section"), HasSubstr("no such table: section"));
    EXPECT_THAT(complaintOfSqlite("DELETE FROM section"), HasSubstr("holds no section"));
}

TEST_F(BrokenProject, RowsThatDoNotFitTogetherAreRefusedWithTheirNumber) {
    EXPECT_THAT(complaintOfSqlite("DELETE FROM section WHERE id = 5"), HasSubstr("row 5: "));
    EXPECT_THAT(complaintOfSqlite("UPDATE section SET parent = 1 WHERE id = 1"), HasSubstr("row 1: "));
    EXPECT_THAT(complaintOfSqlite("UPDATE section SET parent = 7 WHERE id = 7"), HasSubstr("row 7: "));
    EXPECT_THAT(complaintOfSqlite("UPDATE section SET parent = NULL WHERE id = 7"), HasSubstr("row 7: "));
    EXPECT_THAT(complaintOfSqlite("UPDATE section SET content = '{' WHERE id = 4"),
                HasSubstr("row 4: content: parse error"));
    EXPECT_THAT(complaintOfSqlite("UPDATE section SET content = '{\"a\": {}}' WHERE id = 4"),
                HasSubstr("row 4: content: there is a section"));
    EXPECT_THAT(complaintOfSqlite("UPDATE section SET content = '7' WHERE id = 4"),
                HasSubstr("row 4: content: "));
    EXPECT_THAT(complaintOfSqlite("UPDATE section SET content = '' WHERE id = 4"),
                HasSubstr("row 4: content: "));
}

TEST_F(BrokenProject, TypesThatTheTableDoesNotHoldAreRefused) {
    EXPECT_THAT(
        complaintOfSqlite("ALTER TABLE section RENAME TO old;"
                          "CREATE TABLE section (id INTEGER PRIMARY KEY, parent, name, content);"
                          "INSERT INTO section SELECT id, parent, name, CAST(content AS BLOB) FROM old"),
        HasSubstr("row 1: name and content have to be texts"));
    EXPECT_THAT(
        complaintOfSqlite("ALTER TABLE section RENAME TO old;"
                          "CREATE TABLE section (id INTEGER PRIMARY KEY, parent, name, content);"
                          "INSERT INTO section SELECT id, CAST(parent AS TEXT), name, content FROM old"),
        HasSubstr("row 2: "));
}

// Any one byte that is another one: the project is refused, or it is one that was not hit where it counts.
TEST_F(BrokenProject, AnyByteThatIsAnotherOneNeverCrashes) {
    for (const StorageForm form : {StorageForm::Json, StorageForm::Sqlite}) {
        const std::string path = form == StorageForm::Json ? json : db;
        saveProject(*smallProject(), path, form);
        const std::string whole = bytesOf(path);
        int refused = 0;
        for (std::size_t at = 0; at < whole.size(); at += 7) {
            std::string broken = whole;
            broken[at] = static_cast<char>(broken[at] ^ 0x15);
            writeBytes(path, broken);
            try {
                EXPECT_NE(loadProject(path), nullptr);
            } catch (const ProjectError&) {
                ++refused;
            }
        }
        EXPECT_GT(refused, 0);
    }
}

TEST_F(BrokenProject, TheSmallProjectItselfIsWhole) {
    writeJson(tree());
    EXPECT_EQ(stored(*loadProject(json)), stored(*smallProject()));
}

}  // namespace
}  // namespace zr::host::test
