#pragma once

#include "zrparsersql/database_info.h"
#include "zrparsersql/filter_info.h"
#include "zrparsersql/query_info.h"
#include "zrparsersql/storage.h"
#include "zrparsersql/table_info.h"

namespace zr::test {

// The smallest host that a model works with: concrete classes for everything that the library leaves
// abstract.

class Field : public CZRFieldInfo {
 public:
    Field() = default;
    explicit Field(const CString& name) {
        Name = name;
        SrcName = name;
    }
    Field(const Field&) = default;
    Field* Clone(int = 0) const override { return new Field(*this); }
    bool IsDerivedSource() const override { return false; }
    bool IsBaseTable() const override { return false; }
    void SetSelected(int value) override {
        CZRFieldInfo::SetSelected(value);
        if (owner) owner->RecalcFromChildren();
    }
    void SetOwner(CZRTableInfo* table) override { owner = table; }
    CString GetTypeDefinition() const override { return typeDefinition; }
    CString GetCollation() const override { return collation; }
    int IsExcludedFromKey() const override { return excludedFromKey; }

    CZRTableInfo* owner = nullptr;
    CString typeDefinition;
    CString collation;
    int excludedFromKey = 0;
};

class IndexColumn : public CZRIndexColumn {
 public:
    explicit IndexColumn(const CString& name) : id(name) {}
    CString GetColumnID() const override { return id; }
    CString id;
};

class Index : public CZRIndexInfo {
 public:
    Index() = default;
    explicit Index(const CString& name, std::initializer_list<const char16_t*> columns = {}) {
        Name = name;
        SrcName = name;
        for (const char16_t* column : columns) addColumn(column);
    }
    Index(const Index& other) : CZRIndexInfo(other), primaryKey(other.primaryKey), unique(other.unique) {
        for (const CZRIndexColumn* column : other.Columns) addColumn(column->GetColumnID());
    }
    ~Index() override {
        for (CZRIndexColumn* column : Columns) delete column;
    }
    void addColumn(const CString& column) {
        Columns.AddTail(new IndexColumn(column));
        ++ColumnCount;
    }
    Index* Clone(int = 0) const override { return new Index(*this); }
    bool IsDerivedSource() const override { return false; }
    bool IsBaseTable() const override { return false; }
    void SetOwner(CZRTableInfo* table) override { owner = table; }
    void ResolveReferences() override { ++resolved; }
    int IsPrimaryKey() const override { return primaryKey; }
    int IsUnique() const override { return unique; }

    CZRTableInfo* owner = nullptr;
    int primaryKey = 0;
    int unique = 0;
    int resolved = 0;
};

class ForeignKey : public CZRForeignKeyInfo {
 public:
    ForeignKey() = default;
    ForeignKey(const CString& name, const CString& table) : referencedTable(table) {
        Name = name;
        SrcName = name;
    }
    ForeignKey(const ForeignKey& other) : CZRForeignKeyInfo(other), referencedTable(other.referencedTable) {}
    ForeignKey* Clone(int = 0) const override { return new ForeignKey(*this); }
    bool IsDerivedSource() const override { return false; }
    bool IsBaseTable() const override { return false; }
    void SetOwner(CZRTableInfo* table) override { owner = table; }
    void ResolveReferences() override { ++resolved; }
    CString GetReferencedTableID() const override { return referencedTable; }

    CZRTableInfo* owner = nullptr;
    CString referencedTable;
    int resolved = 0;
};

class FilterItem : public CZRFilterItemInfo {
 public:
    FilterItem() = default;
    FilterItem(const CString& field, const char16_t* value) {
        FieldID = field;
        Value.SetWide(value, 1);
    }
    FilterItem(const FilterItem&) = default;
    CString GetConditionText() override { return FieldID; }
    FilterItem* Clone() const override { return new FilterItem(*this); }
};

class Filter : public CZRFilterInfo {
 public:
    explicit Filter(DBTypes kind = DB_MSSQL) : type(kind) {}
    Filter(const Filter&) = default;
    DBTypes GetDBType() const override { return type; }
    CString GetFilterText() override { return SQLQuery; }
    Filter* Clone() const override { return new Filter(*this); }

    DBTypes type;
};

class Table : public CZRTableInfo {
 public:
    Table() = default;
    explicit Table(const CString& name, std::initializer_list<const char16_t*> fields = {}) {
        Name = name;
        SrcName = name;
        for (const char16_t* field : fields) addField(field);
    }
    Table(const Table& other, int selectedOnly) : CZRTableInfo(other, selectedOnly), type(other.type) {}
    Table* Clone(int selectedOnly = 0) const override { return new Table(*this, selectedOnly); }
    DBTypes GetDBType() const override { return type; }

    Field* addField(const CString& name) { return add(Fields, new Field(name)); }
    Index* addIndex(Index* index) { return add(Indexes, index); }
    ForeignKey* addForeignKey(const CString& name, const CString& table) {
        return add(ForeignKeys, new ForeignKey(name, table));
    }
    Field* field(const CString& name) { return static_cast<Field*>(FindFieldBySrcName(name)); }

    DBTypes type = DB_MSSQL;

 private:
    template <class List, class Object>
    Object* add(List& list, Object* object) {
        list.AddTail(object);
        object->SetOwner(this);
        return object;
    }
};

class Query : public CZRQueryInfo {
 public:
    Query() = default;
    explicit Query(const CString& name) {
        Name = name;
        SrcName = name;
    }
    Query(const Query&) = default;
    Query* Clone(int = 0) const override { return new Query(*this); }
    DBTypes GetDBType() const override { return type; }

    // What an analysis would have filled.
    Query& readsFrom(const CString& name) {
        m_sourceTables[name] = name;
        return *this;
    }
    Query& refersTo(const CString& table, const CString& column) {
        auto* field = new CFieldObject;
        field->m_table = table;
        field->m_field = column;
        m_fields[table + column] = field;
        return *this;
    }
    CZRAliasInfo& addAlias(const CString& name, const CString& column = CString()) {
        auto* alias = new CZRAliasInfo;
        alias->Name = name;
        alias->SrcName = name;
        alias->AliasField = column;
        CString key = name;
        key.MakeLower();
        m_aliases[key] = alias;
        return *alias;
    }

    DBTypes type = DB_NONE;
};

class Database : public CZRDatabaseInfo {
 public:
    Database() = default;
    Database(const Database& other, int selectedOnly)
        : CZRDatabaseInfo(other, selectedOnly), type(other.type) {}
    Database* Clone(int selectedOnly = 0) const override { return new Database(*this, selectedOnly); }
    DBTypes GetDBType() const override { return type; }

    Table& addTable(const CString& name, std::initializer_list<const char16_t*> fields = {}) {
        auto* table = new Table(name, fields);
        Tables.AddTail(table);
        table->SetDatabase(this);
        return *table;
    }
    Query& addQuery(const CString& name) {
        auto* query = new Query(name);
        Queries.AddTail(query);
        query->SetDatabase(this);
        return *query;
    }

    DBTypes type = DB_MSSQL;
};

class Factory : public CZRDescriptorFactory {
 public:
    CZRTableInfo* CreateTable(DBTypes kind) override { return made(kind, new Table); }
    CZRQueryInfo* CreateQuery(DBTypes kind) override { return made(kind, new Query); }
    CZRFieldInfo* CreateField(DBTypes kind) override { return made(kind, new Field); }
    CZRIndexInfo* CreateIndex(DBTypes kind) override { return made(kind, new Index); }
    CZRForeignKeyInfo* CreateForeignKey(DBTypes kind) override { return made(kind, new ForeignKey); }
    CZRFilterInfo* CreateFilter(DBTypes kind) override { return made(kind, new Filter(kind)); }
    CZRFilterItemInfo* CreateFilterItem(DBTypes kind) override { return made(kind, new FilterItem); }

    std::vector<DBTypes> kinds;  // asked for, in order

 private:
    template <class Object>
    Object* made(DBTypes kind, Object* object) {
        kinds.push_back(kind);
        return object;
    }
};

// Items, for building expressions by hand.
inline SelectItem* valueItem(const CString& text) {
    auto* item = new SelectItem;
    item->m_text = text;
    return item;
}
inline SelectItem* functionItem(const CString& name, std::initializer_list<SelectItem*> items = {}) {
    auto* item = new SelectItem;
    item->m_name = name;
    item->m_kind = SIK_FUNCTION;
    for (SelectItem* child : items) item->m_items.AddTail(child);
    return item;
}
inline SelectItemField* fieldItem(const CString& table, const CString& column) {
    auto* item = new SelectItemField;
    item->m_sourceTable = table;
    item->m_sourceField = column;
    return item;
}

}  // namespace zr::test
