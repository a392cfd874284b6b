#include "analysis/copy_budget.h"

#include <vector>

#include "model/nested_queries.h"
#include "zrparsersql/query_info.h"

namespace zr {

namespace {

// A descriptor takes about as much memory as that many items.
constexpr std::size_t kQueryUnits = 8;

// Counts a tree, but no further than told.
class Counter {
 public:
    explicit Counter(std::size_t most) : most_(most) {}

    void addItem(const SelectItem* item) {
        if (!item) return;
        ++units_;
        items_.push_back(item);
    }
    void addAlias(const CZRAliasInfo* alias) {
        ++units_;
        if (alias) addItem(alias->Expression);
    }
    std::size_t count() {
        while (units_ <= most_ && !(items_.empty() && queries_.empty())) {
            if (!items_.empty()) {
                const SelectItem* item = items_.back();
                items_.pop_back();
                for (const SelectItem* child : item->m_items) addItem(child);
                addQuery(nestedQueryOf(*item));
            } else {
                const CZRQueryInfo* query = queries_.back();
                queries_.pop_back();
                addPartsOf(*query);
            }
        }
        return units_;
    }

 private:
    void addQuery(const CZRQueryInfo* query) {
        if (!query) return;
        units_ += kQueryUnits;
        queries_.push_back(query);
    }
    void addPartsOf(const CZRQueryInfo& query) {
        units_ += static_cast<std::size_t>(query.m_sourceTables.GetCount());
        units_ += static_cast<std::size_t>(query.m_fields.GetCount());
        for (const auto& alias : query.m_aliases) addAlias(alias.value);
        for (const CList<SelectItem*>* list :
             {&query.m_selectItems, &query.m_fromItems, &query.m_orderItems, &query.m_groupItems,
              &query.m_unionItems, &query.m_havingItems})
            for (const SelectItem* item : *list) addItem(item);
        addItem(query.m_whereItem);
        for (const CZRQueryInfo* nested : query.m_subQueries) addQuery(nested);
    }

    const std::size_t most_;
    std::size_t units_ = 0;
    std::vector<const SelectItem*> items_;
    std::vector<const CZRQueryInfo*> queries_;
};

}  // namespace

bool CopyBudget::take(std::size_t units) {
    if (spent_ || units > left_) {
        spent_ = true;
        return false;
    }
    left_ -= units;
    return true;
}

bool CopyBudget::takeCopyOf(const SelectItem& item) {
    if (spent_) return false;
    Counter counter(left_);
    counter.addItem(&item);
    return take(counter.count());
}

bool CopyBudget::takeCopyOf(const CZRAliasInfo& alias) {
    if (spent_) return false;
    Counter counter(left_);
    counter.addAlias(&alias);
    return take(counter.count());
}

bool CopyBudget::takeQuery() {
    return take(kQueryUnits);
}

}  // namespace zr
