#include "model/descriptor_copier.h"

#include <memory>
#include <typeinfo>

#include "model/nested_queries.h"
#include "zrparsersql/query_info.h"

namespace zr {

void DescriptorCopier::copyBelow(const SelectItem& from, SelectItem& to) {
    items_.emplace_back(&from, &to);
    run();
}

void DescriptorCopier::copyBelow(const CZRQueryInfo& from, CZRQueryInfo& to) {
    queries_.emplace_back(&from, &to);
    run();
}

void DescriptorCopier::run() {
    while (!items_.empty() || !queries_.empty()) {
        if (!items_.empty()) {
            const auto [from, to] = items_.back();
            items_.pop_back();
            copyNow(*from, *to);
        } else {
            const auto [from, to] = queries_.back();
            queries_.pop_back();
            copyNow(*from, *to);
        }
    }
}

// Makes the copy of one item and notes what hangs below it for later. The caller links the copy before it
// goes on.
SelectItem* DescriptorCopier::copy(const SelectItem& from) {
    const std::type_info& type = typeid(from);
    std::unique_ptr<SelectItem> to;
    if (type == typeid(SelectItem))
        to.reset(new SelectItem(from, ShallowCopy{}));
    else if (type == typeid(SelectItemField))
        to.reset(new SelectItemField(static_cast<const SelectItemField&>(from), ShallowCopy{}));
    else if (type == typeid(SelectItemSubQuery))
        to.reset(new SelectItemSubQuery(static_cast<const SelectItemSubQuery&>(from), ShallowCopy{}));
    else if (type == typeid(SelectItemUnion))
        to.reset(new SelectItemUnion(static_cast<const SelectItemUnion&>(from), ShallowCopy{}));
    else
        return from.Clone();
    if (!from.m_items.IsEmpty() || nestedQueryOf(from)) items_.emplace_back(&from, to.get());
    return to.release();
}

CZRQueryInfo* DescriptorCopier::copy(const CZRQueryInfo& from) {
    if (typeid(from) != typeid(CZRQueryInfo)) return from.Clone();
    std::unique_ptr<CZRQueryInfo> to(new CZRQueryInfo(from, ShallowCopy{}));
    queries_.emplace_back(&from, to.get());
    return to.release();
}

namespace {

// Appends first and makes the copy then, so that the copy has an owner from its first moment on.
template <class T, class Copy>
void copyList(const CList<T*>& from, CList<T*>& to, Copy copy) {
    for (const T* entry : from) {
        if (!entry) continue;
        const POSITION place = to.AddTail(nullptr);
        to.SetAt(place, copy(*entry));
    }
}

}  // namespace

void DescriptorCopier::copyNow(const SelectItem& from, SelectItem& to) {
    copyList(from.m_items, to.m_items, [this](const SelectItem& item) { return copy(item); });
    if (CZRQueryInfo** slot = nestedQuerySlot(to))
        if (const CZRQueryInfo* query = nestedQueryOf(from)) *slot = copy(*query);
}

void DescriptorCopier::copyMaps(const CZRQueryInfo& from, CZRQueryInfo& to) {
    for (const auto& entry : from.m_aliases) {
        CZRAliasInfo*& alias = to.m_aliases[entry.key];
        if (!entry.value) continue;
        if (typeid(*entry.value) != typeid(CZRAliasInfo)) {
            alias = entry.value->Clone();
            continue;
        }
        alias = new CZRAliasInfo(*entry.value, ShallowCopy{});
        if (entry.value->Expression) alias->Expression = copy(*entry.value->Expression);
    }
    for (const auto& entry : from.m_sourceTables) to.m_sourceTables[entry.key] = entry.value;
    for (const auto& entry : from.m_fields) {
        CFieldObject*& field = to.m_fields[entry.key];
        if (entry.value) field = new CFieldObject(*entry.value);
    }
}

void DescriptorCopier::copyNow(const CZRQueryInfo& from, CZRQueryInfo& to) {
    copyMaps(from, to);
    const auto copyItem = [this](const SelectItem& item) { return copy(item); };
    copyList(from.m_selectItems, to.m_selectItems, copyItem);
    copyList(from.m_fromItems, to.m_fromItems, copyItem);
    copyList(from.m_orderItems, to.m_orderItems, copyItem);
    copyList(from.m_groupItems, to.m_groupItems, copyItem);
    copyList(from.m_unionItems, to.m_unionItems, copyItem);
    copyList(from.m_havingItems, to.m_havingItems, copyItem);
    if (from.m_whereItem) to.m_whereItem = copy(*from.m_whereItem);
    copyList(from.m_subQueries, to.m_subQueries, [this](const CZRQueryInfo& query) { return copy(query); });
    copyList(from.m_unions, to.m_unions, [](const CZRQueryUnionInfo& record) {
        auto* unionInfo = new CZRQueryUnionInfo;
        unionInfo->UnionKind = record.UnionKind;
        return unionInfo;
    });
    auto unionInfo = to.m_unions.begin();
    for (const CZRQueryUnionInfo* record : from.m_unions) {
        if (!record) continue;
        if (record->Query) (*unionInfo)->Query = copy(*record->Query);
        ++unionInfo;
    }
}

}  // namespace zr
