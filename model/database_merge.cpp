#include "zrparsersql/database_info.h"

namespace {

void takeOptions(CZRDatabaseInfo& to, const CZRDatabaseInfo& from) {
    to.OverwriteDatabase = from.OverwriteDatabase;
    to.OverwriteTables = from.OverwriteTables;
    to.AutoStructureUpdate = from.AutoStructureUpdate;
    to.HandleSelectedObjects = from.HandleSelectedObjects;
    to.CreateLogsEnabled = from.CreateLogsEnabled;
    to.CreateDiff = from.CreateDiff;
    to.CreateUndiff = from.CreateUndiff;
    to.BulkInsert = from.BulkInsert;
    to.Quant = from.Quant;
    to.CloseExistingConnections = from.CloseExistingConnections;
    to.CaseState = from.CaseState;
    to.Version = from.Version;
    to.MaxThreads = from.MaxThreads;
    to.MaxQuant = from.MaxQuant;
    to.WithTriggers = from.WithTriggers;
    to.WithBidirectional = from.WithBidirectional;
    to.UseHistoryCopyData = from.UseHistoryCopyData;
    to.UseTriggersOnlyMaster = from.UseTriggersOnlyMaster;
    to.BidirectionalSync = from.BidirectionalSync;
    to.CleanHistoryAfterUse = from.CleanHistoryAfterUse;
    to.ModifiedTriggers = from.ModifiedTriggers;
    to.ExtraFlag = from.ExtraFlag;
}

}  // namespace

void CZRDatabaseInfo::MergeFrom(CZRDatabaseInfo& other, DBTypes dbType) {
    takeOptions(*this, other);

    for (CZRQueryInfo* query : Queries) {
        if (!query) continue;
        if (CZRQueryInfo* partner = other.FindQueryBySrcName(query->GetName()))
            query->CopyProperties(*partner, 0);
        else
            query->SetSelected(0);
    }

    int copiesData = 0;
    int copiesStructure = 0;
    for (const CZRTableInfo* table : other.Tables) {
        if (!table || !table->GetSelected()) continue;
        if (table->GetCopyData()) copiesData = 1;
        if (table->GetCopyStructure()) copiesStructure = 1;
    }
    for (CZRTableInfo* table : Tables) {
        if (!table) continue;
        if (CZRTableInfo* partner = other.FindTableBySrcName(table->GetSrcName())) {
            table->CopyFrom(*partner, dbType);
            continue;
        }
        table->SetSelected(AutoStructureUpdate);
        if (!AutoStructureUpdate) continue;
        table->SetCopyData(copiesData);
        table->SetCopyStructure(copiesStructure);
        if (OverwriteTables && !table->GetOverwriteTable()) table->SetOverwriteTable(1);
    }

    for (const auto& entry : other.UserFunctions) UserFunctions[entry.key] = entry.value;
}
