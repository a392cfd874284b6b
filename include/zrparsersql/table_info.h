#pragma once

#include "zrparsersql/containers.h"
#include "zrparsersql/critical_section.h"
#include "zrparsersql/filter_info.h"
#include "zrparsersql/source_info.h"

class CZRDatabaseInfo;

// One table: columns, indexes, foreign keys, the filter on its rows, and the options that say what a
// conversion does with it. The options are kept consistent with each other, with the selection of the
// children and with the database. Setters refuse what does not fit without a report.
//
// Owns its children and its filter. Threads: Processed may be written and read by several threads through
// SetProcessed, GetProcessed and the two Are...TablesProcessed; everything else belongs to the one thread
// that configures.
class ZR_SHARED_DECLARATION CZRTableInfo : public CZRSourceInfo {
 public:
    int UpdateDepth = 0;                  // above 0 while an option setter is at work
    CZRIndexInfo* UniqueIndex = nullptr;  // result of GetUniqueIndex; not owned
    int UniqueIndexDirty = 1;
    CZRDatabaseInfo* Database = nullptr;  // not owned
    CZRFilterInfo* Filter = nullptr;      // owned
    int CopyStructure = 1;
    int CopyIndexes = 1;
    int CopyForeignKeys = 1;
    int CopyData = 1;
    int OverwriteTable = 0;
    int TruncateTable = 0;
    int ModifyFields = 0;
    int ModifyIndexes = 0;
    int ModifyForeignKeys = 0;
    int SyncInsert = 1;
    int SyncUpdate = 1;
    int SyncDrop = 1;
    mutable CCriticalSection Lock;  // guards Processed, one access at a time
    int Processed = 0;
    CList<CZRFieldInfo*> Fields;
    CList<CZRIndexInfo*> Indexes;
    CList<CZRForeignKeyInfo*> ForeignKeys;

    CZRTableInfo();
    // A deep copy that belongs to no database yet. selectedOnly leaves out children that are not selected.
    CZRTableInfo(const CZRTableInfo& other, int selectedOnly);
    CZRTableInfo(const CZRTableInfo& other) : CZRTableInfo(other, 0) {}
    ~CZRTableInfo() override;

    CZRTableInfo* Clone(int selectedOnly = 0) const override = 0;
    void SetSelected(int value) override;
    void Save(CZRStorageNode& node) override;
    void Load(CZRStorageNode& node, CZRDescriptorFactory& factory) override;
    bool IsDerivedSource() const override;
    bool IsBaseTable() const override;
    CZRSourceFildInfo* FindFieldByID(CString id) override;
    CZRSourceFildInfo* FindFieldByName(CString name) override;
    CZRSourceFildInfo* FindFieldBySrcName(CString name) override;
    int Validate(int requireAllSelected) override;

    // Called when the selection of a child has changed. Does nothing while an option setter is at work.
    virtual void RecalcFromChildren();
    virtual CZRIndexInfo* GetPrimaryKey();
    virtual int GetCopyStructure() const;
    // The option's lowest bit, and 0 for a table without indexes (foreign keys).
    virtual int GetCopyIndexes() const;
    virtual int GetCopyForeignKeys() const;
    virtual int GetCopyData() const;
    virtual int GetSyncInsert() const;
    virtual int GetSyncUpdate() const;
    virtual int GetSyncDrop() const;
    virtual int GetOverwriteTable() const;
    virtual int GetTruncateTable() const;
    virtual int GetModifyFields() const;
    virtual int GetModifyIndexes() const;
    virtual int GetModifyForeignKeys() const;
    virtual CZRDatabaseInfo* GetDatabase() const;
    // SetCopyStructure and SetCopyData need a database.
    virtual void SetCopyStructure(int value);
    virtual void SetCopyIndexes(int value);
    virtual void SetCopyForeignKeys(int value);
    virtual void SetCopyData(int value);
    virtual void SetSyncInsert(int value);
    virtual void SetSyncUpdate(int value);
    virtual void SetSyncDrop(int value);
    virtual void SetOverwriteTable(int value);
    virtual void SetTruncateTable(int value);
    virtual void SetModifyFields(int value);
    virtual void SetModifyIndexes(int value);
    virtual void SetModifyForeignKeys(int value);
    virtual void SetDatabase(CZRDatabaseInfo* database);
    // Merges the settings of a table of another source into this one; its filter only when it is for that
    // kind of database.
    virtual void CopyFrom(CZRTableInfo& other, DBTypes dbType);
    // Texts of a dialect's subclass; empty and ignored here.
    virtual CString GetDialectText1() const;
    virtual CString GetDialectText2() const;
    virtual CString GetDialectText3() const;
    virtual void SetDialectText1(CString value);
    virtual void SetDialectText2(CString value);
    virtual void SetDialectText3(CString value);
    virtual void SetDialectText4(CString value);
    virtual CString GetDialectText4() const;
    virtual void ResetDialectState();

    // Without regard to case, or null.
    CZRIndexInfo* FindIndexBySrcName(CString name);
    CZRIndexInfo* FindIndexByName(CString name);
    CZRIndexInfo* FindIndexByID(CString id);
    CZRForeignKeyInfo* FindForeignKeyBySrcName(CString name);
    CZRForeignKeyInfo* FindForeignKeyByName(CString name);
    // Exact in case, unlike FindIndexByID: hosts rely on it.
    CZRForeignKeyInfo* FindForeignKeyByID(CString id);

    CZRFilterInfo* GetFilter() const { return Filter; }
    // Replaces the filter by a copy of the one given, without the conditions on columns that the table does
    // not have. A copy with neither conditions nor SQL text left is dropped. Null removes the filter.
    void AttachFilterCopy(const CZRFilterInfo* filter);
    void ResolveReferences();

    // The first unique index, remembered until UniqueIndexDirty is set; or null.
    CZRIndexInfo* GetUniqueIndex();
    // The primary key, else the unique index of fewest columns, or null.
    CZRIndexInfo* GetBestKey();
    // The key by which selected rows can be addressed, or null.
    CZRIndexInfo* FindKeyForSelection();
    // Enters the columns of that key which are selected, with null values.
    void CollectKeyColumns(CMapStringToPtr& columns);

    void SetProcessed(int value);
    int GetProcessed() const;
    // 1 when no table that refers to this one, or that this one refers to, has Processed 0.
    int AreReferencingTablesProcessed();
    int AreReferencedTablesProcessed();

    // Deletes children and filter.
    void Clear();
};
