#include "zrparsersql/database_info.h"
#include "zrparsersql/table_info.h"

namespace {

// Raised while an option setter is at work, so that what it does to children does not come back to the table.
class UpdateGuard {
 public:
    explicit UpdateGuard(CZRTableInfo& table) : depth_(table.UpdateDepth) { ++depth_; }
    ~UpdateGuard() { --depth_; }
    UpdateGuard(const UpdateGuard&) = delete;
    UpdateGuard& operator=(const UpdateGuard&) = delete;

 private:
    int& depth_;
};

template <class T>
void selectAll(CList<T*>& list, int value) {
    for (T* object : list)
        if (object) object->SetSelected(value);
}

template <class T>
bool isAnySelected(const CList<T*>& list) {
    for (const T* object : list)
        if (object && object->GetSelected()) return true;
    return false;
}

bool isOverwritten(const CZRDatabaseInfo* database) {
    return database && database->OverwriteDatabase != 0;
}

void recalcSelected(CZRDatabaseInfo* database) {
    if (database) database->RecalcSelected();
}

}  // namespace

int CZRTableInfo::GetCopyStructure() const {
    return CopyStructure;
}
int CZRTableInfo::GetCopyIndexes() const {
    return (Indexes.GetCount() > 0) & CopyIndexes;
}
int CZRTableInfo::GetCopyForeignKeys() const {
    return (ForeignKeys.GetCount() > 0) & CopyForeignKeys;
}
int CZRTableInfo::GetCopyData() const {
    return CopyData;
}
int CZRTableInfo::GetSyncInsert() const {
    return SyncInsert;
}
int CZRTableInfo::GetSyncUpdate() const {
    return SyncUpdate;
}
int CZRTableInfo::GetSyncDrop() const {
    return SyncDrop;
}
int CZRTableInfo::GetOverwriteTable() const {
    return OverwriteTable;
}
int CZRTableInfo::GetTruncateTable() const {
    return TruncateTable;
}
int CZRTableInfo::GetModifyFields() const {
    return ModifyFields;
}
int CZRTableInfo::GetModifyIndexes() const {
    return ModifyIndexes;
}
int CZRTableInfo::GetModifyForeignKeys() const {
    return ModifyForeignKeys;
}
CZRDatabaseInfo* CZRTableInfo::GetDatabase() const {
    return Database;
}
void CZRTableInfo::SetDatabase(CZRDatabaseInfo* database) {
    Database = database;
}

void CZRTableInfo::SetSelected(int value) {
    if (value == Selected) return;
    const UpdateGuard guard(*this);
    Selected = value;
    SetCopyStructure(value);
    SetCopyData(value);
    recalcSelected(Database);
}

void CZRTableInfo::SetCopyStructure(int value) {
    if (value == CopyStructure) return;
    const UpdateGuard guard(*this);
    const int copyData = CopyData;
    CopyStructure = value;
    Selected = value != 0 || copyData != value;
    // The columns follow the table only when no copy of data holds them.
    if (copyData == 0) selectAll(Fields, value);
    SetCopyIndexes(value);
    SetCopyForeignKeys(value);
    if (value != 0) {
        if (isOverwritten(Database)) SetOverwriteTable(1);
    } else {
        if (copyData != 0 && isOverwritten(Database)) SetCopyData(0);
        OverwriteTable = 0;
        TruncateTable = 0;
        ModifyFields = 0;
    }
    recalcSelected(Database);
}

void CZRTableInfo::SetCopyData(int value) {
    if (value == CopyData) return;
    const UpdateGuard guard(*this);
    CopyData = value;
    Selected = value != 0 || CopyStructure != value;
    if (CopyStructure == 0) selectAll(Fields, value);
    if (value == 0) {
        SyncInsert = 0;
        SyncUpdate = 0;
        SyncDrop = 0;
    } else if (CopyStructure == 0 && isOverwritten(Database)) {
        SetCopyStructure(1);
    }
    recalcSelected(Database);
}

void CZRTableInfo::SetCopyIndexes(int value) {
    if (value == CopyIndexes || (value != 0 && CopyStructure == 0)) return;
    const UpdateGuard guard(*this);
    CopyIndexes = value;
    selectAll(Indexes, value);
    if (value == 0) ModifyIndexes = 0;
}

void CZRTableInfo::SetCopyForeignKeys(int value) {
    if (value == CopyForeignKeys || (value != 0 && CopyStructure == 0)) return;
    const UpdateGuard guard(*this);
    CopyForeignKeys = value;
    selectAll(ForeignKeys, value);
    if (value == 0) ModifyForeignKeys = 0;
}

void CZRTableInfo::SetSyncInsert(int value) {
    SyncInsert = value;
}
void CZRTableInfo::SetSyncUpdate(int value) {
    SyncUpdate = value;
}
void CZRTableInfo::SetSyncDrop(int value) {
    SyncDrop = value;
}

void CZRTableInfo::SetOverwriteTable(int value) {
    if (value == OverwriteTable) return;
    if (value != 0 && CopyStructure == 0) return;
    // A database that overwrites everything keeps its tables overwritten.
    if (value == 0 && isOverwritten(Database)) return;
    const UpdateGuard guard(*this);
    OverwriteTable = value;
    if (value == 0) return;
    TruncateTable = 0;
    ModifyFields = 0;
    ModifyIndexes = 0;
    ModifyForeignKeys = 0;
    SyncInsert = 0;
    SyncUpdate = 0;
    SyncDrop = 0;
}

void CZRTableInfo::SetTruncateTable(int value) {
    TruncateTable = value;
}

void CZRTableInfo::SetModifyFields(int value) {
    if (value != 0 && (CopyStructure == 0 || OverwriteTable != 0)) return;
    ModifyFields = value;
}

void CZRTableInfo::SetModifyIndexes(int value) {
    if (value != 0 && (CopyIndexes == 0 || OverwriteTable != 0)) return;
    ModifyIndexes = value;
}

void CZRTableInfo::SetModifyForeignKeys(int value) {
    if (value != 0 && (CopyForeignKeys == 0 || OverwriteTable != 0)) return;
    ModifyForeignKeys = value;
}

void CZRTableInfo::RecalcFromChildren() {
    if (UpdateDepth != 0) return;
    const bool anyField = isAnySelected(Fields);
    const bool anyIndex = isAnySelected(Indexes);
    const bool anyForeignKey = isAnySelected(ForeignKeys);
    Selected = anyField || anyIndex || anyForeignKey;
    if (!Selected) {
        CopyStructure = 0;
        CopyData = 0;
    } else if (CopyStructure == 0 && CopyData == 0) {
        CopyStructure = 1;
        CopyData = 1;
    }
    if (!anyField) CopyData = 0;
    CopyIndexes = anyIndex;
    CopyForeignKeys = anyForeignKey;
    if (!anyField) ModifyFields = 0;
    if (!anyIndex) ModifyIndexes = 0;
    if (!anyForeignKey) ModifyForeignKeys = 0;
    recalcSelected(Database);
}
