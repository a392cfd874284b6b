#include "zrparsersql/table_info.h"

#include <algorithm>
#include <utility>

#include "model/named_search.h"
#include "model/owned_append.h"
#include "zrparsersql/database_info.h"

namespace {

template <class T>
void deleteAll(CList<T*>& list) {
    for (T* object : list) delete object;
    list.RemoveAll();
}

}  // namespace

CZRTableInfo::CZRTableInfo() = default;

CZRTableInfo::CZRTableInfo(const CZRTableInfo& other, int selectedOnly)
    : CZRSourceInfo(other),
      CopyStructure(other.CopyStructure),
      CopyIndexes(other.CopyIndexes),
      CopyForeignKeys(other.CopyForeignKeys),
      CopyData(other.CopyData),
      OverwriteTable(other.OverwriteTable),
      TruncateTable(other.TruncateTable),
      ModifyFields(other.ModifyFields),
      ModifyIndexes(other.ModifyIndexes),
      ModifyForeignKeys(other.ModifyForeignKeys),
      SyncInsert(other.SyncInsert),
      SyncUpdate(other.SyncUpdate),
      SyncDrop(other.SyncDrop) {
    const auto cloneAll = [this, selectedOnly](const auto& from, auto& to) {
        for (const auto* object : from) {
            if (!object || (selectedOnly && object->GetSelected() == 0)) continue;
            auto* clone = object->Clone();
            zr::appendOwned(to, clone);
            clone->SetOwner(this);
        }
    };
    try {
        cloneAll(other.Fields, Fields);
        cloneAll(other.Indexes, Indexes);
        cloneAll(other.ForeignKeys, ForeignKeys);
        AttachFilterCopy(other.Filter);
    } catch (...) {
        // What is only half made has no destructor.
        Clear();
        throw;
    }
}

CZRTableInfo::~CZRTableInfo() {
    Clear();
}

void CZRTableInfo::Clear() {
    deleteAll(Fields);
    deleteAll(Indexes);
    deleteAll(ForeignKeys);
    CZRFilterInfo::destroy(Filter);
    Filter = nullptr;
    UniqueIndex = nullptr;
    UniqueIndexDirty = 1;
}

bool CZRTableInfo::IsDerivedSource() const {
    return false;
}
bool CZRTableInfo::IsBaseTable() const {
    return true;
}

CZRSourceFildInfo* CZRTableInfo::FindFieldByID(CString id) {
    return zr::findFirst(Fields, id, &CZRObjectInfo::GetID);
}
CZRSourceFildInfo* CZRTableInfo::FindFieldByName(CString name) {
    return zr::findFirst(Fields, name, &CZRObjectInfo::GetName);
}
CZRSourceFildInfo* CZRTableInfo::FindFieldBySrcName(CString name) {
    return zr::findFirst(Fields, name, &CZRObjectInfo::GetSrcName);
}

CZRIndexInfo* CZRTableInfo::FindIndexBySrcName(CString name) {
    return zr::findFirst(Indexes, name, &CZRObjectInfo::GetSrcName);
}
CZRIndexInfo* CZRTableInfo::FindIndexByName(CString name) {
    return zr::findFirst(Indexes, name, &CZRObjectInfo::GetName);
}
CZRIndexInfo* CZRTableInfo::FindIndexByID(CString id) {
    return zr::findFirst(Indexes, id, &CZRObjectInfo::GetID);
}

CZRForeignKeyInfo* CZRTableInfo::FindForeignKeyBySrcName(CString name) {
    return zr::findFirst(ForeignKeys, name, &CZRObjectInfo::GetSrcName);
}
CZRForeignKeyInfo* CZRTableInfo::FindForeignKeyByName(CString name) {
    return zr::findFirst(ForeignKeys, name, &CZRObjectInfo::GetName);
}
CZRForeignKeyInfo* CZRTableInfo::FindForeignKeyByID(CString id) {
    // Case counts, unlike for indexes: intended, hosts rely on it.
    for (CZRForeignKeyInfo* key : ForeignKeys)
        if (key && key->GetID() == id) return key;
    return nullptr;
}

int CZRTableInfo::Validate(int requireAllSelected) {
    if (const int result = GetCorrect()) return result;
    for (CZRFieldInfo* field : Fields) {
        if (!field) continue;
        if (const int result = field->GetCorrect()) return result;
        if (requireAllSelected && !field->GetSelected()) return 1;
    }
    // An error of an entry that is not selected does not end the walk, but it stands when it is the last
    // one's.
    const auto validateAll = [](auto& list, int result) {
        for (auto* object : list) {
            if (!object) continue;
            result = object->GetCorrect();
            if (result != 0 && object->GetSelected()) break;
        }
        return result;
    };
    const int result = validateAll(Indexes, 0);
    return result != 0 ? result : validateAll(ForeignKeys, result);
}

void CZRTableInfo::ResolveReferences() {
    for (CZRIndexInfo* index : Indexes)
        if (index) index->ResolveReferences();
    for (CZRForeignKeyInfo* key : ForeignKeys)
        if (key) key->ResolveReferences();
}

void CZRTableInfo::AttachFilterCopy(const CZRFilterInfo* filter) {
    // Copied first: the filter given may be the table's own.
    CZRFilterInfo* copy = filter ? filter->Clone() : nullptr;
    CZRFilterInfo::destroy(Filter);
    Filter = copy;
    if (!copy) return;
    CList<CZRFilterItemInfo*>& items = copy->Items;
    for (CZRFilterItemInfo*& item : items)
        if (item && !FindFieldBySrcName(item->FieldID))
            CZRFilterItemInfo::destroy(std::exchange(item, nullptr));
    const auto kept = std::remove(items.begin(), items.end(), nullptr);
    for (auto dropped = items.end() - kept; dropped > 0; --dropped)
        items.RemoveAt(POSITION(static_cast<std::uintptr_t>(items.GetCount())));
    if (items.IsEmpty() && copy->SQLQuery.IsEmpty()) CZRFilterInfo::destroy(std::exchange(Filter, nullptr));
}

void CZRTableInfo::CopyFrom(CZRTableInfo& other, DBTypes dbType) {
    CopyProperties(other, 0);
    CopyStructure = other.GetCopyStructure();
    CopyIndexes = other.GetCopyIndexes();
    CopyForeignKeys = other.GetCopyForeignKeys();
    OverwriteTable = other.GetOverwriteTable();
    TruncateTable = other.GetTruncateTable();
    ModifyFields = other.GetModifyFields();
    ModifyIndexes = other.GetModifyIndexes();
    ModifyForeignKeys = other.GetModifyForeignKeys();
    CopyData = other.GetCopyData();
    SyncInsert = other.GetSyncInsert();
    SyncUpdate = other.GetSyncUpdate();
    SyncDrop = other.GetSyncDrop();

    const int selectNew = Database ? Database->AutoStructureUpdate : 0;
    const auto copyAll = [selectNew](auto& list, auto findPartner) {
        for (auto* object : list) {
            if (!object) continue;
            if (CZRObjectInfo* partner = findPartner(object->GetSrcName()))
                object->CopyProperties(*partner, 0);
            else
                object->SetSelected(selectNew);
        }
    };
    copyAll(Fields, [&other](const CString& name) { return other.FindFieldBySrcName(name); });
    copyAll(Indexes, [&other](const CString& name) { return other.FindIndexBySrcName(name); });
    copyAll(ForeignKeys, [&other](const CString& name) { return other.FindForeignKeyBySrcName(name); });

    AttachFilterCopy(other.Filter && other.Filter->GetDBType() == dbType ? other.Filter : nullptr);
}

void CZRTableInfo::SetProcessed(int value) {
    const zr::CriticalSectionGuard guard(Lock);
    Processed = value;
}

int CZRTableInfo::GetProcessed() const {
    const zr::CriticalSectionGuard guard(Lock);
    return Processed;
}

int CZRTableInfo::AreReferencingTablesProcessed() {
    if (!Database) return 1;
    int result = 1;
    for (const CZRTableInfo* table : Database->Tables) {
        if (!table || table == this) continue;
        for (const CZRForeignKeyInfo* key : table->ForeignKeys)
            if (key && key->GetReferencedTableID() == ID && table->GetProcessed() == 0) result = 0;
    }
    return result;
}

int CZRTableInfo::AreReferencedTablesProcessed() {
    if (!Database) return 1;
    for (const CZRForeignKeyInfo* key : ForeignKeys) {
        const CZRTableInfo* table = key ? Database->FindTableByID(key->GetReferencedTableID()) : nullptr;
        if (table && table->GetProcessed() == 0) return 0;
    }
    return 1;
}

CString CZRTableInfo::GetDialectText1() const {
    return CString();
}
CString CZRTableInfo::GetDialectText2() const {
    return CString();
}
CString CZRTableInfo::GetDialectText3() const {
    return CString();
}
void CZRTableInfo::SetDialectText1(CString /*value*/) {}
void CZRTableInfo::SetDialectText2(CString /*value*/) {}
void CZRTableInfo::SetDialectText3(CString /*value*/) {}
void CZRTableInfo::SetDialectText4(CString /*value*/) {}
CString CZRTableInfo::GetDialectText4() const {
    return CString();
}
void CZRTableInfo::ResetDialectState() {}
