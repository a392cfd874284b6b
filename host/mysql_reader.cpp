#include <mysql.h>

#include <algorithm>
#include <functional>
#include <set>

#include "host/catalog_cells.h"
#include "host/server_readers.h"

namespace zr::host {

namespace {

class Connection {
 public:
    Connection(const CatalogUrl& url, const ServerSettings& settings, const std::string& socket)
        : shown_(url.shown()), handle_(mysql_init(nullptr)) {
        if (!handle_) throw CatalogReadError(shown_ + ": out of memory");
        const std::string user = url.user();
        const std::string host = url.host();
        const unsigned port = url.port();
        // A server that is still there ends a statement in time; so what takes longer is a server that is
        // not.
        constexpr unsigned kGraceSeconds = 5;
        const unsigned answerSeconds = settings.statementSeconds + kGraceSeconds;
        mysql_options(handle_, MYSQL_OPT_CONNECT_TIMEOUT, &settings.connectSeconds);
        mysql_options(handle_, MYSQL_OPT_READ_TIMEOUT, &answerSeconds);
        mysql_options(handle_, MYSQL_OPT_WRITE_TIMEOUT, &answerSeconds);
        mysql_options(handle_, MYSQL_READ_DEFAULT_GROUP, "client");
        mysql_options(handle_, MYSQL_SET_CHARSET_NAME, "utf8mb4");
        const auto orNone = [](const std::string& text) { return text.empty() ? nullptr : text.c_str(); };
        if (mysql_real_connect(handle_, orNone(host), orNone(user), nullptr, nullptr, port, orNone(socket),
                               0))
            return;
        std::string why = onOneLine(mysql_error(handle_));
        if (why.ends_with("(using password: NO)"))
            why += "; it is taken from MYSQL_PWD or the group [client] of ~/.my.cnf";
        mysql_close(handle_);
        throw CatalogReadError(shown_ + ": " + why);
    }
    ~Connection() { mysql_close(handle_); }
    Connection(const Connection&) = delete;
    Connection& operator=(const Connection&) = delete;

    // What is done next, for messages.
    void begin(const char* what) { what_ = what; }

    void each(const std::string& sql, const std::function<void(const Cells&)>& take) {
        if (mysql_real_query(handle_, sql.data(), sql.size()) != 0) fail();
        const std::unique_ptr<MYSQL_RES, void (*)(MYSQL_RES*)> result(mysql_store_result(handle_),
                                                                      mysql_free_result);
        if (!result) {
            if (mysql_errno(handle_) != 0) fail();
            return;
        }
        Cells cells(mysql_num_fields(result.get()));
        while (const MYSQL_ROW row = mysql_fetch_row(result.get())) {
            const unsigned long* const lengths = mysql_fetch_lengths(result.get());
            for (std::size_t at = 0; at < cells.size(); ++at) {
                cells[at].reset();
                if (row[at]) cells[at].emplace(row[at], lengths[at]);
            }
            take(cells);
        }
    }
    void run(const std::string& sql) {
        each(sql, [](const Cells&) {});
    }
    std::string quoted(const std::string& text) {
        std::string escaped(2 * text.size() + 1, '\0');
        escaped.resize(mysql_real_escape_string(handle_, escaped.data(), text.data(), text.size()));
        return "'" + escaped + "'";
    }
    bool isMariaDb() {
        return std::string(mysql_get_server_info(handle_)).find("MariaDB") != std::string::npos;
    }
    const std::string& shown() const { return shown_; }

 private:
    [[noreturn]] void fail() {
        throw CatalogReadError(shown_ + ": while " + what_ + ": " + onOneLine(mysql_error(handle_)));
    }

    std::string shown_;
    std::string what_ = "the transaction was begun";
    MYSQL* handle_;
};

constexpr std::size_t kViewsTogether = 50;

class MysqlReader : public CatalogReader {
 public:
    MysqlReader(CatalogUrl url, const CString& schema) : url_(std::move(url)) {
        settings_ = takeSettings(url_, schema);
        socket_ = url_.take("socket").value_or(std::string());
        if (!url_.parameters.empty())
            throw CatalogReadError(url_.shown() + ": there is no parameter \"" +
                                   url_.parameters.front().first +
                                   "\"; there are schema, connect_timeout, statement_timeout and socket");
        if (settings_.schema.empty()) settings_.schema = decodeUrl(url_.database);
    }

    CString schema() const override { return CString::fromUtf8(settings_.schema); }

    using CatalogReader::read;
    void read(CatalogRows& rows, const CatalogReading& reading) override {
        reading.tell(rows);
        Connection connection(url_, settings_, socket_);
        const std::string seconds = std::to_string(settings_.statementSeconds);
        connection.run(connection.isMariaDb() ? "SET SESSION max_statement_time = " + seconds
                                              : "SET SESSION max_execution_time = " + seconds + "000");
        connection.run("SET SESSION lock_wait_timeout = " + std::to_string(settings_.lockSeconds));
        connection.run("START TRANSACTION WITH CONSISTENT SNAPSHOT, READ ONLY");
        for (const std::string& schema : schemasToRead(connection)) {
            const std::string wanted = connection.quoted(schema);
            readColumns(connection, rows, wanted);
            readKeys(connection, rows, wanted);
            readFunctions(connection, rows, wanted);
            nameViews(connection, rows, wanted);
            reading.tell(rows);
        }
        rows.isWholeButViews = true;
        readTexts(connection, rows, reading);
        connection.run("COMMIT");
    }

 private:
    std::vector<std::string> schemasToRead(Connection& connection) const {
        connection.begin("schemas were read");
        std::vector<std::string> schemas;
        std::string others;
        connection.each(
            "SELECT SCHEMA_NAME FROM information_schema.SCHEMATA WHERE SCHEMA_NAME NOT IN "
            "('information_schema', 'performance_schema', 'mysql', 'sys') ORDER BY SCHEMA_NAME",
            [&](const Cells& cells) {
                const std::string name = cells[0].value_or(std::string());
                if (settings_.schema.empty() || name == settings_.schema)
                    schemas.push_back(name);
                else
                    others += (others.empty() ? "" : ", ") + name;
            });
        if (schemas.empty())
            throw CatalogReadError(connection.shown() + ": there is no schema" +
                                   (settings_.schema.empty() ? "" : " \"" + settings_.schema + "\"") +
                                   " that the user may see" +
                                   (others.empty() ? "" : "; there are " + others));
        return schemas;
    }

    static void readColumns(Connection& connection, CatalogRows& rows, const std::string& schema) {
        connection.begin("columns were read");
        std::set<std::optional<std::string>> tables;
        connection.each(
            "SELECT TABLE_NAME FROM information_schema.TABLES WHERE TABLE_TYPE NOT IN ('VIEW', 'SYSTEM "
            "VIEW', "
            "'SEQUENCE') AND TABLE_SCHEMA = " +
                schema,
            [&](const Cells& cells) { tables.insert(cells[0]); });
        connection.each(
            "SELECT TABLE_SCHEMA, TABLE_NAME, COLUMN_NAME, COLUMN_TYPE, ORDINAL_POSITION FROM "
            "information_schema.COLUMNS WHERE TABLE_SCHEMA = " +
                schema + " ORDER BY TABLE_NAME, ORDINAL_POSITION",
            [&](const Cells& cells) {
                if (!tables.contains(cells[1])) return;
                rows.columns.push_back(columnIn(cells));
            });
    }

    static void readKeys(Connection& connection, CatalogRows& rows, const std::string& schema) {
        connection.begin("keys were read");
        connection.each(
            "SELECT c.CONSTRAINT_TYPE, k.TABLE_SCHEMA, k.TABLE_NAME, k.CONSTRAINT_NAME, k.COLUMN_NAME, "
            "k.ORDINAL_POSITION, k.REFERENCED_TABLE_NAME, k.REFERENCED_COLUMN_NAME "
            "FROM information_schema.KEY_COLUMN_USAGE k JOIN information_schema.TABLE_CONSTRAINTS c "
            "ON c.TABLE_SCHEMA = k.TABLE_SCHEMA AND c.TABLE_NAME = k.TABLE_NAME "
            "AND c.CONSTRAINT_NAME = k.CONSTRAINT_NAME "
            "WHERE k.TABLE_SCHEMA = " +
                schema + " AND c.TABLE_SCHEMA = " + schema +
                " ORDER BY k.TABLE_NAME, k.CONSTRAINT_NAME, k.ORDINAL_POSITION",
            [&](const Cells& cells) { rows.keys.push_back(keyIn(cells, "PRIMARY KEY", "UNIQUE")); });
    }

    static void readFunctions(Connection& connection, CatalogRows& rows, const std::string& schema) {
        connection.begin("functions were read");
        connection.each(
            "SELECT r.ROUTINE_SCHEMA, r.ROUTINE_NAME, (SELECT COUNT(*) FROM information_schema.PARAMETERS p "
            "WHERE p.SPECIFIC_SCHEMA = r.ROUTINE_SCHEMA AND p.SPECIFIC_NAME = r.SPECIFIC_NAME AND "
            "p.ORDINAL_POSITION > 0) FROM information_schema.ROUTINES r WHERE r.ROUTINE_TYPE = 'FUNCTION' "
            "AND "
            "r.ROUTINE_SCHEMA = " +
                schema + " ORDER BY r.ROUTINE_NAME",
            [&](const Cells& cells) { rows.functions.push_back(functionIn(cells)); });
    }

    static void nameViews(Connection& connection, CatalogRows& rows, const std::string& schema) {
        connection.begin("views were read");
        connection.each(
            "SELECT TABLE_SCHEMA, TABLE_NAME FROM information_schema.TABLES WHERE TABLE_TYPE = 'VIEW' AND "
            "TABLE_SCHEMA = " +
                schema + " ORDER BY TABLE_NAME",
            [&](const Cells& cells) {
                rows.views.push_back({textIn(cells[0]), textIn(cells[1]), std::nullopt, true});
            });
    }

    // A view that is asked for by its name is looked up; a list of names would go through the schema.
    static void readTexts(Connection& connection, CatalogRows& rows, const CatalogReading& reading) {
        connection.begin("views were read");
        std::vector<std::size_t> wanted;
        for (std::size_t at = 0; at < rows.views.size(); ++at)
            if (rows.views[at].isOpen && reading.wants(rows.views[at].name)) wanted.push_back(at);
        std::vector<std::size_t> untold;
        for (std::size_t at = 0; at < wanted.size(); at += kViewsTogether) {
            const std::size_t end = std::min(at + kViewsTogether, wanted.size());
            std::string sql;
            for (std::size_t each = at; each < end; ++each) {
                const CatalogRows::View& view = rows.views[wanted[each]];
                sql += (sql.empty() ? "" : " UNION ALL ") + ("SELECT " + std::to_string(wanted[each])) +
                       ", VIEW_DEFINITION FROM information_schema.VIEWS WHERE TABLE_SCHEMA = " +
                       connection.quoted(view.schema.toUtf8()) +
                       " AND TABLE_NAME = " + connection.quoted(view.name.toUtf8());
            }
            connection.each(sql, [&](const Cells& cells) {
                CatalogRows::View& view = rows.views[static_cast<std::size_t>(numberIn(cells[0]))];
                if (!cells[1].value_or(std::string()).empty()) view.text = textIn(cells[1]);
            });
            for (std::size_t each = at; each < end; ++each) {
                CatalogRows::View& view = rows.views[wanted[each]];
                view.isOpen = !view.text;
                if (view.text) continue;
                rows.notes.push_back(connection.shown() + ": view " + view.name.toUtf8() +
                                     ": left out; the server does not tell its text, for which the "
                                     "user needs the right SHOW VIEW");
                untold.push_back(wanted[each]);
            }
            reading.tell(rows);
        }
        for (auto row = untold.rbegin(); row != untold.rend(); ++row)
            rows.views.erase(rows.views.begin() + static_cast<std::ptrdiff_t>(*row));
    }

    CatalogUrl url_;
    ServerSettings settings_;
    std::string socket_;
};

}  // namespace

std::unique_ptr<CatalogReader> mysqlReader(CatalogUrl url, const CString& schema) {
    return std::make_unique<MysqlReader>(std::move(url), schema);
}

}  // namespace zr::host
