#include "host/sqlite_form.h"

#include <sqlite3.h>

#include <array>
#include <filesystem>
#include <fstream>

#include "host/file_replacement.h"
#include "host/json_form.h"

namespace zr::host {

namespace {

// "ZRPS", in the header of the file.
constexpr int kApplicationId = 0x5A525053;
constexpr int kFormVersion = 1;
constexpr int kBusyMilliseconds = 5000;
constexpr std::string_view kMagic("SQLite format 3\0", 16);

constexpr const char* kSchema =
    "CREATE TABLE section ("
    "id INTEGER PRIMARY KEY, "
    "parent INTEGER REFERENCES section (id), "
    "name TEXT NOT NULL, "
    "content TEXT NOT NULL"
    ") STRICT";

class Statement;

class Connection {
 public:
    Connection(const std::string& path, int flags) : path_(path) {
        const int result = sqlite3_open_v2(path.c_str(), &handle_, flags, nullptr);
        if (result != SQLITE_OK) {
            const std::string why = handle_ ? sqlite3_errmsg(handle_) : sqlite3_errstr(result);
            sqlite3_close(handle_);
            throw FileError(path + ": " + why);
        }
        sqlite3_busy_timeout(handle_, kBusyMilliseconds);
    }
    ~Connection() { sqlite3_close(handle_); }
    Connection(const Connection&) = delete;
    Connection& operator=(const Connection&) = delete;

    sqlite3* handle() const { return handle_; }
    void run(const std::string& sql) {
        if (sqlite3_exec(handle_, sql.c_str(), nullptr, nullptr, nullptr) != SQLITE_OK) fail();
    }
    int number(const char* sql);

    // What the file is at fault for raises StorageError, what its surroundings are at fault for FileError.
    [[noreturn]] void fail() const {
        const std::string why = sqlite3_errmsg(handle_);
        switch (sqlite3_errcode(handle_)) {
            case SQLITE_NOTADB:
            case SQLITE_CORRUPT:
            case SQLITE_ERROR:
            case SQLITE_TOOBIG:
                throw StorageError(why);
            default:
                throw FileError(path_ + ": " + why);
        }
    }

 private:
    std::string path_;
    sqlite3* handle_ = nullptr;
};

class Statement {
 public:
    Statement(Connection& connection, const char* sql) : connection_(connection) {
        if (sqlite3_prepare_v2(connection.handle(), sql, -1, &handle_, nullptr) != SQLITE_OK)
            connection.fail();
    }
    ~Statement() { sqlite3_finalize(handle_); }
    Statement(const Statement&) = delete;
    Statement& operator=(const Statement&) = delete;

    // True while there is a row.
    bool step() {
        const int result = sqlite3_step(handle_);
        if (result != SQLITE_ROW && result != SQLITE_DONE) connection_.fail();
        return result == SQLITE_ROW;
    }
    void reset() { sqlite3_reset(handle_); }

    // The bytes are to stay as they are until the statement was stepped.
    void bind(int place, const std::string& text) {
        if (sqlite3_bind_text64(handle_, place, text.data(), text.size(), SQLITE_STATIC, SQLITE_UTF8) !=
            SQLITE_OK)
            connection_.fail();
    }
    void bind(int place, sqlite3_int64 number) {
        if (sqlite3_bind_int64(handle_, place, number) != SQLITE_OK) connection_.fail();
    }
    bool isNull(int column) { return sqlite3_column_type(handle_, column) == SQLITE_NULL; }
    bool isText(int column) { return sqlite3_column_type(handle_, column) == SQLITE_TEXT; }
    bool isNumber(int column) { return sqlite3_column_type(handle_, column) == SQLITE_INTEGER; }
    sqlite3_int64 number(int column) { return sqlite3_column_int64(handle_, column); }
    std::string_view text(int column) {
        const auto* bytes = reinterpret_cast<const char*>(sqlite3_column_text(handle_, column));
        return {bytes ? bytes : "", static_cast<std::size_t>(sqlite3_column_bytes(handle_, column))};
    }

 private:
    Connection& connection_;
    sqlite3_stmt* handle_ = nullptr;
};

int Connection::number(const char* sql) {
    Statement statement(*this, sql);
    return statement.step() ? static_cast<int>(statement.number(0)) : 0;
}

void requireProject(Connection& connection) {
    if (connection.number("PRAGMA application_id") != kApplicationId)
        throw StorageError("the database is no project");
    const int version = connection.number("PRAGMA user_version");
    if (version != kFormVersion)
        throw StorageError("the database has the form " + std::to_string(version) +
                           " of a project, and only " + std::to_string(kFormVersion) + " is known");
}

// Puts the rows together as they come.
class TreeBuilder {
 public:
    explicit TreeBuilder(StoredSection& root) : root_(root) {}

    void add(Statement& row) {
        const sqlite3_int64 id = row.number(0);
        if (id != static_cast<sqlite3_int64>(sections_.size()) + 1)
            fail("there is the number " + std::to_string(id) + " instead");
        if (!row.isText(2) || !row.isText(3)) fail("name and content have to be texts");
        StoredSection& section = sections_.empty() ? root(row) : child(row);
        section.place = place();
        const Level level = sections_.empty() ? Level{&section, 0} : Level{&section, parentLevel(row) + 1};
        if (level.depth > kMostLevels)
            fail("sections are nested more than " + std::to_string(kMostLevels) + " deep");
        readValues(row.text(3), section);
        sections_.push_back(level);
    }
    bool isEmpty() const { return sections_.empty(); }

 private:
    struct Level {
        StoredSection* section;
        std::size_t depth;
    };

    FilePlace place() const { return static_cast<FilePlace>(sections_.size() + 1); }
    [[noreturn]] void fail(const std::string& what) const {
        throw StorageError("row " + std::to_string(place()) + ": " + what);
    }

    StoredSection& root(Statement& row) {
        if (!row.isNull(1)) fail("the first section has to be around all others");
        return root_;
    }

    const Level& parentOf(Statement& row) const {
        const sqlite3_int64 parent = row.number(1);
        if (!row.isNumber(1) || parent < 1 || parent > static_cast<sqlite3_int64>(sections_.size()))
            fail("the section around it has to be one of the rows before");
        return sections_[static_cast<std::size_t>(parent - 1)];
    }
    std::size_t parentLevel(Statement& row) const { return parentOf(row).depth; }

    StoredSection& child(Statement& row) {
        StoredSection& parent = *parentOf(row).section;
        const CString& name = reader_.name(std::string(row.text(2)));
        if (parent.findChild(name, parent.children.size()) || parent.findValue(name))
            fail("\"" + name.toUtf8() + "\" stands twice in a section");
        return parent.addChild(name);
    }

    void readValues(std::string_view content, StoredSection& section) {
        try {
            reader_.read(content, section);
        } catch (const StorageError& error) {
            fail(std::string("content: ") + error.what());
        }
        if (!section.children.empty()) fail("content: there is a section where values have to be");
        for (StoredValue& value : section.values) value.place = section.place;
    }

    StoredSection& root_;
    JsonReader reader_;
    std::vector<Level> sections_;  // by number less 1
};

class SectionWriter {
 public:
    explicit SectionWriter(Connection& connection)
        : insert_(connection, "INSERT INTO section (id, parent, name, content) VALUES (?, ?, ?, ?)") {}

    // As deep as the tree, which kMostLevels bounds.
    void write(const StoredSection& section, sqlite3_int64 parent) {
        const sqlite3_int64 id = ++written_;
        name_ = nameInUtf8(section.name);
        content_.clear();
        appendValuesJson(content_, section);
        insert_.bind(1, id);
        if (parent) insert_.bind(2, parent);
        insert_.bind(3, name_);
        insert_.bind(4, content_);
        insert_.step();
        insert_.reset();
        for (const auto& child : section.children) write(*child, id);
    }

 private:
    Statement insert_;
    sqlite3_int64 written_ = 0;
    std::string name_;
    std::string content_;
};

// Replaces the content of the database, or fills an empty one.
void writeInto(const std::string& path, const StoredSection& root) {
    Connection connection(path, SQLITE_OPEN_READWRITE | SQLITE_OPEN_CREATE);
    connection.run("BEGIN IMMEDIATE");
    const bool isEmpty = connection.number("PRAGMA application_id") == 0 &&
                         connection.number("SELECT count(*) FROM sqlite_schema") == 0;
    if (isEmpty) {
        connection.run("PRAGMA application_id = " + std::to_string(kApplicationId));
        connection.run("PRAGMA user_version = " + std::to_string(kFormVersion));
    } else {
        requireProject(connection);
        connection.run("DROP TABLE section");
    }
    connection.run(kSchema);
    SectionWriter(connection).write(root, 0);
    connection.run("COMMIT");
}

}  // namespace

bool isSqliteFile(const std::string& path) {
    std::ifstream file(path, std::ios::binary);
    std::array<char, kMagic.size()> begin{};
    return file.read(begin.data(), begin.size()) && std::string_view(begin.data(), begin.size()) == kMagic;
}

StoredTree readSqlite(const std::string& path) {
    // Opened for writing, since what an interrupted save left over is taken back by the first reader.
    Connection connection(path, SQLITE_OPEN_READWRITE);
    requireProject(connection);
    StoredTree tree;
    tree.placeWord = "row";
    TreeBuilder builder(tree.root);
    Statement rows(connection, "SELECT id, parent, name, content FROM section ORDER BY id");
    while (rows.step()) builder.add(rows);
    if (builder.isEmpty()) throw StorageError("the database holds no section");
    return tree;
}

void writeSqlite(const std::string& path, const StoredSection& root) {
    const std::filesystem::path file(path);
    std::error_code failed;
    const auto oldSize = std::filesystem::file_size(file, failed);
    const bool isNew = static_cast<bool>(failed);
    // What was not there before is not there afterwards. Needs no memory, the lack of which may be the
    // reason.
    const auto removeIfEmpty = [&] {
        if (isNew && std::filesystem::file_size(file, failed) == 0) std::filesystem::remove(file, failed);
    };
    try {
        // What is no database gives way as a whole; a database is changed in place.
        if (!isNew && oldSize > 0 && !isSqliteFile(path))
            replaceFileBy(path, [&root](const std::string& beside) { writeInto(beside, root); });
        else
            writeInto(path, root);
    } catch (const StorageError& error) {
        removeIfEmpty();
        throw FileError(path + ": can't be saved to: " + error.what());
    } catch (...) {
        removeIfEmpty();
        throw;
    }
}

}  // namespace zr::host
