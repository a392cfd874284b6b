#pragma once

#include <sqlite3.h>

#include <memory>
#include <string>
#include <vector>

namespace zr::bench {

/// A database in SQLite's memory with the tables and columns that queries name, so that SQLite can prepare
/// them.
class MatchingSchema {
 public:
    MatchingSchema();

    /// Adds what SQLite misses for a text, until it prepares the text or misses something else.
    void addFor(const std::string& text);

    sqlite3* database() const { return database_.get(); }
    /// What SQLite has against a text, or nothing.
    std::string refusal(const std::string& text) const;

 private:
    bool execute(const std::string& command);
    bool addTable(const std::string& name);
    bool addColumn(const std::string& name, const std::string& text);

    struct Close {
        void operator()(sqlite3* database) const { sqlite3_close(database); }
    };
    std::unique_ptr<sqlite3, Close> database_;
    std::vector<std::string> tables_;
};

}  // namespace zr::bench
