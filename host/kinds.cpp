#include "host/kinds.h"

namespace zr::host {

bool isKnownKind(DBTypes kind) {
    switch (kind) {
        case DB_MYSQL:
        case DB_MSACCESS:
        case DB_POSTGRESQL:
        case DB_MSSQL:
        case DB_ORACLE:
        case DB_MSSQL_20:
            return true;
        case DB_NONE:
            break;
    }
    return false;
}

namespace {

CString quoted(CString text, const char16_t* open, const CString& close) {
    text.Replace(close, close + close);
    return open + text + close;
}

}  // namespace

CString quoteName(const CString& name, DBTypes kind) {
    switch (kind) {
        case DB_MYSQL:
            return quoted(name, u"`", u"`");
        case DB_MSACCESS:
        case DB_MSSQL:
        case DB_MSSQL_20:
            return quoted(name, u"[", u"]");
        default:
            return quoted(name, u"\"", u"\"");
    }
}

CString quoteText(CString text) {
    return quoted(std::move(text), u"'", u"'");
}

}  // namespace zr::host
