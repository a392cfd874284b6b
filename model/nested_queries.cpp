#include "model/nested_queries.h"

#include <typeinfo>

#include "zrparsersql/query_info.h"

namespace zr {

CZRQueryInfo** nestedQuerySlot(SelectItem& item) {
    // Nearly all items are of these two classes, and comparing types is cheaper than casting.
    const std::type_info& type = typeid(item);
    if (type == typeid(SelectItem) || type == typeid(SelectItemField)) return nullptr;
    if (auto* subQuery = dynamic_cast<SelectItemSubQuery*>(&item)) return &subQuery->m_query;
    if (auto* unionItem = dynamic_cast<SelectItemUnion*>(&item)) return &unionItem->m_query;
    return nullptr;
}

std::vector<CZRQueryInfo*> unionBranchesOf(const CZRQueryInfo& query) {
    std::vector<CZRQueryInfo*> branches;
    const auto addBranches = [&branches](const CZRQueryInfo& of) {
        for (const SelectItem* item : of.m_unionItems)
            if (CZRQueryInfo* branch = item ? nestedQueryOf(*item) : nullptr) branches.push_back(branch);
    };
    addBranches(query);
    for (std::size_t at = 0; at < branches.size(); ++at) addBranches(*branches[at]);
    return branches;
}

std::vector<CZRQueryInfo*> withNestedQueries(CZRQueryInfo& query) {
    std::vector<CZRQueryInfo*> queries{&query};
    std::vector<const SelectItem*> items;
    const auto addItem = [&items](const SelectItem* item) {
        if (item) items.push_back(item);
    };
    for (std::size_t at = 0; at < queries.size(); ++at) {
        const CZRQueryInfo& holder = *queries[at];
        for (const CList<SelectItem*>* list :
             {&holder.m_selectItems, &holder.m_fromItems, &holder.m_orderItems, &holder.m_groupItems,
              &holder.m_unionItems, &holder.m_havingItems})
            for (const SelectItem* item : *list) addItem(item);
        addItem(holder.m_whereItem);
        for (const auto& alias : holder.m_aliases)
            if (alias.value) addItem(alias.value->Expression);
        while (!items.empty()) {
            const SelectItem* item = items.back();
            items.pop_back();
            for (const SelectItem* child : item->m_items) addItem(child);
            if (CZRQueryInfo* nested = nestedQueryOf(*item)) queries.push_back(nested);
        }
        for (CZRQueryInfo* nested : holder.m_subQueries)
            if (nested) queries.push_back(nested);
        for (const CZRQueryUnionInfo* record : holder.m_unions)
            if (record && record->Query) queries.push_back(record->Query);
    }
    return queries;
}

}  // namespace zr
