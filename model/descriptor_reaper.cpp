#include "model/descriptor_reaper.h"

#include <utility>

#include "model/nested_queries.h"
#include "model/retired_objects.h"
#include "zrparsersql/query_info.h"

namespace zr {
namespace {

// Pushed from the back, so that the first entry is deleted first.
template <class T>
void moveReversed(CList<T*>& list, std::vector<T*>& to) {
    for (auto entry = list.end(); entry != list.begin();)
        if (*--entry) to.push_back(*entry);
    list.RemoveAll();
}

}  // namespace

void DescriptorReaper::take(CList<SelectItem*>& items) {
    moveReversed(items, items_);
}

void DescriptorReaper::take(CList<CZRQueryInfo*>& queries) {
    moveReversed(queries, queries_);
}

void DescriptorReaper::take(CZRAliasInfo* alias) {
    if (!alias) return;
    take(std::exchange(alias->Expression, nullptr));
    delete alias;
}

void DescriptorReaper::take(CFieldObject* field) {
    delete field;
}

void DescriptorReaper::take(CZRQueryUnionInfo* record) {
    if (!record) return;
    take(std::exchange(record->Query, nullptr));
    delete record;
}

void DescriptorReaper::takeBelow(SelectItem& item) {
    take(item.m_items);
    if (CZRQueryInfo** slot = nestedQuerySlot(item)) take(std::exchange(*slot, nullptr));
}

void DescriptorReaper::takeContents(CZRQueryInfo& query) {
    for (CList<SelectItem*>* list : {&query.m_selectItems, &query.m_fromItems, &query.m_orderItems,
                                     &query.m_groupItems, &query.m_unionItems, &query.m_havingItems})
        take(*list);
    take(std::exchange(query.m_whereItem, nullptr));
    take(query.m_subQueries);
    for (auto& entry : query.m_fields) take(entry.value);
    query.m_fields.RemoveAll();
    for (auto& entry : query.m_aliases) take(entry.value);
    query.m_aliases.RemoveAll();
    RetiredObjects::releaseFrom(query, *this);
}

void DescriptorReaper::drain() {
    while (!items_.empty() || !queries_.empty()) {
        if (!items_.empty()) {
            SelectItem* item = items_.back();
            items_.pop_back();
            takeBelow(*item);
            delete item;
        } else {
            CZRQueryInfo* query = queries_.back();
            queries_.pop_back();
            takeContents(*query);
            delete query;
        }
    }
}

}  // namespace zr
