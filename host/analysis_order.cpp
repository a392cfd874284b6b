#include "host/analysis_order.h"

#include <algorithm>
#include <unordered_map>
#include <vector>

#include "zrparsersql/analysis.h"
#include "zrparsersql/nested_queries.h"

namespace zr::host {

namespace {

using Queries = std::vector<CZRQueryInfo*>;

// Tables and queries by their IDs; a table has no query.
using ObjectsById = std::unordered_map<CString, CZRQueryInfo*>;

// Which queries of the database an analysed query names, at any depth. Its descriptor is not touched.
Queries queriesReadBy(CZRQueryInfo& query, Database& database, const ObjectsById& byId) {
    CZRQueryInfo scratch;
    scratch.SetDatabase(&database);
    Queries read;
    const auto note = [&](const CString& id) {
        const auto found = byId.find(id);
        if (found == byId.end()) return false;
        if (found->second && std::find(read.begin(), read.end(), found->second) == read.end())
            read.push_back(found->second);
        return true;
    };
    // The analysis has looked up most of the sources already.
    for (const CZRQueryInfo* each : zr::withNestedQueries(query))
        for (const auto& source : each->m_sourceTables)
            if (!note(source.value)) scratch.m_sourceTables[source.key] = source.value;
    if (!scratch.m_sourceTables.IsEmpty()) scratch.ResolveSources();
    for (const auto& source : scratch.m_sourceTables) note(source.value);
    return read;
}

class ReadingOrder {
 public:
    // Of queries that are analysed.
    explicit ReadingOrder(Database& database) {
        ObjectsById byId;
        for (const CZRTableInfo* table : database.Tables) byId.emplace(table->GetID(), nullptr);
        for (CZRQueryInfo* query : database.Queries) byId.emplace(query->GetID(), query);
        for (CZRQueryInfo* query : database.Queries) readBy_[query] = queriesReadBy(*query, database, byId);
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

void analyseAll(Database& database, const AnalysisProgress& progress) {
    const auto all = static_cast<std::size_t>(database.Queries.GetCount());
    std::size_t done = 0;
    for (CZRQueryInfo* query : database.Queries) {
        if (progress) progress(done++, all);
        BuildQueryInfo(query, database.GetDBType());
    }
}

// Puts each query behind those that it reads from. The database sorts by what the descriptors tell of their
// sources, so that these stand aside meanwhile.
void sortByReading(Database& database, const ReadingOrder& order) {
    std::unordered_map<CZRQueryInfo*, std::vector<std::pair<CString, CString>>> kept;
    for (CZRQueryInfo* query : database.Queries) {
        for (const auto& source : query->m_sourceTables) kept[query].emplace_back(source.key, source.value);
        query->m_sourceTables.RemoveAll();
        for (const CZRQueryInfo* read : order.readBy(query))
            query->m_sourceTables[read->GetSrcName()] = read->GetID();
    }
    database.SortQueries();
    for (CZRQueryInfo* query : database.Queries) {
        query->m_sourceTables.RemoveAll();
        for (const auto& [name, id] : kept[query]) query->m_sourceTables[name] = id;
    }
}

}  // namespace

void analyseQueries(Database& database, const AnalysisProgress& progress) {
    analyseAll(database, progress);
    ReadingOrder order(database);
    if (const std::vector<Ring> rings = order.findRings(database); !rings.empty())
        throw CyclicQueries("queries read from each other in a ring: " + ringText(rings.front()));
    sortByReading(database, order);
}

std::vector<Ring> analyseQueriesInRings(Database& database, const AnalysisProgress& progress) {
    analyseAll(database, progress);
    ReadingOrder order(database);
    std::vector<Ring> rings = order.findRings(database);
    sortByReading(database, order);
    return rings;
}

}  // namespace zr::host
