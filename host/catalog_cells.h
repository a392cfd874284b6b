#pragma once

#include <charconv>
#include <optional>
#include <string>
#include <vector>

#include "host/catalog_reader.h"
#include "zrparsersql/wide_string.h"

namespace zr::host {

// The cells of a row that a database answers with, as UTF-8; one that is null is none.
using Cells = std::vector<std::optional<std::string>>;

inline CString textIn(const std::optional<std::string>& cell) {
    return CString::fromUtf8(cell.value_or(std::string()));
}

// 0 for what is no number.
inline int numberIn(const std::optional<std::string>& cell) {
    int number = 0;
    if (cell) std::from_chars(cell->data(), cell->data() + cell->size(), number);
    return number;
}

// Rows whose cells stand in the order in which all servers are asked for them.

// Schema, table, name, type, place.
inline CatalogRows::Column columnIn(const Cells& cells) {
    CatalogRows::Column column;
    column.schema = textIn(cells[0]);
    column.table = textIn(cells[1]);
    column.name = textIn(cells[2]);
    column.type = textIn(cells[3]);
    column.place = numberIn(cells[4]);
    return column;
}

// The kind by the server's words for it; schema, table, name, column, place, referenced table and column.
inline CatalogRows::Key keyIn(const Cells& cells, const char* primary, const char* unique) {
    using Kind = CatalogRows::Key::Kind;
    CatalogRows::Key key;
    key.kind = cells[0] == primary ? Kind::Primary : cells[0] == unique ? Kind::Unique : Kind::Foreign;
    key.schema = textIn(cells[1]);
    key.table = textIn(cells[2]);
    key.name = textIn(cells[3]);
    key.column = textIn(cells[4]);
    key.place = numberIn(cells[5]);
    key.referencedTable = textIn(cells[6]);
    key.referencedColumn = textIn(cells[7]);
    return key;
}

// Schema, name, text.
inline CatalogRows::View viewIn(const Cells& cells) {
    return {textIn(cells[0]), textIn(cells[1]), textIn(cells[2])};
}

// Schema, name, number of parameters.
inline CatalogRows::Function functionIn(const Cells& cells) {
    return {textIn(cells[0]), textIn(cells[1]), numberIn(cells[2])};
}

}  // namespace zr::host
