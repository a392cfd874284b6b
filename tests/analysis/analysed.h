#pragma once

#include <string_view>

#include "zrparsersql/analysis.h"
#include "zrparsersql/database_info.h"
#include "zrparsersql/query_info.h"
#include "zrparsersql/table_info.h"

class TestDatabase final : public CZRDatabaseInfo {
 public:
    TestDatabase() = default;
    TestDatabase(const TestDatabase& other, int selectedOnly) : CZRDatabaseInfo(other, selectedOnly) {}
    TestDatabase* Clone(int selectedOnly = 0) const override { return new TestDatabase(*this, selectedOnly); }
};

class TestField final : public CZRFieldInfo {
 public:
    explicit TestField(const CString& name) {
        SetName(name);
        SetSrcName(name);
    }
    TestField* Clone(int = 0) const override { return new TestField(*this); }
    bool IsDerivedSource() const override { return false; }
    bool IsBaseTable() const override { return false; }
    void SetOwner(CZRTableInfo*) override {}
    CString GetTypeDefinition() const override { return CString(); }
    CString GetCollation() const override { return CString(); }
    int IsExcludedFromKey() const override { return 0; }
};

class TestTable final : public CZRTableInfo {
 public:
    explicit TestTable(const CString& name) {
        SetName(name);
        SetSrcName(name);
    }
    TestTable(const TestTable& other, int selectedOnly) : CZRTableInfo(other, selectedOnly) {}
    TestTable* Clone(int selectedOnly = 0) const override { return new TestTable(*this, selectedOnly); }
};

// A query that was taken through its analysis, with its database.
struct Analysed {
    TestDatabase database;
    CZRQueryInfo query;

    explicit Analysed(std::u16string_view sql, DBTypes kind = DB_MSSQL) {
        query.SetDatabase(&database);
        again(sql, kind);
    }
    void again(std::u16string_view sql, DBTypes kind = DB_MSSQL) {
        query.SetSQL(CString(sql));
        BuildQueryInfo(&query, kind);
    }
};
