#include "model/descriptor_reaper.h"

#include <algorithm>
#include <cstdint>
#include <utility>

#include "model/nested_queries.h"
#include "model/retired_objects.h"
#include "zrparsersql/query_info.h"

namespace zr {
namespace {

// The child that comes next: the last one of a list that was turned round, so that the first one goes first.
SelectItem*& nextOf(SelectItem& item) {
    return item.m_items.GetTail();
}

void dropNext(CList<SelectItem*>& items) {
    items.RemoveAt(POSITION(static_cast<std::uintptr_t>(items.GetCount())));
}

}  // namespace

// Goes down from the root and up again. Where it goes down, the place of the child in its parent's list takes
// the parent's own parent, which is where it goes on up.
void DescriptorReaper::take(SelectItem* item) {
    SelectItem* parent = nullptr;
    const auto arriveAt = [this](SelectItem& at) {
        std::reverse(at.m_items.begin(), at.m_items.end());
        if (CZRQueryInfo** slot = nestedQuerySlot(at)) take(std::exchange(*slot, nullptr));
    };
    if (item) arriveAt(*item);
    while (item) {
        if (!item->m_items.IsEmpty()) {
            SelectItem* const child = std::exchange(nextOf(*item), parent);
            if (child) {
                arriveAt(*child);
                parent = std::exchange(item, child);
            } else {
                dropNext(item->m_items);
            }
            continue;
        }
        delete item;
        item = parent;
        if (!item) break;
        parent = nextOf(*item);
        dropNext(item->m_items);
    }
}

void DescriptorReaper::take(CList<SelectItem*>& items) {
    // Whoever is asked for the list meanwhile finds it empty.
    const CList<SelectItem*> taken = std::exchange(items, CList<SelectItem*>());
    for (SelectItem* item : taken) take(item);
}

void DescriptorReaper::take(CZRQueryInfo* query) {
    if (query) query->nextWaiting_ = std::exchange(waiting_, query);
}

void DescriptorReaper::take(CList<CZRQueryInfo*>& queries) {
    // Taken from the back, so that the first one goes first.
    for (auto entry = queries.end(); entry != queries.begin();) take(*--entry);
    queries.RemoveAll();
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
    while (waiting_) {
        CZRQueryInfo* const query = std::exchange(waiting_, waiting_->nextWaiting_);
        takeContents(*query);
        delete query;
    }
}

}  // namespace zr
