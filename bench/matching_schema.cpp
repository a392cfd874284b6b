#include "bench/matching_schema.h"

#include <new>
#include <optional>

namespace zr::bench {

namespace {

std::string quoted(const std::string& name) {
    std::string text = "\"";
    for (const char c : name) text += c == '"' ? std::string("\"\"") : std::string(1, c);
    return text + '"';
}

/// What stands behind a beginning.
std::optional<std::string> behind(const std::string& beginning, const std::string& message) {
    if (message.rfind(beginning, 0) != 0) return std::nullopt;
    return message.substr(beginning.size());
}

}  // namespace

MatchingSchema::MatchingSchema() {
    sqlite3* database = nullptr;
    const int code = sqlite3_open(":memory:", &database);
    database_.reset(database);
    if (code != SQLITE_OK) throw std::bad_alloc();
}

void MatchingSchema::addFor(const std::string& text) {
    for (bool isMore = true; isMore;) {
        const std::string message = refusal(text);
        if (const auto table = behind("no such table: ", message))
            isMore = addTable(*table);
        else if (const auto column = behind("no such column: ", message))
            isMore = addColumn(column->substr(column->rfind('.') + 1), text);
        else
            isMore = false;
    }
}

std::string MatchingSchema::refusal(const std::string& text) const {
    sqlite3_stmt* statement = nullptr;
    const int code = sqlite3_prepare_v3(database(), text.c_str(), -1, 0, &statement, nullptr);
    sqlite3_finalize(statement);
    return code == SQLITE_OK ? "" : sqlite3_errmsg(database());
}

bool MatchingSchema::execute(const std::string& command) {
    return sqlite3_exec(database(), command.c_str(), nullptr, nullptr, nullptr) == SQLITE_OK;
}

bool MatchingSchema::addTable(const std::string& name) {
    // No table is without a column.
    if (!execute("CREATE TABLE " + quoted(name) + " (zr_first)")) return false;
    tables_.push_back(name);
    return true;
}

/// SQLite doesn't say which table should have the column, so the tables in the text are tried.
bool MatchingSchema::addColumn(const std::string& name, const std::string& text) {
    const std::string message = refusal(text);
    for (const std::string& table : tables_) {
        if (text.find(table) == std::string::npos) continue;
        const std::string alter = "ALTER TABLE " + quoted(table);
        if (!execute(alter + " ADD COLUMN " + quoted(name))) continue;
        if (refusal(text) != message) return true;
        if (!execute(alter + " DROP COLUMN " + quoted(name))) return false;
    }
    return false;
}

}  // namespace zr::bench
