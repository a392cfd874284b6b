#include <libpq-fe.h>
#include <poll.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstdlib>
#include <cstring>
#include <functional>

#include "host/catalog_cells.h"
#include "host/server_readers.h"

namespace zr::host {

namespace {

using Clock = std::chrono::steady_clock;
using Result = std::unique_ptr<PGresult, void (*)(PGresult*)>;

// A statement that the server refused; the connection goes on.
class RefusedStatement : public CatalogReadError {
 public:
    using CatalogReadError::CatalogReadError;
};

class Connection {
 public:
    Connection(const CatalogUrl& url, const ServerSettings& settings)
        : shown_(url.shown()), settings_(settings) {
        const std::string seconds = std::to_string(settings.connectSeconds);
        const bool isToldElsewhere = !settings.tellsConnectSeconds && std::getenv("PGCONNECT_TIMEOUT");
        const std::string text = url.text();
        // What stands before the address is overridden by it, what stands behind overrides.
        const char* const names[] = {"fallback_application_name",
                                     "tcp_user_timeout",
                                     "dbname",
                                     "client_encoding",
                                     isToldElsewhere ? nullptr : "connect_timeout",
                                     nullptr};
        const char* const values[] = {"zrsql", "30000", text.c_str(), "UTF8", seconds.c_str(), nullptr};
        handle_ = PQconnectdbParams(names, values, 1);
        if (PQstatus(handle_) == CONNECTION_OK) return;
        std::string why = onOneLine(PQerrorMessage(handle_));
        if (PQconnectionNeedsPassword(handle_)) why += "; it is taken from PGPASSWORD or ~/.pgpass";
        PQfinish(handle_);
        throw CatalogReadError(shown_ + ": " + why);
    }
    ~Connection() { PQfinish(handle_); }
    Connection(const Connection&) = delete;
    Connection& operator=(const Connection&) = delete;

    // What is done next, for messages.
    void begin(const char* what) { what_ = what; }
    // Called now and then while the server is waited for; what it raises ends the waiting.
    std::function<void()> look = [] {};

    // Raises RefusedStatement, or CatalogReadError when the connection is gone.
    void each(const std::string& sql, const std::vector<std::string>& values,
              const std::function<void(const Cells&)>& take) {
        std::vector<const char*> texts;
        texts.reserve(values.size());
        for (const std::string& value : values) texts.push_back(value.c_str());
        if (!PQsendQueryParams(handle_, sql.c_str(), static_cast<int>(texts.size()), nullptr, texts.data(),
                               nullptr, nullptr, 0))
            failForGood();
        const Result result = waitForResult();
        const ExecStatusType status = PQresultStatus(result.get());
        if (status != PGRES_TUPLES_OK && status != PGRES_COMMAND_OK) fail(*result);
        Cells cells(static_cast<std::size_t>(PQnfields(result.get())));
        for (int row = 0; row < PQntuples(result.get()); ++row) {
            for (int column = 0; column < PQnfields(result.get()); ++column) {
                std::optional<std::string>& cell = cells[static_cast<std::size_t>(column)];
                cell.reset();
                if (!PQgetisnull(result.get(), row, column))
                    cell.emplace(PQgetvalue(result.get(), row, column),
                                 static_cast<std::size_t>(PQgetlength(result.get(), row, column)));
            }
            take(cells);
        }
    }
    void run(const std::string& sql) {
        each(sql, {}, [](const Cells&) {});
    }
    std::string quoted(const std::string& text) {
        const std::unique_ptr<char, void (*)(void*)> literal(
            PQescapeLiteral(handle_, text.data(), text.size()), PQfreemem);
        if (!literal) failForGood();
        return literal.get();
    }
    std::string user() const { return PQuser(handle_); }
    const std::string& shown() const { return shown_; }

 private:
    // A server that is still there ends a statement in time; so what takes longer is a server that is not.
    Result waitForResult() {
        constexpr std::chrono::seconds kGrace(5);
        constexpr std::chrono::milliseconds kLook(100);
        const auto deadline = Clock::now() + std::chrono::seconds(settings_.statementSeconds) + kGrace;
        while (PQflush(handle_) == 1 || PQisBusy(handle_)) {
            const auto left = std::chrono::duration_cast<std::chrono::milliseconds>(deadline - Clock::now());
            if (left.count() <= 0)
                throw CatalogReadError(shown_ + ": while " + what_ + ": the server does not answer");
            pollfd wanted{PQsocket(handle_), POLLIN, 0};
            if (PQflush(handle_) == 1) wanted.events |= POLLOUT;
            look();
            if (poll(&wanted, 1, static_cast<int>(std::min(left, kLook).count())) < 0 && errno != EINTR)
                throw CatalogReadError(shown_ + ": while " + what_ + ": " + std::strerror(errno));
            if (!PQconsumeInput(handle_)) failForGood();
        }
        Result first(PQgetResult(handle_), PQclear);
        if (!first) failForGood();
        while (PGresult* rest = PQgetResult(handle_)) PQclear(rest);
        return first;
    }

    [[noreturn]] void fail(PGresult& result) {
        if (PQstatus(handle_) != CONNECTION_OK) failForGood();
        const char* const message = PQresultErrorField(&result, PG_DIAG_MESSAGE_PRIMARY);
        throw RefusedStatement(shown_ + ": while " + what_ + ": " +
                               onOneLine(message ? message : PQerrorMessage(handle_)));
    }
    [[noreturn]] void failForGood() {
        throw CatalogReadError(shown_ + ": while " + what_ + ": " + onOneLine(PQerrorMessage(handle_)));
    }

    std::string shown_;
    ServerSettings settings_;
    std::string what_ = "the transaction was begun";
    PGconn* handle_ = nullptr;
};

std::string arrayOf(const std::vector<std::string>& words) {
    std::string text = "{";
    for (const std::string& word : words) {
        if (text.size() > 1) text += ',';
        text += '"';
        for (const char unit : word) {
            if (unit == '"' || unit == '\\') text += '\\';
            text += unit;
        }
        text += '"';
    }
    return text + "}";
}

constexpr std::size_t kViewsTogether = 100;

// A view that stands in the rows; its name is for messages.
struct NamedView {
    std::size_t row;
    std::string name;
    std::string id;
};

class PostgresqlReader : public CatalogReader {
 public:
    PostgresqlReader(CatalogUrl url, const CString& schema) : url_(std::move(url)) {
        settings_ = takeSettings(url_, schema);
    }

    CString schema() const override { return CString::fromUtf8(settings_.schema); }

    using CatalogReader::read;
    void read(CatalogRows& rows, const CatalogReading& reading) override {
        reading.tell(rows);
        Connection connection(url_, settings_);
        connection.look = [&] { reading.tell(rows); };
        connection.run("BEGIN TRANSACTION ISOLATION LEVEL REPEATABLE READ READ ONLY");
        connection.run("SET LOCAL statement_timeout = '" + std::to_string(settings_.statementSeconds) + "s'");
        connection.run("SET LOCAL lock_timeout = '" + std::to_string(settings_.lockSeconds) + "s'");
        const std::vector<std::string> schemas = readSchemas(connection, rows);
        if (!schemas.empty()) {
            const std::string wanted = arrayOf(schemas);
            // The names of these schemas' tables are printed without the schema where that is clear.
            std::string path;
            for (const std::string& schema : schemas)
                path += (path.empty() ? "" : ", ") + connection.quoted(schema);
            connection.run("SET LOCAL search_path = " + path);
            readColumns(connection, rows, wanted);
            readKeys(connection, rows, wanted);
            readFunctions(connection, rows, wanted);
            const std::vector<NamedView> views = nameViews(connection, rows, wanted);
            rows.isWholeButViews = true;
            readTexts(connection, rows, reading, views);
        }
        connection.run("COMMIT");
    }

 private:
    std::vector<std::string> readSchemas(Connection& connection, CatalogRows& rows) {
        connection.begin("schemas were read");
        std::vector<std::string> schemas;
        bool isThere = false;
        std::string others;
        connection.each(
            "SELECT nspname, has_schema_privilege(oid, 'USAGE') FROM pg_catalog.pg_namespace "
            "WHERE nspname !~ '^pg_' AND nspname <> 'information_schema' ORDER BY nspname",
            {}, [&](const Cells& cells) {
                const std::string& name = *cells[0];
                const bool isAllowed = cells[1] == "t";
                if (!settings_.schema.empty() && name != settings_.schema) {
                    others += (others.empty() ? "" : ", ") + name;
                    return;
                }
                isThere = true;
                if (isAllowed)
                    schemas.push_back(name);
                else
                    rows.notes.push_back(connection.shown() + ": schema " + name + ": left out; the user " +
                                         connection.user() + " has no right to use it");
            });
        if (!isThere && !settings_.schema.empty())
            throw CatalogReadError(connection.shown() + ": there is no schema \"" + settings_.schema +
                                   "\"; there " + (others.empty() ? "is none" : "are " + others));
        return schemas;
    }

    static void readColumns(Connection& connection, CatalogRows& rows, const std::string& schemas) {
        connection.begin("columns were read");
        connection.each(
            "SELECT n.nspname, c.relname, a.attname, pg_catalog.format_type(a.atttypid, a.atttypmod), "
            "a.attnum "
            "FROM pg_catalog.pg_class c JOIN pg_catalog.pg_namespace n ON n.oid = c.relnamespace "
            "LEFT JOIN pg_catalog.pg_attribute a ON a.attrelid = c.oid AND a.attnum > 0 AND NOT "
            "a.attisdropped "
            "WHERE c.relkind IN ('r', 'p', 'f') AND n.nspname = ANY ($1::pg_catalog.name[]) "
            "ORDER BY n.nspname, c.oid, a.attnum",
            {schemas}, [&](const Cells& cells) { rows.columns.push_back(columnIn(cells)); });
    }

    // Primary keys and all unique indexes over whole rows and plain columns; then foreign keys.
    static void readKeys(Connection& connection, CatalogRows& rows, const std::string& schemas) {
        connection.begin("keys were read");
        connection.each(
            "SELECT CASE WHEN i.indisprimary THEN 'p' ELSE 'u' END, n.nspname, c.relname, x.relname, "
            "a.attname, k.place, NULL, NULL "
            "FROM pg_catalog.pg_index i JOIN pg_catalog.pg_class c ON c.oid = i.indrelid "
            "JOIN pg_catalog.pg_class x ON x.oid = i.indexrelid "
            "JOIN pg_catalog.pg_namespace n ON n.oid = c.relnamespace "
            "CROSS JOIN LATERAL pg_catalog.unnest(i.indkey) WITH ORDINALITY k(attnum, place) "
            "JOIN pg_catalog.pg_attribute a ON a.attrelid = c.oid AND a.attnum = k.attnum "
            "WHERE i.indisunique AND i.indpred IS NULL AND i.indexprs IS NULL AND k.place <= i.indnkeyatts "
            "AND c.relkind IN ('r', 'p') AND n.nspname = ANY ($1::pg_catalog.name[]) "
            "UNION ALL "
            "SELECT 'f', n.nspname, c.relname, o.conname, a.attname, k.place, r.relname, f.attname "
            "FROM pg_catalog.pg_constraint o JOIN pg_catalog.pg_class c ON c.oid = o.conrelid "
            "JOIN pg_catalog.pg_namespace n ON n.oid = c.relnamespace "
            "JOIN pg_catalog.pg_class r ON r.oid = o.confrelid "
            "CROSS JOIN LATERAL ROWS FROM (pg_catalog.unnest(o.conkey), pg_catalog.unnest(o.confkey)) "
            "WITH ORDINALITY k(own, other, place) "
            "JOIN pg_catalog.pg_attribute a ON a.attrelid = o.conrelid AND a.attnum = k.own "
            "JOIN pg_catalog.pg_attribute f ON f.attrelid = o.confrelid AND f.attnum = k.other "
            "WHERE o.contype = 'f' AND n.nspname = ANY ($1::pg_catalog.name[]) "
            "ORDER BY 2, 3, 1, 4, 6",
            {schemas}, [&](const Cells& cells) { rows.keys.push_back(keyIn(cells, "p", "u")); });
    }

    static void readFunctions(Connection& connection, CatalogRows& rows, const std::string& schemas) {
        connection.begin("functions were read");
        connection.each(
            "SELECT n.nspname, p.proname, p.pronargs FROM pg_catalog.pg_proc p "
            "JOIN pg_catalog.pg_namespace n ON n.oid = p.pronamespace "
            "WHERE p.prokind <> 'p' AND n.nspname = ANY ($1::pg_catalog.name[]) "
            "ORDER BY n.nspname, p.proname, p.pronargs",
            {schemas}, [&](const Cells& cells) { rows.functions.push_back(functionIn(cells)); });
    }

    static std::vector<NamedView> nameViews(Connection& connection, CatalogRows& rows,
                                            const std::string& schemas) {
        connection.begin("views were read");
        std::vector<NamedView> views;
        connection.each(
            "SELECT n.nspname, c.relname, c.oid FROM pg_catalog.pg_class c JOIN pg_catalog.pg_namespace n "
            "ON n.oid = c.relnamespace WHERE c.relkind IN ('v', 'm') AND n.nspname = ANY "
            "($1::pg_catalog.name[]) ORDER BY n.nspname, c.oid",
            {schemas}, [&](const Cells& cells) {
                views.push_back({rows.views.size(), cells[0].value_or("") + "." + cells[1].value_or(""),
                                 cells[2].value_or("")});
                rows.views.push_back({textIn(cells[0]), textIn(cells[1]), std::nullopt, true});
            });
        return views;
    }

    // To print a view the server waits for whoever alters what it reads, so one view may fail alone: where
    // several together fail they are asked for one by one.
    static void readTexts(Connection& connection, CatalogRows& rows, const CatalogReading& reading,
                          const std::vector<NamedView>& views) {
        std::vector<NamedView> wanted;
        for (const NamedView& view : views)
            if (reading.wants(rows.views[view.row].name)) wanted.push_back(view);
        std::vector<std::size_t> refused;
        for (std::size_t at = 0; at < wanted.size(); at += kViewsTogether) {
            const auto first = wanted.begin() + static_cast<std::ptrdiff_t>(at);
            const auto last =
                wanted.begin() + static_cast<std::ptrdiff_t>(std::min(at + kViewsTogether, wanted.size()));
            connection.begin("views were read");
            if (!readTextsOf(connection, rows, {first, last}).empty()) {
                connection.run("SET LOCAL lock_timeout = '1s'");
                for (auto view = first; view != last; ++view) {
                    reading.tell(rows);
                    const std::string what = "view " + view->name + " was read";
                    connection.begin(what.c_str());
                    const std::string why = readTextsOf(connection, rows, {*view});
                    if (why.empty()) continue;
                    rows.notes.push_back(why + "; it is left out");
                    refused.push_back(view->row);
                }
            }
            reading.tell(rows);
        }
        for (auto row = refused.rbegin(); row != refused.rend(); ++row)
            rows.views.erase(rows.views.begin() + static_cast<std::ptrdiff_t>(*row));
    }

    // Empty, or why the server refuses; then none is read.
    static std::string readTextsOf(Connection& connection, CatalogRows& rows,
                                   const std::vector<NamedView>& views) {
        std::vector<std::string> ids;
        ids.reserve(views.size());
        for (const NamedView& view : views) ids.push_back(view.id);
        connection.run("SAVEPOINT texts");
        std::string why;
        try {
            connection.each(
                "SELECT v.place, pg_catalog.pg_get_viewdef(v.id, true) FROM "
                "pg_catalog.unnest($1::pg_catalog.oid[]) WITH ORDINALITY v(id, place)",
                {arrayOf(ids)}, [&](const Cells& cells) {
                    CatalogRows::View& view =
                        rows.views[views[static_cast<std::size_t>(numberIn(cells[0])) - 1].row];
                    view.text = textIn(cells[1]);
                    view.isOpen = false;
                });
        } catch (const RefusedStatement& refused) {
            why = refused.what();
            connection.run("ROLLBACK TO SAVEPOINT texts");
        }
        connection.run("RELEASE SAVEPOINT texts");
        return why;
    }

    CatalogUrl url_;
    ServerSettings settings_;
};

}  // namespace

std::unique_ptr<CatalogReader> postgresqlReader(CatalogUrl url, const CString& schema) {
    return std::make_unique<PostgresqlReader>(std::move(url), schema);
}

}  // namespace zr::host
