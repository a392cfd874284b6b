#pragma once

#include <functional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <unordered_set>
#include <vector>

#include "host/from_sources.h"
#include "zrparsersql/database_info.h"

namespace zr::host {

// Why a column's origin is not a column of a table that the database knows.
enum class Unknown {
    No,             // it is one
    Source,         // the database has no table or query of that name
    Columns,        // the database does not tell the table's columns
    Column,         // the table or query has no such column
    Qualifier,      // no source of the query has that name
    Ambiguous,      // several sources have, or may have, the column
    Nowhere,        // no source has the column
    InRing,         // the query reads from itself
    PartOfText,     // the query's text was not read to its end: more may stand there
    PartOfAnalysis  // the analysis of the query ended in its first clause
};

// What a person is told of it; empty for Unknown::No.
std::string_view explain(Unknown why);

// A column of a source, by the source's own names where the database knows it.
struct ColumnOrigin {
    CString source;  // empty: open which
    CString column;  // "*" for columns that can't be told; empty for none in particular
    Unknown why = Unknown::No;
    const CZRSourceInfo* object = nullptr;  // the table or stored query, where the database knows it

    bool isKnown() const { return why == Unknown::No; }
    bool operator==(const ColumnOrigin&) const = default;
};
using ColumnOrigins = std::vector<ColumnOrigin>;

struct ResultColumn {
    CString name;                  // "-" for a column without one
    const SelectItem* expression;  // null for a column that a "*" stands for
    ColumnOrigins origins;         // followed to the columns of tables
    ColumnOrigins steps;           // the same, but followed no further than the next stored query
};

// A column that is read elsewhere than in a select list.
struct ColumnUse {
    std::string_view clause;  // "from" (a join's condition), "where", "group by", ..., "sub-query"
    ColumnOrigins origins;
    ColumnOrigins steps;
};

// Follows the result columns of analysed queries to the columns of tables that they are made of: through
// queries of the database, nested queries and the branches of unions. Each "*" becomes the columns that it
// stands for, as far as the database knows them. A nested query sees the sources of those around it. Works on
// queries of any depth; each is followed once. Not for several threads.
class ColumnTracer {
 public:
    using Columns = std::vector<ResultColumn>;

    // What a name means in the database: a table, else a query, or neither.
    struct Meaning {
        CZRTableInfo* table = nullptr;
        const CZRQueryInfo* query = nullptr;
    };

    // Tells whether the text of a stored query was read to its end. One that was not may read more than is
    // known: each of its columns gets an origin that says so.
    using IsReadWhole = std::function<bool(const CZRQueryInfo&)>;

    // The database is to stay as it is for as long as the object lives.
    explicit ColumnTracer(CZRDatabaseInfo& database, IsReadWhole isReadWhole = {});

    const Columns& columnsOf(const CZRQueryInfo& query);
    // What the query reads beside its result columns, nested queries included, each once.
    std::vector<ColumnUse> usesOf(const CZRQueryInfo& query);
    // The tables and stored queries that it names in a FROM clause, its own or a nested query's.
    std::vector<const CZRSourceInfo*> objectsReadBy(const CZRQueryInfo& query);
    Meaning meaningOf(const CZRQueryInfo& query, const CString& source);
    // Why more may stand in a stored query than is known of it: No, PartOfText or PartOfAnalysis.
    Unknown missingOf(const CZRQueryInfo& query) const;

 private:
    // A source of a FROM clause, with what it is: a table, a query, or neither of them known.
    struct Source {
        CString name;
        CString alias;
        CZRTableInfo* table = nullptr;
        const CZRQueryInfo* query = nullptr;
        bool isStored = false;  // the query is one of the database

        // Whether it can be told that it lacks a column.
        bool isOpen() const { return table ? table->Fields.IsEmpty() : !query; }
    };
    using Sources = std::vector<Source>;

    struct Origins {
        ColumnOrigins ends;
        ColumnOrigins steps;
    };

    const Sources& sourcesOf(const CZRQueryInfo& query);
    bool isAliasOfLast(const Sources& sources) const;
    // Notes what is nested where. Gives the query and all nested ones.
    std::vector<const CZRQueryInfo*> adopt(const CZRQueryInfo& query);
    std::vector<const CZRQueryInfo*> queriesBehind(const CZRQueryInfo& query);
    const Columns* tracedColumns(const CZRQueryInfo& query) const;

    Columns trace(const CZRQueryInfo& query);
    void addStar(Columns& columns, const Sources& sources, const CString& qualifier);
    void addStarOf(Columns& columns, const Source& source);
    void addBranches(Columns& columns, const CZRQueryInfo& query);
    void markPart(Columns& columns, const CZRQueryInfo& query);
    ResultColumn columnOf(const SelectItem& item, const CZRQueryInfo& query);
    void addOriginsIn(Origins& origins, const SelectItem& expression, const CZRQueryInfo& query);

    Origins originsOf(const SelectItemField& field, const CZRQueryInfo& query);
    Origins qualified(const CString& qualifier, const CString& column, const CZRQueryInfo& query);
    Origins unqualified(const CString& column, const CZRQueryInfo& query);
    CString withoutCast(const CString& name) const;
    Origins originsIn(const Source& source, const CString& column);
    const CZRQueryInfo* queryAround(const CZRQueryInfo& query) const;
    const ResultColumn* findColumn(const CZRQueryInfo& query, const CString& name) const;
    bool hasColumn(const Source& source, const CString& name) const;

    CZRDatabaseInfo& database_;
    IsReadWhole isReadWhole_;
    std::unordered_map<CString, Meaning> byId_;
    std::unordered_map<CString, Meaning> byName_;  // those that were looked up
    std::unordered_set<const CZRQueryInfo*> stored_;
    std::unordered_map<const CZRQueryInfo*, const CZRQueryInfo*> around_;  // of nested queries
    std::unordered_map<const CZRQueryInfo*, Sources> sources_;
    std::unordered_map<const CZRQueryInfo*, Columns> traced_;
};

}  // namespace zr::host
