#pragma once

#include <cstdint>
#include <memory>

#include "zrparsersql/containers.h"
#include "zrparsersql/critical_section.h"
#include "zrparsersql/object_info.h"
#include "zrparsersql/query_info.h"
#include "zrparsersql/table_info.h"

namespace zr {

// What a dialect's subclass can tell of itself in one answer.
struct DialectRecord {
    int first = 0;
    int second = 0;
    int third = 0;
};

class RetiredModel;
class SourceIndex;

}  // namespace zr

// Root of a model: tables and queries of one database, the options of a conversion, and the user functions
// that the analysis met. Queries look up their sources through it.
//
// Owns its tables and queries. Threads: none of it is guarded, and a query's analysis writes UserFunctions
// (CZRQueryInfo::AddUserFunction). Apart from that an analysis only reads it: queries of one database may be
// analysed on several threads where no text calls a user function and nobody changes tables or queries
// meanwhile. Texts from outside may call some; a thread that analyses those has a database of its own, such
// as a clone. So has one that resolves columns, which marks sources.
class ZR_SHARED_DECLARATION CZRDatabaseInfo : public CZRObjectInfo {
 public:
    CString SchemaName;
    int UpdateDepth = 0;  // set while the selection or an option is passed on to the tables
    int OverwriteDatabase = 0;
    int OverwriteTables = 0;
    int AutoStructureUpdate = 0;
    int HandleSelectedObjects = 0;
    int CreateLogsEnabled = 0;
    int CreateDiff = 0;
    int CreateUndiff = 0;
    int BulkInsert = 1;
    int Quant = 0;
    int CloseExistingConnections = 0;
    std::int16_t CaseState = 0;
    CString GarbageSymbols;
    CString GarbageReplace;
    CString ExtraText;
    CString Version;
    std::uint8_t MaxThreads = 1;
    int MaxQuant = 100;
    int WithTriggers = 0;
    int WithBidirectional = 0;
    int UseHistoryCopyData = 1;
    int UseTriggersOnlyMaster = 0;
    int BidirectionalSync = 0;
    int CleanHistoryAfterUse = 1;
    int ModifiedTriggers = 0;
    int ExtraFlag = 0;  // copied, not saved
    CList<CZRTableInfo*> Tables;
    CList<CZRQueryInfo*> Queries;
    CMapStringToString UserFunctions;  // by name: count of parameters as text
    CList<CString> NameList;           // neither copied nor saved

    CZRDatabaseInfo();
    // A deep copy; selectedOnly leaves out what is not selected, down to the children of tables.
    CZRDatabaseInfo(const CZRDatabaseInfo& other, int selectedOnly);
    CZRDatabaseInfo(const CZRDatabaseInfo& other) : CZRDatabaseInfo(other, 0) {}
    ~CZRDatabaseInfo() override;

    CZRDatabaseInfo* Clone(int selectedOnly = 0) const override = 0;
    void SetSelected(int value) override;
    void Save(CZRStorageNode& node) override;
    // Tables and queries that were there before stay alive as long as the database, but no longer belong to
    // it.
    void Load(CZRStorageNode& node, CZRDescriptorFactory& factory) override;
    bool IsDerivedSource() const override;
    bool IsBaseTable() const override;

    // Makes Selected what the tables say.
    virtual void RecalcSelected();
    // What a dialect's subclass may answer; nothing here.
    virtual bool GetDialectFlag1() const;
    virtual bool GetDialectFlag2() const;
    virtual int GetDialectFlag3() const;
    // Resolves the references of all indexes and foreign keys of all tables.
    virtual void ResolveReferences();
    // Merges the settings of another source's model into this one.
    virtual void MergeFrom(CZRDatabaseInfo& other, DBTypes dbType);
    virtual int GetDialectValue1() const;
    virtual int GetDialectValue2() const;
    virtual zr::DialectRecord GetDialectRecord() const;
    virtual void ResetDialectState();
    virtual int GetDialectValue3() const;

    // The first in list order, without regard to case, or null.
    CZRTableInfo* FindTableBySrcName(CString name) const;
    CZRTableInfo* FindTableByName(CString name) const;
    CZRTableInfo* FindTableByID(CString id) const;
    CZRQueryInfo* FindQueryBySrcName(CString name) const;
    CZRQueryInfo* FindQueryByID(CString id) const;

    void SetAllProcessed(int value);
    // Orders the queries so that each stands behind those it reads from. Queries that read from each other
    // stay in some order.
    void SortQueries();

    CString GetSchemaName() const { return SchemaName; }
    void SetSchemaName(CString value) { SchemaName = std::move(value); }
    int GetOverwriteDatabase() const { return OverwriteDatabase; }
    // Switched on, it is passed on to all tables.
    void SetOverwriteDatabase(int value);
    int GetOverwriteTables() const { return OverwriteTables; }
    void SetOverwriteTables(int value) { OverwriteTables = value; }
    int GetAutoStructureUpdate() const { return AutoStructureUpdate; }
    void SetAutoStructureUpdate(int value) { AutoStructureUpdate = value; }
    int GetHandleSelectedObjects() const { return HandleSelectedObjects; }
    void SetHandleSelectedObjects(int value) { HandleSelectedObjects = value; }
    int GetCreateLogsEnabled() const { return CreateLogsEnabled; }
    void SetCreateLogsEnabled(int value) { CreateLogsEnabled = value; }
    int GetCreateDiff() const { return CreateDiff; }
    void SetCreateDiff(int value) { CreateDiff = value; }
    int GetCreateUndiff() const { return CreateUndiff; }
    void SetCreateUndiff(int value) { CreateUndiff = value; }
    int GetBulkInsert() const { return BulkInsert; }
    void SetBulkInsert(int value) { BulkInsert = value; }
    int GetQuant() const { return Quant; }
    void SetQuant(int value) { Quant = value; }
    int GetCloseExistingConnections() const { return CloseExistingConnections; }
    void SetCloseExistingConnections(int value) { CloseExistingConnections = value; }
    std::int16_t GetCaseState() const { return CaseState; }
    void SetCaseState(std::int16_t value) { CaseState = value; }
    CString GetGarbageSymbols() const { return GarbageSymbols; }
    void SetGarbageSymbols(CString value) { GarbageSymbols = std::move(value); }
    CString GetGarbageReplace() const { return GarbageReplace; }
    void SetGarbageReplace(CString value) { GarbageReplace = std::move(value); }
    CString GetExtraText() const { return ExtraText; }
    void SetExtraText(CString value) { ExtraText = std::move(value); }
    CString GetVersion() const { return Version; }
    void SetVersion(CString value) { Version = std::move(value); }
    std::uint8_t GetMaxThreads() const { return MaxThreads; }
    void SetMaxThreads(std::uint8_t value) { MaxThreads = value; }
    int GetMaxQuant() const { return MaxQuant; }
    void SetMaxQuant(int value) { MaxQuant = value; }
    int GetWithTriggers() const { return WithTriggers; }
    void SetWithTriggers(int value) { WithTriggers = value; }
    int GetWithBidirectional() const { return WithBidirectional; }
    void SetWithBidirectional(int value) { WithBidirectional = value; }
    int GetUseHistoryCopyData() const { return UseHistoryCopyData; }
    void SetUseHistoryCopyData(int value) { UseHistoryCopyData = value; }
    int GetUseTriggersOnlyMaster() const { return UseTriggersOnlyMaster; }
    void SetUseTriggersOnlyMaster(int value) { UseTriggersOnlyMaster = value; }
    int GetBidirectionalSync() const { return BidirectionalSync; }
    void SetBidirectionalSync(int value) { BidirectionalSync = value; }
    int GetCleanHistoryAfterUse() const { return CleanHistoryAfterUse; }
    void SetCleanHistoryAfterUse(int value) { CleanHistoryAfterUse = value; }
    int GetModifiedTriggers() const { return ModifiedTriggers; }
    void SetModifiedTriggers(int value) { ModifiedTriggers = value; }
    int GetExtraFlag() const { return ExtraFlag; }
    void SetExtraFlag(int value) { ExtraFlag = value; }
    CList<CZRTableInfo*>& GetTables() { return Tables; }
    CList<CZRQueryInfo*>& GetQueries() { return Queries; }
    CMapStringToString& GetUserFunctions() { return UserFunctions; }
    CList<CString>& GetNameList() { return NameList; }

 private:
    friend class zr::SourceIndex;

    CCriticalSection sourceIndexLock_;
    std::shared_ptr<const zr::SourceIndex>
        sourceIndex_;                            // for the look-ups of queries; made when first needed
    std::unique_ptr<zr::RetiredModel> retired_;  // what Load took out of the lists
};
