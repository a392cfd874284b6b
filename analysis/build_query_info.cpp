#include <utility>

#include "analysis/driver.h"
#include "analysis/msaccess_state.h"
#include "analysis/mssql_state.h"
#include "analysis/mysql_state.h"
#include "analysis/oracle_state.h"
#include "analysis/postgresql_state.h"
#include "grammar/engine/diagnostics.h"
#include "zrparsersql/analysis.h"
#include "zrparsersql/query_text.h"
#include "zrparsersql/sql_parsers.h"

namespace {

CString asItIs(CString text) {
    return text;
}

CString preparedForAccess(const CString& text) {
    if (!zr::diagnosticsWanted()) return PrepareAccessQueryText(text);
    return PrepareAccessQueryText(text, [](const CString& line) { zr::diagnose(line.View()); });
}

void analyse(CZRQueryInfo& query, DBTypes kind) {
    switch (kind) {
        case DB_MSACCESS:
            zr::analyseQuery<CZRMSAccessSQL_v3Parcer, MSAccessSQL_v3StateSelectQuery>(query,
                                                                                      preparedForAccess);
            break;
        case DB_MSSQL:
        case DB_MSSQL_20:
            zr::analyseQuery<CZRMSSQLParser, MSSQLStateSelectQuery>(query, asItIs);
            break;
        case DB_MYSQL:
            zr::analyseQuery<CZRMySQLParcer, MySQLStateSelectQuery>(query, asItIs);
            break;
        case DB_ORACLE:
            zr::analyseQuery<CZROracleParser, OracleStateSelectQuery>(query, asItIs);
            break;
        case DB_POSTGRESQL:
            zr::analyseQuery<CZRPostgreParser, PostgreStateSelectQuery>(query, asItIs);
            break;
        default:
            break;
    }
}

}  // namespace

void BuildQueryInfo(CZRQueryInfo* query, DBTypes kind) {
    if (!query) return;
    try {
        analyse(*query, kind);
    } catch (...) {
        // The query keeps what was written before. Wrong SQL is nobody's failure here.
    }
}
