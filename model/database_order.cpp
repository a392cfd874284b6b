#include <algorithm>
#include <unordered_map>
#include <vector>

#include "model/named_search.h"
#include "model/nested_queries.h"
#include "zrparsersql/database_info.h"

namespace {

// Puts queries behind those they depend on. The places are filled from the front: as long as the occupant of
// a place depends on a query that stands later, it swaps places with the first such one.
class QuerySorter {
 public:
    QuerySorter(CList<CZRQueryInfo*>& queries, bool throughUnions) : queries_(queries) {
        std::unordered_map<CString, std::vector<std::size_t>> byId;
        for (CZRQueryInfo* query : queries) {
            if (query) byId[zr::foldedKey(query->GetID())].push_back(order_.size());
            order_.push_back(order_.size());
        }
        place_ = order_;
        dependsOn_.resize(order_.size());
        std::size_t index = 0;
        for (const CZRQueryInfo* query : queries) {
            std::vector<std::size_t>& dependsOn = dependsOn_[index++];
            if (!query) continue;
            const auto addSources = [&](const CZRQueryInfo& reader) {
                for (const auto& entry : reader.m_sourceTables)
                    if (const auto found = byId.find(zr::foldedKey(entry.value)); found != byId.end())
                        dependsOn.insert(dependsOn.end(), found->second.begin(), found->second.end());
            };
            addSources(*query);
            if (!throughUnions) continue;
            for (const CZRQueryInfo* branch : zr::unionBranchesOf(*query)) addSources(*branch);
        }
    }

    void sort() {
        for (std::size_t place = 0; place < order_.size(); ++place) {
            // Each swap brings in a query that has not been here yet, unless queries depend on each other in
            // a ring.
            for (std::size_t swaps = place; swaps < order_.size(); ++swaps) {
                const std::size_t later = firstDependencyBehind(place);
                if (later == order_.size()) break;
                std::swap(order_[place], order_[later]);
                place_[order_[place]] = place;
                place_[order_[later]] = later;
            }
        }
        const std::vector<CZRQueryInfo*> before(queries_.begin(), queries_.end());
        std::size_t place = 0;
        for (CZRQueryInfo*& query : queries_) query = before[order_[place++]];
    }

 private:
    std::size_t firstDependencyBehind(std::size_t place) const {
        std::size_t first = order_.size();
        for (std::size_t dependency : dependsOn_[order_[place]])
            if (place_[dependency] > place) first = std::min(first, place_[dependency]);
        return first;
    }

    CList<CZRQueryInfo*>& queries_;
    std::vector<std::size_t> order_;                   // by place: the query's first place
    std::vector<std::size_t> place_;                   // by first place: the place now
    std::vector<std::vector<std::size_t>> dependsOn_;  // by first place
};

}  // namespace

void CZRDatabaseInfo::SortQueries() {
    // The branches of an Oracle union do not count; hosts rely on it.
    QuerySorter(Queries, GetDBType() != DB_ORACLE).sort();
}
