#include "host/sqlite_reader.h"

#include <sqlite3.h>

#include <functional>

#include "host/catalog_cells.h"

namespace zr::host {

namespace {

constexpr int kBusyMilliseconds = 5000;

class Connection {
 public:
    explicit Connection(const std::string& path) : path_(path) {
        const int result = sqlite3_open_v2(path.c_str(), &handle_, SQLITE_OPEN_READONLY, nullptr);
        if (result != SQLITE_OK) {
            const std::string why = handle_ ? sqlite3_errmsg(handle_) : sqlite3_errstr(result);
            sqlite3_close(handle_);
            throw CatalogReadError(path + ": " + why);
        }
        sqlite3_busy_timeout(handle_, kBusyMilliseconds);
    }
    ~Connection() { sqlite3_close(handle_); }
    Connection(const Connection&) = delete;
    Connection& operator=(const Connection&) = delete;

    void each(const std::string& sql, const std::vector<std::string>& values,
              const std::function<void(const Cells&)>& take) {
        sqlite3_stmt* statement = nullptr;
        if (sqlite3_prepare_v2(handle_, sql.c_str(), -1, &statement, nullptr) != SQLITE_OK) fail();
        const std::unique_ptr<sqlite3_stmt, int (*)(sqlite3_stmt*)> kept(statement, sqlite3_finalize);
        for (std::size_t at = 0; at < values.size(); ++at)
            sqlite3_bind_text(statement, static_cast<int>(at) + 1, values[at].data(),
                              static_cast<int>(values[at].size()), SQLITE_TRANSIENT);
        int result = sqlite3_step(statement);
        for (; result == SQLITE_ROW; result = sqlite3_step(statement)) {
            Cells cells(static_cast<std::size_t>(sqlite3_column_count(statement)));
            for (std::size_t at = 0; at < cells.size(); ++at) {
                const int column = static_cast<int>(at);
                if (const unsigned char* text = sqlite3_column_text(statement, column))
                    cells[at].emplace(reinterpret_cast<const char*>(text),
                                      static_cast<std::size_t>(sqlite3_column_bytes(statement, column)));
            }
            take(cells);
        }
        if (result != SQLITE_DONE) fail();
    }

 private:
    [[noreturn]] void fail() { throw CatalogReadError(path_ + ": " + sqlite3_errmsg(handle_)); }

    std::string path_;
    sqlite3* handle_ = nullptr;
};

void readTable(Connection& connection, CatalogRows& rows, const std::string& table) {
    const CString tableName = CString::fromUtf8(table);
    std::vector<std::pair<int, CString>> primary;
    connection.each("SELECT name, type, pk FROM pragma_table_xinfo(?) WHERE hidden <> 1 ORDER BY cid",
                    {table}, [&](const auto& cells) {
                        CatalogRows::Column column;
                        column.table = tableName;
                        column.name = textIn(cells[0]);
                        column.type = textIn(cells[1]);
                        rows.columns.push_back(column);
                        if (const int place = numberIn(cells[2])) primary.emplace_back(place, column.name);
                    });
    for (const auto& [place, column] : primary)
        rows.keys.push_back(
            {{}, tableName, u"pk_" + tableName, CatalogRows::Key::Kind::Primary, column, place, {}, {}});
    connection.each(
        "SELECT l.name, i.name, i.seqno FROM pragma_index_list(?) l, pragma_index_info(l.name) i "
        "WHERE l.\"unique\" AND l.origin <> 'pk' AND NOT l.partial AND i.name IS NOT NULL "
        "ORDER BY l.seq DESC, i.seqno",
        {table}, [&](const auto& cells) {
            rows.keys.push_back({{},
                                 tableName,
                                 textIn(cells[0]),
                                 CatalogRows::Key::Kind::Unique,
                                 textIn(cells[1]),
                                 numberIn(cells[2]),
                                 {},
                                 {}});
        });
    // A key that names no columns refers to the primary key of the other table.
    connection.each(
        "SELECT f.id, f.\"table\", f.\"from\", coalesce(f.\"to\", (SELECT t.name FROM "
        "pragma_table_info(f.\"table\") t WHERE t.pk = f.seq + 1)), f.seq "
        "FROM pragma_foreign_key_list(?) f ORDER BY f.id, f.seq",
        {table}, [&](const auto& cells) {
            rows.keys.push_back({{},
                                 tableName,
                                 u"fk_" + tableName + u"_" + textIn(cells[0]),
                                 CatalogRows::Key::Kind::Foreign,
                                 textIn(cells[2]),
                                 numberIn(cells[4]),
                                 textIn(cells[1]),
                                 textIn(cells[3])});
        });
}

}  // namespace

void SqliteReader::read(CatalogRows& rows, const CatalogReading& reading) {
    Connection connection(path_);
    connection.each("BEGIN", {}, [](const auto&) {});
    std::vector<std::string> tables;
    connection.each(
        "SELECT type, name, sql FROM sqlite_master WHERE type IN ('table', 'view') AND name NOT LIKE "
        "'sqlite\\_%' ESCAPE '\\' ORDER BY rowid",
        {}, [&](const auto& cells) {
            if (cells[0] == "table")
                tables.push_back(cells[1].value_or(std::string()));
            else
                rows.views.push_back({{}, textIn(cells[1]), textIn(cells[2])});
        });
    for (const std::string& table : tables) {
        reading.tell(rows);
        readTable(connection, rows, table);
    }
    connection.each("COMMIT", {}, [](const auto&) {});
}

}  // namespace zr::host
