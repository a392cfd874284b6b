// The classes that the library leaves to its host, as small as they can be: a column, a table, a query, a
// database.
#pragma once

#include <zrparsersql/database_info.h>
#include <zrparsersql/query_info.h>
#include <zrparsersql/source_info.h>
#include <zrparsersql/table_info.h>

#include <initializer_list>
#include <memory>

class Column : public CZRFieldInfo {
 public:
    Column* Clone(int /*selectedOnly*/ = 0) const override { return new Column(*this); }
    bool IsDerivedSource() const override { return false; }
    bool IsBaseTable() const override { return false; }
    void SetOwner(CZRTableInfo* /*owner*/) override {}
    CString GetTypeDefinition() const override { return GetTypeMapped(); }
    CString GetCollation() const override { return CString(); }
    int IsExcludedFromKey() const override { return 0; }
};

class Table : public CZRTableInfo {
 public:
    Table() = default;
    Table(const Table& other, int selectedOnly) : CZRTableInfo(other, selectedOnly) {}
    Table* Clone(int selectedOnly = 0) const override { return new Table(*this, selectedOnly); }
    DBTypes GetDBType() const override { return DB_MSSQL; }

    void addColumn(const CString& name) {
        auto column = std::make_unique<Column>();
        column->SetName(name);
        column->SetSrcName(name);
        column->SetOwner(this);
        Fields.AddTail(column.get());
        column.release();  // the table owns it
    }
};

class Query : public CZRQueryInfo {
 public:
    Query() = default;
    Query(const Query&) = default;
    Query* Clone(int /*selectedOnly*/ = 0) const override { return new Query(*this); }
    DBTypes GetDBType() const override { return DB_MSSQL; }
};

class Database : public CZRDatabaseInfo {
 public:
    Database() = default;
    Database(const Database& other, int selectedOnly) : CZRDatabaseInfo(other, selectedOnly) {}
    Database* Clone(int selectedOnly = 0) const override { return new Database(*this, selectedOnly); }
    DBTypes GetDBType() const override { return DB_MSSQL; }

    Table& addTable(const CString& name, std::initializer_list<const char16_t*> columns) {
        auto table = std::make_unique<Table>();
        table->SetName(name);
        table->SetSrcName(name);
        table->SetDatabase(this);
        for (const char16_t* column : columns) table->addColumn(column);
        Tables.AddTail(table.get());
        return *table.release();  // the database owns it
    }
    Query& addQuery(const CString& name) {
        auto query = std::make_unique<Query>();
        query->SetName(name);
        query->SetSrcName(name);
        query->SetDatabase(this);
        Queries.AddTail(query.get());
        return *query.release();  // the database owns it
    }
};
