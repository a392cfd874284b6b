#include <algorithm>
#include <filesystem>

#include "host/access_reader.h"
#include "host/catalog_url.h"
#include "host/dump_reader.h"
#include "host/file_replacement.h"
#include "host/server_readers.h"
#include "host/sqlite_form.h"
#include "host/sqlite_reader.h"

namespace zr::host {

namespace {

// One kind of server; without a maker it is not part of this build.
struct ServerKind {
    const char* name;
    DBTypes kind;
    std::vector<std::string_view> schemes;
    std::unique_ptr<CatalogReader> (*make)(CatalogUrl, const CString&);
};

const std::vector<ServerKind>& serverKinds() {
    static const std::vector<ServerKind> kinds = {
#ifdef ZR_WITH_POSTGRESQL
        {"PostgreSQL", DB_POSTGRESQL, {"postgresql", "postgres"}, postgresqlReader},
#else
        {"PostgreSQL", DB_POSTGRESQL, {"postgresql", "postgres"}, nullptr},
#endif
#ifdef ZR_WITH_MYSQL
        {"MySQL and MariaDB", DB_MYSQL, {"mysql", "mariadb"}, mysqlReader},
#else
        {"MySQL and MariaDB", DB_MYSQL, {"mysql", "mariadb"}, nullptr},
#endif
    };
    return kinds;
}

const ServerKind* kindOf(const std::string& scheme) {
    for (const ServerKind& kind : serverKinds())
        if (std::find(kind.schemes.begin(), kind.schemes.end(), scheme) != kind.schemes.end()) return &kind;
    return nullptr;
}

std::unique_ptr<CatalogReader> readerForServer(const std::string& word, const CString& schema) {
    CatalogUrl url = parseUrl(word);
    if (const ServerKind* kind = kindOf(url.scheme)) {
        if (kind->make) return kind->make(std::move(url), schema);
        throw CatalogReadError(url.shown() + ": this program was built without the reader of " + kind->name);
    }
    std::string known;
    for (const ServerKind& kind : serverKinds())
        for (const std::string_view scheme : kind.schemes)
            known += (known.empty() ? "" : ", ") + std::string(scheme) + "://";
    throw CatalogReadError(url.shown() + ": no server is read by such an address; there are " + known);
}

// A file of such a name that is something else is told as that, and not as a bad dump.
bool hasAccessName(const std::string& path) {
    const CString ending(std::filesystem::path(path).extension().string().c_str());
    return std::filesystem::exists(path) && (ending.EqualsNoCase(u".mdb") || ending.EqualsNoCase(u".accdb"));
}

}  // namespace

std::unique_ptr<CatalogReader> readerFor(const std::string& source, const CString& schema) {
    if (isUrl(source)) return readerForServer(source, schema);
    try {
        if (isSqliteFile(source)) return std::make_unique<SqliteReader>(source);
        if (isAccessFile(source)) return std::make_unique<AccessReader>(source);
        if (hasAccessName(source)) throw CatalogReadError(source + ": is no database of MS Access");
        return std::make_unique<DumpReader>(source, readFile(source));
    } catch (const FileError& error) {
        throw CatalogReadError(error.what());
    }
}

std::optional<DBTypes> kindOfSource(const std::string& source) {
    if (!isUrl(source) && isAccessFile(source)) return DB_MSACCESS;
    const ServerKind* const kind = isUrl(source) ? kindOf(parseUrl(source).scheme) : nullptr;
    return kind ? std::optional(kind->kind) : std::nullopt;
}

std::vector<std::string> catalogReaders() {
    std::vector<std::string> names = {"SQLite", "CSV", "JSON", "MS Access (where mdbtools is installed)"};
    for (const ServerKind& kind : serverKinds())
        if (kind.make) names.emplace_back(kind.name);
    return names;
}

std::string onOneLine(std::string_view text) {
    std::string line;
    for (const char unit : text) {
        const bool isBlank = unit == ' ' || unit == '\t' || unit == '\n' || unit == '\r';
        if (!isBlank)
            line += unit;
        else if (!line.empty() && line.back() != ' ')
            line += ' ';
    }
    while (!line.empty() && line.back() == ' ') line.pop_back();
    return line;
}

}  // namespace zr::host
