#include "tests/engine/mssql_tables.h"

#include "MSSQL.cpp"  // the generated source, for its tables

namespace zr::test {

const engine::GrammarTable& mssqlTables() {
    return ::tables::grammar;
}

}  // namespace zr::test
