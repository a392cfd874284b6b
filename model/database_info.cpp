#include "zrparsersql/database_info.h"

#include "model/named_search.h"
#include "model/nested_queries.h"
#include "model/owned_append.h"
#include "model/retired_model.h"
#include "model/source_index.h"

namespace {

void endTablesAndQueries(CZRDatabaseInfo& database) {
    for (CZRTableInfo* table : database.Tables) delete table;
    for (CZRQueryInfo* query : database.Queries) delete query;
}

}  // namespace

CZRDatabaseInfo::CZRDatabaseInfo() = default;

CZRDatabaseInfo::CZRDatabaseInfo(const CZRDatabaseInfo& other, int selectedOnly)
    : CZRObjectInfo(other),
      SchemaName(other.SchemaName),
      OverwriteDatabase(other.OverwriteDatabase),
      OverwriteTables(other.OverwriteTables),
      AutoStructureUpdate(other.AutoStructureUpdate),
      HandleSelectedObjects(other.HandleSelectedObjects),
      CreateLogsEnabled(other.CreateLogsEnabled),
      CreateDiff(other.CreateDiff),
      CreateUndiff(other.CreateUndiff),
      BulkInsert(other.BulkInsert),
      Quant(other.Quant),
      CloseExistingConnections(other.CloseExistingConnections),
      CaseState(other.CaseState),
      GarbageSymbols(other.GarbageSymbols),
      GarbageReplace(other.GarbageReplace),
      ExtraText(other.ExtraText),
      Version(other.Version),
      MaxThreads(other.MaxThreads),
      MaxQuant(other.MaxQuant),
      WithTriggers(other.WithTriggers),
      WithBidirectional(other.WithBidirectional),
      UseHistoryCopyData(other.UseHistoryCopyData),
      UseTriggersOnlyMaster(other.UseTriggersOnlyMaster),
      BidirectionalSync(other.BidirectionalSync),
      CleanHistoryAfterUse(other.CleanHistoryAfterUse),
      ModifiedTriggers(other.ModifiedTriggers),
      ExtraFlag(other.ExtraFlag) {
    const auto isLeftOut = [selectedOnly](const CZRObjectInfo* object) {
        return !object || (selectedOnly && object->GetSelected() == 0);
    };
    try {
        for (const CZRTableInfo* table : other.Tables) {
            if (isLeftOut(table)) continue;
            CZRTableInfo* clone = table->Clone(selectedOnly);
            zr::appendOwned(Tables, clone);
            clone->SetDatabase(this);
        }
        for (const CZRQueryInfo* query : other.Queries) {
            if (isLeftOut(query)) continue;
            CZRQueryInfo* clone = query->Clone(selectedOnly);
            zr::appendOwned(Queries, clone);
            // Nested descriptors too: none of them may look into the database they were copied from.
            for (CZRQueryInfo* nested : zr::withNestedQueries(*clone)) nested->SetDatabase(this);
        }
        for (const auto& entry : other.UserFunctions) UserFunctions[entry.key] = entry.value;
    } catch (...) {
        // What is only half made has no destructor.
        endTablesAndQueries(*this);
        throw;
    }
}

CZRDatabaseInfo::~CZRDatabaseInfo() {
    endTablesAndQueries(*this);
}

bool CZRDatabaseInfo::IsDerivedSource() const {
    return true;
}
bool CZRDatabaseInfo::IsBaseTable() const {
    return false;
}

bool CZRDatabaseInfo::GetDialectFlag1() const {
    return false;
}
bool CZRDatabaseInfo::GetDialectFlag2() const {
    return false;
}
int CZRDatabaseInfo::GetDialectFlag3() const {
    return 0;
}
int CZRDatabaseInfo::GetDialectValue1() const {
    return 0;
}
int CZRDatabaseInfo::GetDialectValue2() const {
    return 0;
}
zr::DialectRecord CZRDatabaseInfo::GetDialectRecord() const {
    return {};
}
void CZRDatabaseInfo::ResetDialectState() {}
int CZRDatabaseInfo::GetDialectValue3() const {
    return 0;
}

void CZRDatabaseInfo::SetSelected(int value) {
    if (value == Selected) return;
    UpdateDepth = 1;
    for (CZRTableInfo* table : Tables)
        if (table) table->SetSelected(value);
    Selected = value;
    UpdateDepth = 0;
}

void CZRDatabaseInfo::RecalcSelected() {
    if (UpdateDepth) return;
    Selected = 0;
    for (const CZRTableInfo* table : Tables)
        if (table && table->GetSelected()) Selected = 1;
}

void CZRDatabaseInfo::SetOverwriteDatabase(int value) {
    if (value != 0 && OverwriteDatabase == 0) {
        UpdateDepth = 1;
        for (CZRTableInfo* table : Tables)
            if (table) table->SetOverwriteTable(value);
        UpdateDepth = 0;
    }
    OverwriteDatabase = value;
}

void CZRDatabaseInfo::ResolveReferences() {
    for (CZRTableInfo* table : Tables)
        if (table) table->ResolveReferences();
}

void CZRDatabaseInfo::SetAllProcessed(int value) {
    for (CZRTableInfo* table : Tables)
        if (table) table->SetProcessed(value);
}

CZRTableInfo* CZRDatabaseInfo::FindTableBySrcName(CString name) const {
    return zr::findFirst(Tables, name, &CZRObjectInfo::GetSrcName);
}
CZRTableInfo* CZRDatabaseInfo::FindTableByName(CString name) const {
    return zr::findFirst(Tables, name, &CZRObjectInfo::GetName);
}
CZRTableInfo* CZRDatabaseInfo::FindTableByID(CString id) const {
    return zr::findFirst(Tables, id, &CZRObjectInfo::GetID);
}
CZRQueryInfo* CZRDatabaseInfo::FindQueryBySrcName(CString name) const {
    return zr::findFirst(Queries, name, &CZRObjectInfo::GetSrcName);
}
CZRQueryInfo* CZRDatabaseInfo::FindQueryByID(CString id) const {
    return zr::findFirst(Queries, id, &CZRObjectInfo::GetID);
}
