#pragma once

#include <memory>
#include <stdexcept>
#include <string>
#include <string_view>

#include "host/database.h"

namespace zr::host {

class CatalogError : public std::runtime_error {
 public:
    using std::runtime_error::runtime_error;
};

// Reads a catalogue: a JSON list of tables, each {"table": NAME, "columns": [NAME, ...], "id": TEXT}. Columns
// and id may be left out; a table without an id gets its name in braces, so that equal catalogues give equal
// IDs. Other members are passed over. The JSON text is UTF-8. Throws CatalogError, with what is wrong and
// where.
std::unique_ptr<Database> readCatalog(std::string_view json);

// The catalogue of a file: such a list, or a stored project (project.h) of either form. The IDs of a
// project's tables, columns and queries are made of their names in the same way. Throws CatalogError; the
// message begins with the file's name.
std::unique_ptr<Database> openCatalog(const std::string& path);

}  // namespace zr::host
