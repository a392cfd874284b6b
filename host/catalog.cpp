#include "host/catalog.h"

#include <nlohmann/json.hpp>

#include "host/file_replacement.h"
#include "host/project.h"
#include "host/sqlite_form.h"

namespace zr::host {

namespace {

using Json = nlohmann::json;

CString textMember(const Json& object, const char* name, const std::string& where) {
    const auto found = object.find(name);
    if (found == object.end() || !found->is_string())
        throw CatalogError(where + ": \"" + name + "\" has to be a text");
    return CString::fromUtf8(found->get_ref<const std::string&>());
}

CString inBraces(const CString& name) {
    return u"{" + name + u"}";
}

// An ID that a column has in every catalogue of the same names.
CString columnId(const CString& table, const CString& column) {
    return inBraces(table + u"." + column);
}

void addColumns(Table& table, const CString& tableName, const Json& columns, const std::string& where) {
    if (!columns.is_array()) throw CatalogError(where + ": \"columns\" has to be a list of texts");
    for (const Json& column : columns) {
        if (!column.is_string()) throw CatalogError(where + ": \"columns\" has to be a list of texts");
        const CString name = CString::fromUtf8(column.get_ref<const std::string&>());
        auto field = std::make_unique<Field>();
        setNames(*field, name);
        field->SetID(columnId(tableName, name));
        table.addField(std::move(field));
    }
}

std::unique_ptr<Table> readTable(const Json& entry, const std::string& where) {
    if (!entry.is_object()) throw CatalogError(where + " has to be an object");
    const CString name = textMember(entry, "table", where);
    auto table = std::make_unique<Table>();
    setNames(*table, name);
    table->SetID(entry.contains("id") ? textMember(entry, "id", where) : inBraces(name));
    if (const auto columns = entry.find("columns"); columns != entry.end())
        addColumns(*table, name, *columns, where);
    return table;
}

// A project's objects get new IDs whenever it is opened.
void nameIds(Database& database) {
    for (CZRTableInfo* table : database.Tables) {
        table->SetID(inBraces(table->GetSrcName()));
        for (CZRFieldInfo* field : table->Fields)
            field->SetID(columnId(table->GetSrcName(), field->GetSrcName()));
    }
    for (CZRQueryInfo* query : database.Queries) query->SetID(inBraces(query->GetSrcName()));
    database.ResolveReferences();
}

bool isObject(std::string_view json) {
    const std::size_t first = json.find_first_not_of(" \t\r\n\xEF\xBB\xBF");
    return first != std::string_view::npos && json[first] == '{';
}

}  // namespace

std::unique_ptr<Database> readCatalog(std::string_view json) {
    Json list;
    try {
        list = Json::parse(json);
    } catch (const Json::parse_error& error) {
        throw CatalogError(error.what());
    }
    if (!list.is_array()) throw CatalogError("the catalogue has to be a list of tables");

    auto database = std::make_unique<Database>();
    for (std::size_t at = 0; at < list.size(); ++at)
        database->addTable(readTable(list[at], "table " + std::to_string(at + 1) + " of the catalogue"));
    return database;
}

std::unique_ptr<Database> openCatalog(const std::string& path) {
    try {
        if (!isSqliteFile(path)) {
            const std::string json = readFile(path);
            if (!isObject(json)) return readCatalog(json);
        }
        auto database = loadProject(path);
        nameIds(*database);
        return database;
    } catch (const CatalogError& error) {
        throw CatalogError(path + ": " + error.what());
    } catch (const std::runtime_error& error) {
        throw CatalogError(error.what());
    }
}

}  // namespace zr::host
