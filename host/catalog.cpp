#include "host/catalog.h"

#include <nlohmann/json.hpp>

namespace zr::host {

namespace {

using Json = nlohmann::json;

CString textMember(const Json& object, const char* name, const std::string& where) {
    const auto found = object.find(name);
    if (found == object.end() || !found->is_string())
        throw CatalogError(where + ": \"" + name + "\" has to be a text");
    return CString::fromUtf8(found->get_ref<const std::string&>());
}

void setNames(CZRObjectInfo& object, const CString& name, const CString& id) {
    object.SetName(name);
    object.SetSrcName(name);
    object.SetID(id);
}

CString inBraces(const CString& name) {
    return u"{" + name + u"}";
}

void addColumns(CatalogTable& table, const CString& tableName, const Json& columns,
                const std::string& where) {
    if (!columns.is_array()) throw CatalogError(where + ": \"columns\" has to be a list of texts");
    for (const Json& column : columns) {
        if (!column.is_string()) throw CatalogError(where + ": \"columns\" has to be a list of texts");
        const CString name = CString::fromUtf8(column.get_ref<const std::string&>());
        auto field = std::make_unique<CatalogField>();
        setNames(*field, name, inBraces(tableName + u"." + name));
        field->SetOwner(&table);
        table.Fields.AddTail(field.get());
        (void)field.release();  // the table owns its columns
    }
}

std::unique_ptr<CatalogTable> readTable(const Json& entry, const std::string& where) {
    if (!entry.is_object()) throw CatalogError(where + " has to be an object");
    const CString name = textMember(entry, "table", where);
    auto table = std::make_unique<CatalogTable>();
    setNames(*table, name, entry.contains("id") ? textMember(entry, "id", where) : inBraces(name));
    if (const auto columns = entry.find("columns"); columns != entry.end())
        addColumns(*table, name, *columns, where);
    return table;
}

}  // namespace

CatalogField* CatalogField::Clone(int /*selectedOnly*/) const {
    return new CatalogField(*this);
}
CatalogTable* CatalogTable::Clone(int selectedOnly) const {
    return new CatalogTable(*this, selectedOnly);
}
CatalogDatabase* CatalogDatabase::Clone(int selectedOnly) const {
    return new CatalogDatabase(*this, selectedOnly);
}

std::unique_ptr<CatalogDatabase> readCatalog(std::string_view json) {
    Json list;
    try {
        list = Json::parse(json);
    } catch (const Json::parse_error& error) {
        throw CatalogError(error.what());
    }
    if (!list.is_array()) throw CatalogError("the catalogue has to be a list of tables");

    auto database = std::make_unique<CatalogDatabase>();
    for (std::size_t at = 0; at < list.size(); ++at) {
        auto table = readTable(list[at], "table " + std::to_string(at + 1) + " of the catalogue");
        table->SetDatabase(database.get());
        database->Tables.AddTail(table.get());
        (void)table.release();  // the database owns its tables
    }
    return database;
}

}  // namespace zr::host
