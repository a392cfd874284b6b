#pragma once

#include "zrparsersql/source_info.h"
#include "zrparsersql/table_info.h"

// Columns, indexes and foreign keys of a table. Each tells its table when its selection changes. What a class
// adds to the common members is kept in a section "Host" of its own.
namespace zr::host {

class Field : public CZRFieldInfo {
 public:
    CString Collation;
    int ExcludedFromKey = 0;

    Field* Clone(int selectedOnly = 0) const override;
    bool IsDerivedSource() const override { return false; }
    bool IsBaseTable() const override { return false; }
    void SetSelected(int value) override;
    void Save(CZRStorageNode& node) override;
    void Load(CZRStorageNode& node, CZRDescriptorFactory& factory) override;
    void SetOwner(CZRTableInfo* owner) override { owner_ = owner; }
    // The mapped type with length and scale; the source's where there is no mapped one.
    CString GetTypeDefinition() const override;
    CString GetCollation() const override { return Collation; }
    int IsExcludedFromKey() const override { return ExcludedFromKey; }

    CZRTableInfo* GetOwner() const { return owner_; }

 private:
    CZRTableInfo* owner_ = nullptr;
};

// A column of an index, known by its SrcName: that is how a table looks it up.
class IndexColumn : public CZRIndexColumn {
 public:
    explicit IndexColumn(CString srcName) : srcName_(std::move(srcName)) {}
    CString GetColumnID() const override { return srcName_; }

 private:
    CString srcName_;
};

class Index : public CZRIndexInfo {
 public:
    int PrimaryKey = 0;
    int Unique = 0;

    Index() = default;
    Index(const Index& other);
    ~Index() override;

    Index* Clone(int selectedOnly = 0) const override;
    bool IsDerivedSource() const override { return false; }
    bool IsBaseTable() const override { return false; }
    void SetSelected(int value) override;
    void Save(CZRStorageNode& node) override;
    void Load(CZRStorageNode& node, CZRDescriptorFactory& factory) override;
    void SetOwner(CZRTableInfo* owner) override { owner_ = owner; }
    // Resolved becomes whether the table has all of the columns.
    void ResolveReferences() override;
    int IsPrimaryKey() const override { return PrimaryKey; }
    // A primary key is unique, too.
    int IsUnique() const override { return PrimaryKey != 0 || Unique != 0; }

    void addColumn(const CString& srcName);

 private:
    void clearColumns();

    CZRTableInfo* owner_ = nullptr;
};

class ForeignKey : public CZRForeignKeyInfo {
 public:
    struct ColumnPair {
        CString column;      // of the table that has the key
        CString referenced;  // of the table that the key refers to
    };
    CString ReferencedTable;  // SrcName
    CList<ColumnPair> Columns;

    ForeignKey() = default;
    ForeignKey(const ForeignKey& other);

    ForeignKey* Clone(int selectedOnly = 0) const override;
    bool IsDerivedSource() const override { return false; }
    bool IsBaseTable() const override { return false; }
    void SetSelected(int value) override;
    void Save(CZRStorageNode& node) override;
    void Load(CZRStorageNode& node, CZRDescriptorFactory& factory) override;
    void SetOwner(CZRTableInfo* owner) override { owner_ = owner; }
    // Looks the table up in the owner's database. Resolved becomes whether it has all of the columns.
    void ResolveReferences() override;
    // Empty until the references were resolved.
    CString GetReferencedTableID() const override { return referencedTableId_; }

 private:
    CZRTableInfo* owner_ = nullptr;
    CString referencedTableId_;
};

}  // namespace zr::host
