#include <new>

#include "model/owned_append.h"
#include "model/stored_section.h"
#include "zrparsersql/filter_info.h"

using zr::Missing;
using zr::StoredSection;

void CZRFilterInfo::Save(CZRStorageNode& node) {
    node.WriteString(u"SQLQuery", SQLQuery, 0);
    node.WriteInt(u"UseSQLQuery", UseSQLQuery);
    zr::saveNumbered(node, Items, u"Condition%d", [&node](CZRFilterItemInfo& item) { item.Save(node); });
}

void CZRFilterInfo::Load(CZRStorageNode& node, CZRDescriptorFactory& factory) {
    for (CZRFilterItemInfo* item : Items) CZRFilterItemInfo::destroy(item);
    Items.RemoveAll();
    SQLQuery = node.ReadString(u"SQLQuery", CString(), 0);
    UseSQLQuery = node.ReadInt(u"UseSQLQuery", 0);
    zr::forEachStoredChild(node, [&] {
        CZRFilterItemInfo* item = factory.CreateFilterItem(GetDBType());
        if (!item) return;
        zr::appendOwned(Items, item, &CZRFilterItemInfo::destroy);
        item->Load(node, factory);
    });
}

void CZRFilterItemInfo::Save(CZRStorageNode& node) {
    node.WriteString(u"FieldID", FieldID, 0);
    node.WriteInt(u"Condition", Condition);
    node.WriteInt(u"ConditionAdd", ConditionAdd);
    const StoredSection section(node, u"Value", Missing::Create);
    Value.Save(node);
}

void CZRFilterItemInfo::Load(CZRStorageNode& node, CZRDescriptorFactory& /*factory*/) {
    FieldID = node.ReadString(u"FieldID", CString(), 0);
    Condition = node.ReadInt(u"Condition", 0);
    ConditionAdd = node.ReadInt(u"ConditionAdd", 0);
    const StoredSection section(node, u"Value", Missing::Leave);
    Value.Load(node);
}

void CZRFilterValue::Save(CZRStorageNode& node) {
    node.WriteInt(u"IsNULL", IsNull());
    node.WriteInt(u"Type", ValueType);
    if (IsNull()) return;
    const char16_t* const text = GetWide();
    if (!text) throw std::bad_alloc();
    node.WriteString(u"Value", text, 0);
}

void CZRFilterValue::Load(CZRStorageNode& node) {
    const int isNull = node.ReadInt(u"IsNULL", 0);
    const int type = node.ReadInt(u"Type", -1);
    if (type == 0)
        SetNull(-1);  // not of type 0: intended, stored projects rely on it
    else if (isNull)
        SetNull(type);
    else if (!SetWide(node.ReadString(u"Value", CString(), 0).GetString(), type))
        throw std::bad_alloc();
}
