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
    std::vector<std::string_view> schemes;
    std::unique_ptr<CatalogReader> (*make)(CatalogUrl);
};

const std::vector<ServerKind>& serverKinds() {
    static const std::vector<ServerKind> kinds = {
#ifdef ZR_WITH_POSTGRESQL
        {"PostgreSQL", {"postgresql", "postgres"}, postgresqlReader},
#else
        {"PostgreSQL", {"postgresql", "postgres"}, nullptr},
#endif
#ifdef ZR_WITH_MYSQL
        {"MySQL and MariaDB", {"mysql", "mariadb"}, mysqlReader},
#else
        {"MySQL and MariaDB", {"mysql", "mariadb"}, nullptr},
#endif
    };
    return kinds;
}

std::unique_ptr<CatalogReader> readerForServer(const std::string& word) {
    CatalogUrl url = parseUrl(word);
    std::string known;
    for (const ServerKind& kind : serverKinds())
        for (const std::string_view scheme : kind.schemes) {
            known += (known.empty() ? "" : ", ") + std::string(scheme) + "://";
            if (scheme != url.scheme) continue;
            if (!kind.make)
                throw CatalogReadError(url.shown() + ": this program was built without the reader of " +
                                       kind.name);
            return kind.make(std::move(url));
        }
    throw CatalogReadError(url.shown() + ": no server is read by such an address; there are " + known);
}

}  // namespace

std::unique_ptr<CatalogReader> readerFor(const std::string& source) {
    if (isUrl(source)) return readerForServer(source);
    try {
        if (isSqliteFile(source)) return std::make_unique<SqliteReader>(source);
        return std::make_unique<DumpReader>(source, readFile(source));
    } catch (const FileError& error) {
        throw CatalogReadError(error.what());
    }
}

std::vector<std::string> catalogReaders() {
    std::vector<std::string> names = {"SQLite", "CSV", "JSON"};
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
