#pragma once

#include <memory>

#include "host/columns.h"
#include "host/filters.h"
#include "zrparsersql/database_info.h"
#include "zrparsersql/query_info.h"
#include "zrparsersql/storage.h"
#include "zrparsersql/table_info.h"

// Tables, queries and databases of each kind, and the factory that makes every class of this host.
namespace zr::host {

class Table : public CZRTableInfo {
 public:
    explicit Table(DBTypes kind = DB_NONE) : kind_(kind) {}
    Table(const Table& other, int selectedOnly) : CZRTableInfo(other, selectedOnly), kind_(other.kind_) {}

    Table* Clone(int selectedOnly = 0) const override { return new Table(*this, selectedOnly); }
    DBTypes GetDBType() const override { return kind_; }

    // Take an object in at the end.
    Field& addField(std::unique_ptr<Field> field);
    Index& addIndex(std::unique_ptr<Index> index);
    ForeignKey& addForeignKey(std::unique_ptr<ForeignKey> key);

 private:
    DBTypes kind_;
};

// A query whose text is kept: the analysis can be made anew wherever the model is opened.
class Query : public CZRQueryInfo {
 public:
    explicit Query(DBTypes kind = DB_NONE) : kind_(kind) {}
    Query(const Query&) = default;

    Query* Clone(int /*selectedOnly*/ = 0) const override { return new Query(*this); }
    DBTypes GetDBType() const override { return kind_; }
    void SaveQuery(CZRStorageNode& node) override;
    void Load(CZRStorageNode& node, CZRDescriptorFactory& factory) override;

 private:
    DBTypes kind_;
};

// A clone keeps all IDs, so that what is resolved against a clone means the same object of the original.
class Database : public CZRDatabaseInfo {
 public:
    explicit Database(DBTypes kind = DB_NONE) : kind_(kind) {}
    Database(const Database& other, int selectedOnly)
        : CZRDatabaseInfo(other, selectedOnly), kind_(other.kind_) {}

    Database* Clone(int selectedOnly = 0) const override { return new Database(*this, selectedOnly); }
    DBTypes GetDBType() const override { return kind_; }

    // Take an object in at the end.
    Table& addTable(std::unique_ptr<Table> table);
    Query& addQuery(std::unique_ptr<Query> query);

 private:
    DBTypes kind_;
};

// Makes objects of every known kind and of none; any other raises UnknownKind.
class Factory : public CZRDescriptorFactory {
 public:
    CZRTableInfo* CreateTable(DBTypes kind) override;
    CZRQueryInfo* CreateQuery(DBTypes kind) override;
    CZRFieldInfo* CreateField(DBTypes kind) override;
    CZRIndexInfo* CreateIndex(DBTypes kind) override;
    CZRForeignKeyInfo* CreateForeignKey(DBTypes kind) override;
    CZRFilterInfo* CreateFilter(DBTypes kind) override;
    CZRFilterItemInfo* CreateFilterItem(DBTypes kind) override;
};

// Both names of an object.
void setNames(CZRObjectInfo& object, const CString& name);

}  // namespace zr::host
