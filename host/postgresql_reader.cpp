#include <libpq-fe.h>
#include <poll.h>

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

    // Raises RefusedStatement, or CatalogReadError when the connection is gone.
    void each(const std::string& sql, const std::vector<std::string>& values,
              const std::function<void(const Cells&)>& take) {
        std::vector<const char*> texts;
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
        const auto deadline = Clock::now() + std::chrono::seconds(settings_.statementSeconds) + kGrace;
        while (PQflush(handle_) == 1 || PQisBusy(handle_)) {
            const auto left = std::chrono::duration_cast<std::chrono::milliseconds>(deadline - Clock::now());
            if (left.count() <= 0)
                throw CatalogReadError(shown_ + ": while " + what_ + ": the server does not answer");
            pollfd wanted{PQsocket(handle_), POLLIN, 0};
            if (PQflush(handle_) == 1) wanted.events |= POLLOUT;
            if (poll(&wanted, 1, static_cast<int>(left.count())) < 0 && errno != EINTR)
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

class PostgresqlReader : public CatalogReader {
 public:
    PostgresqlReader(CatalogUrl url, const CString& schema) : url_(std::move(url)) {
        settings_ = takeSettings(url_, schema);
    }

    CString schema() const override { return CString::fromUtf8(settings_.schema); }

    void read(CatalogRows& rows) override {
        Connection connection(url_, settings_);
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
            readViews(connection, rows, wanted);
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

    // To print a view the server waits for whoever alters what it reads, so one view may fail alone: where
    // all together fail they are asked for one by one.
    static void readViews(Connection& connection, CatalogRows& rows, const std::string& schemas) {
        connection.begin("views were read");
        const std::string from =
            " FROM pg_catalog.pg_class c JOIN pg_catalog.pg_namespace n ON n.oid = c.relnamespace "
            "WHERE c.relkind IN ('v', 'm') AND n.nspname = ANY ($1::pg_catalog.name[]) ORDER BY n.nspname, "
            "c.oid";
        const auto take = [&](const Cells& cells) { rows.views.push_back(viewIn(cells)); };
        connection.run("SAVEPOINT texts");
        try {
            connection.each("SELECT n.nspname, c.relname, pg_catalog.pg_get_viewdef(c.oid, true)" + from,
                            {schemas}, take);
            return;
        } catch (const RefusedStatement&) {
            connection.run("ROLLBACK TO SAVEPOINT texts");
        }
        std::vector<Cells> views;
        connection.each("SELECT n.nspname, c.relname, c.oid" + from, {schemas},
                        [&](const Cells& cells) { views.push_back(cells); });
        connection.run("SET LOCAL lock_timeout = '1s'");
        for (const Cells& view : views) {
            const std::string name = view[0].value_or("") + "." + view[1].value_or("");
            const std::string what = "view " + name + " was read";
            connection.begin(what.c_str());
            connection.run("SAVEPOINT texts");
            try {
                connection.each("SELECT $1, $2, pg_catalog.pg_get_viewdef($3::pg_catalog.oid, true)",
                                {*view[0], *view[1], *view[2]}, take);
            } catch (const RefusedStatement& refused) {
                connection.run("ROLLBACK TO SAVEPOINT texts");
                rows.notes.push_back(std::string(refused.what()) + "; it is left out");
            }
        }
    }

    CatalogUrl url_;
    ServerSettings settings_;
};

}  // namespace

std::unique_ptr<CatalogReader> postgresqlReader(CatalogUrl url, const CString& schema) {
    return std::make_unique<PostgresqlReader>(std::move(url), schema);
}

}  // namespace zr::host
