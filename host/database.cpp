#include "host/database.h"

#include <memory>

#include "host/kinds.h"
#include "host/section.h"

namespace zr::host {

namespace {

// The list's owner owns the object as soon as the list has room for it.
template <class Base, class Object>
Object& takeIn(CList<Base*>& list, std::unique_ptr<Object> object) {
    const POSITION place = list.AddTail(nullptr);
    Object& taken = *object;
    list.SetAt(place, object.release());
    return taken;
}

DBTypes known(DBTypes kind) {
    if (kind != DB_NONE && !isKnownKind(kind)) throw UnknownKind(kind);
    return kind;
}

}  // namespace

Field& Table::addField(std::unique_ptr<Field> field) {
    field->SetOwner(this);
    return takeIn(Fields, std::move(field));
}

Index& Table::addIndex(std::unique_ptr<Index> index) {
    index->SetOwner(this);
    UniqueIndexDirty = 1;
    return takeIn(Indexes, std::move(index));
}

ForeignKey& Table::addForeignKey(std::unique_ptr<ForeignKey> key) {
    key->SetOwner(this);
    return takeIn(ForeignKeys, std::move(key));
}

void Query::SaveQuery(CZRStorageNode& node) {
    CZRQueryInfo::SaveQuery(node);
    const Section section(node, kHostSection, true);
    node.WriteString(u"SQL", m_sql, 0);
}

void Query::Load(CZRStorageNode& node, CZRDescriptorFactory& factory) {
    CZRQueryInfo::Load(node, factory);
    const Section section(node, kHostSection, false);
    m_sql = node.ReadString(u"SQL", CString(), 0);
}

Table& Database::addTable(std::unique_ptr<Table> table) {
    table->SetDatabase(this);
    return takeIn(Tables, std::move(table));
}

Query& Database::addQuery(std::unique_ptr<Query> query) {
    query->SetDatabase(this);
    return takeIn(Queries, std::move(query));
}

CZRTableInfo* Factory::CreateTable(DBTypes kind) {
    return new Table(known(kind));
}
CZRQueryInfo* Factory::CreateQuery(DBTypes kind) {
    return new Query(known(kind));
}
CZRFieldInfo* Factory::CreateField(DBTypes kind) {
    known(kind);
    return new Field;
}
CZRIndexInfo* Factory::CreateIndex(DBTypes kind) {
    known(kind);
    return new Index;
}
CZRForeignKeyInfo* Factory::CreateForeignKey(DBTypes kind) {
    known(kind);
    return new ForeignKey;
}
CZRFilterInfo* Factory::CreateFilter(DBTypes kind) {
    return new Filter(known(kind));
}
CZRFilterItemInfo* Factory::CreateFilterItem(DBTypes kind) {
    return new FilterItem(known(kind));
}

void setNames(CZRObjectInfo& object, const CString& name) {
    object.SetName(name);
    object.SetSrcName(name);
}

}  // namespace zr::host
