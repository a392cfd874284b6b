// Any SQLite file, and any rows in a file that is in order, are a project or are refused.

#include <sqlite3.h>

#include <cstdio>
#include <cstdlib>
#include <sstream>

#include "host/project.h"
#include "tests/fuzz/check.h"
#include "tests/fuzz/samples.h"
#include "tests/fuzz/scratch_folder.h"
#include "tests/fuzz/words.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);

namespace zr::fuzz {

Language& languageOfTarget() {
    static WordLanguage language("{\"a\":", "}", sqliteSamples());
    return language;
}

namespace {

// One row a line, the number of the section around it, name and content, with tabulators between them.
void writeRows(const std::string& path, const std::string& rows) {
    sqlite3* handle = nullptr;
    const int opened = sqlite3_open(path.c_str(), &handle);
    require(opened == SQLITE_OK, sqlite3_errmsg(handle));
    sqlite3_exec(handle, "PRAGMA journal_mode = OFF; PRAGMA synchronous = OFF; BEGIN; DELETE FROM section",
                 nullptr, nullptr, nullptr);
    sqlite3_stmt* insert = nullptr;
    const int prepared = sqlite3_prepare_v2(
        handle, "INSERT INTO section (parent, name, content) VALUES (?, ?, ?)", -1, &insert, nullptr);
    require(prepared == SQLITE_OK, sqlite3_errmsg(handle));
    std::istringstream in(rows);
    for (std::string line; std::getline(in, line);) {
        const std::size_t first = line.find('\t');
        const std::size_t second = first == line.npos ? line.npos : line.find('\t', first + 1);
        if (second == line.npos) continue;
        if (const int parent = std::atoi(line.c_str()); parent != 0)
            sqlite3_bind_int(insert, 1, parent);
        else
            sqlite3_bind_null(insert, 1);
        sqlite3_bind_text64(insert, 2, line.data() + first + 1, second - first - 1, SQLITE_STATIC,
                            SQLITE_UTF8);
        sqlite3_bind_text64(insert, 3, line.data() + second + 1, line.size() - second - 1, SQLITE_STATIC,
                            SQLITE_UTF8);
        sqlite3_step(insert);  // a row that breaks a rule of the table is left out
        sqlite3_reset(insert);
    }
    sqlite3_finalize(insert);
    sqlite3_exec(handle, "COMMIT", nullptr, nullptr, nullptr);
    sqlite3_close(handle);
}

}  // namespace
}  // namespace zr::fuzz

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using namespace zr::host;
    static const zr::fuzz::ScratchFolder folder;
    static const std::string empty = [] {
        Database database(DB_MSSQL);
        saveProject(database, folder.path("empty.db"), StorageForm::Sqlite);
        return zr::fuzz::bytesOf(folder.path("empty.db"));
    }();
    const std::string input(reinterpret_cast<const char*>(data), size);
    const bool isRows = !input.empty() && input.front() == zr::fuzz::kRowsMark;
    // What SQLite left beside the file of the run before is none of this one's.
    for (const char* beside : {"input.db-journal", "input.db-wal", "input.db-shm"})
        std::remove(folder.path(beside).c_str());
    const std::string path = folder.write("input.db", isRows ? empty : input);
    if (isRows) zr::fuzz::writeRows(path, input.substr(1));
    std::unique_ptr<Database> project;
    try {
        project = loadProject(path);
    } catch (const ProjectError&) {
        return 0;
    }
    const std::string once = folder.path("once.json"), again = folder.path("again.json");
    saveProject(*project, once, StorageForm::Json);
    saveProject(*loadProject(once), again, StorageForm::Json);
    zr::fuzz::require(zr::fuzz::bytesOf(once) == zr::fuzz::bytesOf(again), "a project stays the same");
    return 0;
}
