#pragma once

#include <optional>

#include "host/analysis_order.h"
#include "host/column_tracer.h"
#include "host/database.h"

namespace zr::host {

// Names a table or query of a project, and perhaps one of its columns.
struct LineageTarget {
    const CZRSourceInfo* object = nullptr;
    std::optional<CString> column;
};

// A stored query that depends on a target.
struct DependentQuery {
    struct Use {
        std::string_view clause;
        ColumnOrigin step;
    };
    const CZRQueryInfo* query = nullptr;
    std::size_t distance = 0;                 // queries on the shortest way to the target, itself counted
    std::vector<CString> columns;             // result columns that are made of it
    std::vector<Use> uses;                    // where else a column is read that depends on it
    std::vector<const CZRSourceInfo*> reads;  // what it reads from: the target, and queries that depend on it
};

// A query that may depend on a target: what it reads is not all known.
struct UncertainQuery {
    const CZRQueryInfo* query = nullptr;
    ColumnOrigin open;
};

// A key of a table that rests upon the target.
struct DependentKey {
    const CZRTableInfo* table = nullptr;
    const CZRObjectInfo* key = nullptr;
    bool isForeign = false;
};

struct Impact {
    std::vector<DependentQuery> queries;  // by distance, then in the project's order
    std::vector<UncertainQuery> uncertain;
    std::vector<DependentKey> keys;
};

// What depends on what in a database. It is analysed when the object is made, rings of queries included, and
// is to stay as it is for as long as the object lives. Not for several threads.
class Lineage {
 public:
    explicit Lineage(Database& database, ColumnTracer::IsReadWhole isReadWhole = {},
                     const AnalysisProgress& progress = {});

    const std::vector<Ring>& rings() const { return rings_; }
    bool isInRing(const CZRQueryInfo& query) const;
    ColumnTracer& tracer() { return tracer_; }

    // "TABLE", "QUERY", "TABLE.COLUMN" or "QUERY.COLUMN", without regard to case; names may hold dots.
    // Nothing when there is no such table, query or column.
    std::optional<LineageTarget> find(const CString& name);

    // All that depends on a table or query, or on one column of it.
    Impact impactOf(const LineageTarget& target);

 private:
    struct Walk;

    bool hasColumn(const CZRSourceInfo& object, const CString& column);

    Database& database_;
    std::vector<Ring> rings_;
    ColumnTracer tracer_;
};

}  // namespace zr::host
