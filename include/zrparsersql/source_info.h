#pragma once

#include "zrparsersql/containers.h"
#include "zrparsersql/object_info.h"

class CZRTableInfo;

// A column of a source.
class ZR_SHARED_DECLARATION CZRSourceFildInfo : public CZRObjectInfo {
 public:
    CZRSourceFildInfo() = default;
    CZRSourceFildInfo(const CZRSourceFildInfo&) = default;

    CZRSourceFildInfo* Clone(int selectedOnly = 0) const override = 0;
};

// A source of rows: a table or a query, whatever a FROM clause can name. Whether it is a query is found by a
// dynamic cast to CZRQueryInfo.
class ZR_SHARED_DECLARATION CZRSourceInfo : public CZRObjectInfo {
 public:
    CZRSourceInfo() = default;
    CZRSourceInfo(const CZRSourceInfo&) = default;

    CZRSourceInfo* Clone(int selectedOnly = 0) const override = 0;

    // The column with that ID, Name or SrcName, without regard to case, or null. The source keeps owning it.
    virtual CZRSourceFildInfo* FindFieldByID(CString id) = 0;
    virtual CZRSourceFildInfo* FindFieldByName(CString name) = 0;
    virtual CZRSourceFildInfo* FindFieldBySrcName(CString name) = 0;
    // 0 when valid, else a code as in CZRObjectInfo::Correct.
    virtual int Validate(int requireAllSelected) = 0;
};

// What a model expects of a host's columns. The host's classes are made by its CZRDescriptorFactory.
class ZR_SHARED_DECLARATION CZRFieldInfo : public CZRSourceFildInfo {
 public:
    CZRFieldInfo() = default;
    CZRFieldInfo(const CZRFieldInfo&) = default;

    CZRFieldInfo* Clone(int selectedOnly = 0) const override = 0;
    // TypeMappedString becomes the type definition, with the collation behind it where there is one.
    void BuildTypeMappedString() override;

    // Tells the table that owns the column; a cloned column is told its new owner.
    virtual void SetOwner(CZRTableInfo* owner) = 0;
    // The complete target type as a definition writes it, and the collation or an empty text.
    virtual CString GetTypeDefinition() const = 0;
    virtual CString GetCollation() const = 0;
    // Nonzero keeps the column out of the keys by which rows are addressed.
    virtual int IsExcludedFromKey() const = 0;
};

// One column of an index.
class ZR_SHARED_DECLARATION CZRIndexColumn {
 public:
    virtual ~CZRIndexColumn();
    // ID of the column in the index's table.
    virtual CString GetColumnID() const = 0;
};

// What a model expects of a host's indexes.
class ZR_SHARED_DECLARATION CZRIndexInfo : public CZRObjectInfo {
 public:
    CList<CZRIndexColumn*> Columns;  // owned by the host's class
    int ColumnCount = 0;

    CZRIndexInfo() = default;
    // The columns are the host's class's to copy.
    CZRIndexInfo(const CZRIndexInfo& other) : CZRObjectInfo(other) {}

    CZRIndexInfo* Clone(int selectedOnly = 0) const override = 0;

    // Tells the table that owns the index; it is not owned here.
    virtual void SetOwner(CZRTableInfo* owner) = 0;
    // Looks the columns up in the owner by their IDs and notes it in Resolved.
    virtual void ResolveReferences() = 0;
    // 1 or 0.
    virtual int IsPrimaryKey() const = 0;
    virtual int IsUnique() const = 0;
};

// What a model expects of a host's foreign keys.
class ZR_SHARED_DECLARATION CZRForeignKeyInfo : public CZRObjectInfo {
 public:
    CZRForeignKeyInfo() = default;
    CZRForeignKeyInfo(const CZRForeignKeyInfo&) = default;

    CZRForeignKeyInfo* Clone(int selectedOnly = 0) const override = 0;

    // Tells the table that owns the key; it is not owned here.
    virtual void SetOwner(CZRTableInfo* owner) = 0;
    // Looks table and columns up in the owner's database by their IDs and notes it in Resolved.
    virtual void ResolveReferences() = 0;
    // ID of the table that the key refers to.
    virtual CString GetReferencedTableID() const = 0;
};
