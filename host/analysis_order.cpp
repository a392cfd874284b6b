#include "host/analysis_order.h"

#include <algorithm>
#include <unordered_map>
#include <vector>

#include "zrparsersql/analysis.h"
#include "zrparsersql/nested_queries.h"

namespace zr::host {

namespace {

using Queries = std::vector<CZRQueryInfo*>;

using QueriesById = std::unordered_map<CString, CZRQueryInfo*>;

// Which queries of the database a query names, at any depth. A query's descriptor is not touched: only an
// analysis tells, and that one is made on the side.
Queries queriesReadBy(const CZRQueryInfo& query, Database& database, const QueriesById& byId) {
    CZRQueryInfo scratch;
    scratch.m_sql = query.m_sql;
    scratch.SetDatabase(&database);
    BuildQueryInfo(&scratch, database.GetDBType());
    Queries read;
    for (CZRQueryInfo* each : zr::withNestedQueries(scratch)) {
        each->SetDatabase(&database);
        each->ResolveSources();
        for (const auto& source : each->m_sourceTables) {
            const auto found = byId.find(source.value);
            if (found != byId.end() && std::find(read.begin(), read.end(), found->second) == read.end())
                read.push_back(found->second);
        }
    }
    return read;
}

class Steps {
 public:
    Steps(const Database& database, const AnalysisProgress& progress)
        : all_(static_cast<std::size_t>(database.Queries.GetCount()) * 2), progress_(progress) {}

    void next() {
        if (progress_) progress_(done_, all_);
        ++done_;
    }

 private:
    std::size_t done_ = 0;
    const std::size_t all_;
    const AnalysisProgress& progress_;
};

class ReadingOrder {
 public:
    explicit ReadingOrder(Database& database, Steps& steps) {
        QueriesById byId;
        for (CZRQueryInfo* query : database.Queries) byId.emplace(query->GetID(), query);
        for (CZRQueryInfo* query : database.Queries) {
            steps.next();
            readBy_[query] = queriesReadBy(*query, database, byId);
        }
    }

    const Queries& readBy(CZRQueryInfo* query) const { return readBy_.at(query); }

    std::vector<Ring> findRings(const Database& database) {
        std::vector<Ring> rings;
        for (CZRQueryInfo* query : database.Queries) findRingsFrom(query, rings);
        return rings;
    }

 private:
    enum class Mark { New, OnPath, Done };

    // Depth first, with the path on a stack of its own.
    void findRingsFrom(CZRQueryInfo* start, std::vector<Ring>& rings) {
        if (marks_[start] != Mark::New) return;
        Queries path{start};
        std::vector<std::size_t> next{0};
        marks_[start] = Mark::OnPath;
        while (!path.empty()) {
            const Queries& readFrom = readBy_.at(path.back());
            if (next.back() == readFrom.size()) {
                marks_[path.back()] = Mark::Done;
                path.pop_back();
                next.pop_back();
                continue;
            }
            CZRQueryInfo* read = readFrom[next.back()++];
            if (marks_[read] == Mark::OnPath)
                rings.emplace_back(std::find(path.begin(), path.end(), read), path.end());
            if (marks_[read] != Mark::New) continue;
            marks_[read] = Mark::OnPath;
            path.push_back(read);
            next.push_back(0);
        }
    }

    std::unordered_map<CZRQueryInfo*, Queries> readBy_;
    std::unordered_map<CZRQueryInfo*, Mark> marks_;
};

std::string ringText(const Ring& ring) {
    std::string text;
    for (const CZRQueryInfo* query : ring) text += query->GetSrcName().toUtf8() + " reads from ";
    return text + ring.front()->GetSrcName().toUtf8();
}

void analyseInOrder(Database& database, const ReadingOrder& order, Steps& steps) {
    // The database sorts by what the descriptors tell of their sources.
    for (CZRQueryInfo* query : database.Queries) {
        query->m_sourceTables.RemoveAll();
        for (const CZRQueryInfo* read : order.readBy(query))
            query->m_sourceTables[read->GetSrcName()] = read->GetID();
    }
    database.SortQueries();
    for (CZRQueryInfo* query : database.Queries) query->m_sourceTables.RemoveAll();

    for (CZRQueryInfo* query : database.Queries) {
        steps.next();
        BuildQueryInfo(query, database.GetDBType());
    }
}

}  // namespace

void analyseQueries(Database& database, const AnalysisProgress& progress) {
    Steps steps(database, progress);
    ReadingOrder order(database, steps);
    if (const std::vector<Ring> rings = order.findRings(database); !rings.empty())
        throw CyclicQueries("queries read from each other in a ring: " + ringText(rings.front()));
    analyseInOrder(database, order, steps);
}

std::vector<Ring> analyseQueriesInRings(Database& database, const AnalysisProgress& progress) {
    Steps steps(database, progress);
    ReadingOrder order(database, steps);
    std::vector<Ring> rings = order.findRings(database);
    analyseInOrder(database, order, steps);
    return rings;
}

}  // namespace zr::host
