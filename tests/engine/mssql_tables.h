#pragma once

#include "grammar/engine/tables.h"

namespace zr::test {

/// The tables that the SQL Server recogniser runs on. They have no name outside their generated source, so
/// this program compiles that source itself, and its contexts stand in for those of the library.
const engine::GrammarTable& mssqlTables();

}  // namespace zr::test
