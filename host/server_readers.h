#pragma once

#include <memory>
#include <string>

#include "host/catalog_reader.h"
#include "host/catalog_url.h"

// The readers of servers. Each is there only where this build has the client library. A schema that is given
// is read alone.
namespace zr::host {

// A transaction that sees one state of the database and changes nothing. Definitions of views come as the
// server prints them.
std::unique_ptr<CatalogReader> postgresqlReader(CatalogUrl url, const CString& schema);

// MySQL and MariaDB. What they tell of definitions is no part of a snapshot: nothing should alter tables
// meanwhile.
std::unique_ptr<CatalogReader> mysqlReader(CatalogUrl url, const CString& schema);

// A message of a client library, which may have lines, as one line.
std::string onOneLine(std::string_view text);

}  // namespace zr::host
