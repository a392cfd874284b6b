#include <sqlite3.h>

#include "host/project.h"
#include "tests/fuzz/samples.h"
#include "tests/fuzz/scratch_folder.h"
#include "tests/host/projects.h"

namespace zr::fuzz {

namespace {

constexpr unsigned kRandomProjects = 4;

std::string savedAs(host::Database& database, host::StorageForm form) {
    const ScratchFolder folder;
    const std::string path = folder.path("sample");
    host::saveProject(database, path, form);
    return bytesOf(path);
}

std::string rowsOf(host::Database& database) {
    const ScratchFolder folder;
    const std::string path = folder.path("sample");
    host::saveProject(database, path, host::StorageForm::Sqlite);
    std::string rows(1, kRowsMark);
    sqlite3* handle = nullptr;
    sqlite3_open(path.c_str(), &handle);
    sqlite3_exec(
        handle, "SELECT ifnull(parent, 0) || char(9) || name || char(9) || content FROM section ORDER BY id",
        [](void* all, int, char** columns, char**) {
            static_cast<std::string*>(all)->append(columns[0]).append("\n");
            return 0;
        },
        &rows, nullptr);
    sqlite3_close(handle);
    return rows;
}

/// Calls `add` with projects of each kind of content. Those of one thing are short enough for a fuzzer to
/// change without cutting them.
template <typename Add>
void forEachProject(Add add) {
    using namespace host;
    Database empty(DB_MSSQL);
    add(empty);
    Database withQuery(DB_MYSQL);
    withQuery.addQuery(std::make_unique<Query>(DB_MYSQL)).SetSQL(u"SELECT a FROM t");
    add(withQuery);
    Database withTable(DB_ORACLE);
    Table& table = withTable.addTable(std::make_unique<Table>(DB_ORACLE));
    setNames(table, u"t");
    add(withTable);
    setNames(table.addField(std::make_unique<Field>()), u"a");
    add(withTable);
    table.addIndex(std::make_unique<Index>()).addColumn(u"a");
    add(withTable);
    table.addForeignKey(std::make_unique<ForeignKey>());
    add(withTable);
    add(*host::test::smallProject());
    for (unsigned seed = 1; seed <= kRandomProjects; ++seed) add(*host::test::randomProject(seed));
}

}  // namespace

std::vector<std::string> projectSamples() {
    std::vector<std::string> samples;
    forEachProject(
        [&](host::Database& project) { samples.push_back(savedAs(project, host::StorageForm::Json)); });
    return samples;
}

std::vector<std::string> sqliteSamples() {
    std::vector<std::string> samples;
    forEachProject([&](host::Database& project) {
        samples.push_back(rowsOf(project));
        if (samples.size() < 4) samples.push_back(savedAs(project, host::StorageForm::Sqlite));
    });
    return samples;
}

}  // namespace zr::fuzz
