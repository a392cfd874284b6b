#pragma once

#include <cstdint>

// Database kind. The values are stored in projects and exchanged with hosts, so they never change. Hosts may
// hold values that have no name here: the underlying type is fixed, any 32-bit value can be carried, and an
// unknown one does nothing.
enum DBTypes : std::int32_t {
    DB_NONE = 0,
    DB_MYSQL = 1,
    DB_MSACCESS = 2,
    DB_POSTGRESQL = 5,
    DB_MSSQL = 8,
    DB_ORACLE = 16,
    DB_MSSQL_20 = 20,  // a second kind of SQL Server, analysed exactly like DB_MSSQL
};
