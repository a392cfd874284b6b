#pragma once

#include <vector>

#include "zrparsersql/query_info.h"

namespace zr::tool {

// Something that a FROM clause names: a table (or what is named like one), or a nested query.
struct FromSource {
    const SelectItemField* table = nullptr;
    const CZRQueryInfo* query = nullptr;
    CString alias;  // empty: none
};

// The sources of a query's FROM clause, in order. Of any depth.
std::vector<FromSource> fromSources(const CZRQueryInfo& query);

// Calls visit for an item and everything below it, nested queries left out, in order.
template <class Visit>
void forEachItem(const SelectItem& root, Visit visit) {
    std::vector<const SelectItem*> todo = {&root};
    while (!todo.empty()) {
        const SelectItem* item = todo.back();
        todo.pop_back();
        visit(*item);
        std::vector<const SelectItem*> below(item->m_items.begin(), item->m_items.end());
        todo.insert(todo.end(), below.rbegin(), below.rend());
    }
}

}  // namespace zr::tool
