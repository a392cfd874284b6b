#include "host/dump_reader.h"

#include <charconv>
#include <map>
#include <nlohmann/json.hpp>

#include "host/csv.h"

namespace zr::host {

namespace {

using Json = nlohmann::json;

// A row's values by name in upper case; what is null or empty is not there.
using Row = std::map<std::string, std::string>;

std::string upper(std::string text) {
    for (char& unit : text)
        if (unit >= 'a' && unit <= 'z') unit = static_cast<char>(unit - 'a' + 'A');
    return text;
}

CString textIn(const Row& row, std::initializer_list<const char*> names) {
    for (const char* name : names)
        if (const auto found = row.find(name); found != row.end()) return CString::fromUtf8(found->second);
    return {};
}

int numberIn(const Row& row, std::initializer_list<const char*> names, int otherwise) {
    for (const char* name : names) {
        const auto found = row.find(name);
        if (found == row.end()) continue;
        int number = 0;
        const char* const end = found->second.data() + found->second.size();
        if (std::from_chars(found->second.data(), end, number).ec == std::errc()) return number;
    }
    return otherwise;
}

void takeView(CatalogRows& rows, const Row& row) {
    CatalogRows::View view;
    view.schema = textIn(row, {"TABLE_SCHEMA", "OWNER"});
    view.name = textIn(row, {"VIEW_NAME", "TABLE_NAME"});
    if (const CString text = textIn(row, {"VIEW_DEFINITION", "TEXT"}); !text.IsEmpty()) view.text = text;
    rows.views.push_back(std::move(view));
}

bool takeKey(CatalogRows& rows, const Row& row) {
    CatalogRows::Key key;
    key.schema = textIn(row, {"TABLE_SCHEMA", "OWNER"});
    key.table = textIn(row, {"TABLE_NAME"});
    key.name = textIn(row, {"CONSTRAINT_NAME"});
    key.column = textIn(row, {"COLUMN_NAME"});
    key.place = numberIn(row, {"ORDINAL_POSITION", "POSITION"}, 0);
    key.referencedTable = textIn(row, {"REFERENCED_TABLE_NAME", "R_TABLE_NAME"});
    key.referencedColumn = textIn(row, {"REFERENCED_COLUMN_NAME", "R_COLUMN_NAME"});
    const std::string type = upper(textIn(row, {"CONSTRAINT_TYPE"}).toUtf8());
    if (type == "PRIMARY KEY" || type == "P")
        key.kind = CatalogRows::Key::Kind::Primary;
    else if (type == "UNIQUE" || type == "U")
        key.kind = CatalogRows::Key::Kind::Unique;
    else if (type == "FOREIGN KEY" || type == "R" || !key.referencedTable.IsEmpty())
        key.kind = CatalogRows::Key::Kind::Foreign;
    else
        return !type.empty();  // such as a check: no key
    rows.keys.push_back(std::move(key));
    return true;
}

void takeColumn(CatalogRows& rows, const Row& row) {
    CatalogRows::Column column;
    column.schema = textIn(row, {"TABLE_SCHEMA", "OWNER"});
    column.table = textIn(row, {"TABLE_NAME"});
    column.name = textIn(row, {"COLUMN_NAME"});
    column.type = textIn(row, {"DATA_TYPE"});
    const bool isNumber = row.contains("NUMERIC_PRECISION") || row.contains("DATA_PRECISION");
    column.length = isNumber ? numberIn(row, {"NUMERIC_PRECISION", "DATA_PRECISION"}, -1)
                             : numberIn(row, {"CHARACTER_MAXIMUM_LENGTH", "CHAR_LENGTH", "DATA_LENGTH"}, -1);
    column.scale = numberIn(row, {"NUMERIC_SCALE", "DATA_SCALE"}, 0);
    column.place = numberIn(row, {"ORDINAL_POSITION", "COLUMN_ID"}, 0);
    rows.columns.push_back(std::move(column));
}

// False for a row that is none of these.
bool take(CatalogRows& rows, const Row& row, const Row& names) {
    const auto has = [&](const char* name) { return row.contains(name); };
    const auto isNamed = [&](const char* name) { return has(name) || names.contains(name); };
    if (!has("TABLE_NAME") && !has("VIEW_NAME")) return false;
    if (isNamed("VIEW_DEFINITION") || isNamed("TEXT")) {
        takeView(rows, row);
        return true;
    }
    if (!has("COLUMN_NAME")) return false;
    if (has("CONSTRAINT_NAME")) return takeKey(rows, row);
    takeColumn(rows, row);
    return true;
}

void readCsv(CatalogRows& rows, const std::string& path, std::string_view bytes) {
    Csv csv(bytes);
    std::vector<std::string> names = csv.next();
    Row isNamed;
    for (std::string& name : names) isNamed[name = upper(name)];
    if (!isNamed.contains("TABLE_NAME") && !isNamed.contains("VIEW_NAME"))
        throw CatalogReadError(path +
                               ": neither an SQLite database nor a dump: its first line does not name "
                               "TABLE_NAME or VIEW_NAME");
    while (!csv.isAtEnd()) {
        const std::string where = path + ", line " + std::to_string(csv.line());
        const std::vector<std::string> cells = csv.next();
        if (cells.size() == 1 && cells[0].empty()) continue;
        Row row;
        for (std::size_t at = 0; at < cells.size() && at < names.size(); ++at)
            if (!cells[at].empty() && cells[at] != "NULL") row[names[at]] = cells[at];
        if (cells.size() != names.size())
            rows.notes.push_back(where + ": left out; it has " + std::to_string(cells.size()) +
                                 " cells, and " + std::to_string(names.size()) + " are named");
        else if (!take(rows, row, isNamed))
            rows.notes.push_back(where + ": left out; it is no column, key or view");
    }
    if (csv.isBroken()) throw CatalogReadError(path + ": ends within quotes");
}

void takeJsonRows(CatalogRows& rows, const std::string& path, const Json& list) {
    for (const Json& entry : list) {
        Row row;
        Row names;
        if (entry.is_object())
            for (const auto& [name, value] : entry.items()) {
                names[upper(name)];
                if (value.is_string() && !value.get_ref<const std::string&>().empty())
                    row[upper(name)] = value.get<std::string>();
                else if (value.is_number())
                    row[upper(name)] = value.dump();
            }
        if (!take(rows, row, names))
            rows.notes.push_back(path + ": a row was left out; it is no column, key or view: " +
                                 entry.dump(-1, ' ', true, Json::error_handler_t::replace).substr(0, 80));
    }
}

void readJson(CatalogRows& rows, const std::string& path, std::string_view bytes) {
    Json json;
    try {
        json = Json::parse(bytes);
    } catch (const Json::parse_error& error) {
        throw CatalogReadError(path + ": " + error.what());
    }
    if (json.is_array()) return takeJsonRows(rows, path, json);
    for (const auto& [name, list] : json.items()) {
        if (!list.is_array())
            throw CatalogReadError(
                std::string(path).append(": \"").append(name).append("\" has to be a list of rows"));
        takeJsonRows(rows, path, list);
    }
}

}  // namespace

void DumpReader::read(CatalogRows& rows, const CatalogReading& reading) {
    reading.tell(rows);
    const std::size_t first = bytes_.find_first_not_of(" \t\r\n\xEF\xBB\xBF");
    if (first != std::string::npos && (bytes_[first] == '[' || bytes_[first] == '{'))
        readJson(rows, path_, bytes_);
    else
        readCsv(rows, path_, bytes_);
}

}  // namespace zr::host
