#pragma once

#include <string>
#include <unordered_map>
#include <unordered_set>
#include <vector>

#include "from_sources.h"
#include "zrparsersql/database_info.h"

namespace zr::tool {

// A column of a source, by the source's own names where the database knows it.
struct ColumnOrigin {
    CString source;  // empty: open which
    CString column;
    bool isKnown = false;  // a column of a table of the database
    bool operator==(const ColumnOrigin&) const = default;
};

struct ResultColumn {
    CString name;                  // "-" for a column without one
    const SelectItem* expression;  // null for a column that a "*" stands for
    std::vector<ColumnOrigin> origins;
};

// Follows the result columns of analysed queries to the columns of tables that they are made of: through
// queries of the database, nested queries and the branches of unions. Each "*" becomes the columns that it
// stands for, as far as the database knows them. Works on queries of any depth; each is followed once.
class ColumnTracer {
 public:
    using Columns = std::vector<ResultColumn>;

    // What a name means in the database: a table, else a query, or neither.
    struct Meaning {
        CZRTableInfo* table = nullptr;
        const CZRQueryInfo* query = nullptr;
    };

    // The database is to stay as it is for as long as the object lives.
    explicit ColumnTracer(CZRDatabaseInfo& database);

    const Columns& columnsOf(const CZRQueryInfo& query);
    Meaning meaningOf(const CZRQueryInfo& query, const CString& source);

 private:
    // A source of a FROM clause, with what it is: a table, a query, or neither of them known.
    struct Source {
        CString name;
        CString alias;
        CZRTableInfo* table = nullptr;
        const CZRQueryInfo* query = nullptr;
    };
    using Sources = std::vector<Source>;

    Sources sourcesOf(const CZRQueryInfo& query);
    std::vector<const CZRQueryInfo*> queriesBehind(const CZRQueryInfo& query);
    Columns trace(const CZRQueryInfo& query);
    void addStar(Columns& columns, const Sources& sources, const CString& qualifier);
    void addStarOf(Columns& columns, const Source& source);
    void addBranches(Columns& columns, const CZRQueryInfo& query);
    ResultColumn columnOf(const SelectItem& item, const Sources& sources);
    std::vector<ColumnOrigin> originsOf(const SelectItemField& field, const Sources& sources);
    std::vector<ColumnOrigin> originsIn(const Source& source, const CString& column);
    const ResultColumn* findColumn(const CZRQueryInfo& query, const CString& name);
    bool hasColumn(const Source& source, const CString& name);

    CZRDatabaseInfo& database_;
    std::unordered_map<CString, Meaning> byId_;
    std::unordered_map<CString, Meaning> byName_;  // those that were looked up
    std::unordered_map<const CZRQueryInfo*, Columns> traced_;
};

}  // namespace zr::tool
