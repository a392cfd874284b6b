#pragma once

#include <algorithm>
#include <string_view>
#include <vector>

#include "zrparsersql/query_info.h"

namespace zr::host {

// What an item is, and the part of it that only its class has.
struct ItemClass {
    std::string_view name;
    const SelectItemField* field = nullptr;
    bool hasQuery = false;
    const CZRQueryInfo* query = nullptr;  // may be null even where there is a place for one
};

inline ItemClass classOf(const SelectItem& item) {
    if (const auto* field = dynamic_cast<const SelectItemField*>(&item)) return {"SelectItemField", field};
    if (const auto* subQuery = dynamic_cast<const SelectItemSubQuery*>(&item))
        return {"SelectItemSubQuery", nullptr, true, subQuery->m_query};
    if (const auto* branch = dynamic_cast<const SelectItemUnion*>(&item))
        return {"SelectItemUnion", nullptr, true, branch->m_query};
    return {"SelectItem"};
}

// A map's entries in order of their keys' units.
template <class Map>
auto sortedEntries(const Map& map) {
    std::vector<const typename Map::Entry*> entries;
    for (const auto& entry : map) entries.push_back(&entry);
    std::sort(entries.begin(), entries.end(),
              [](const auto* left, const auto* right) { return left->key < right->key; });
    return entries;
}

// True for the operator that gives its first operand the name of its last one.
inline bool isAlias(const SelectItem& item) {
    return item.m_isOperator && item.m_items.GetCount() >= 2 &&
           (item.m_name.EqualsNoCase(u"ALIAS") || item.m_name.EqualsNoCase(u"AS"));
}

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

}  // namespace zr::host
