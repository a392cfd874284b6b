#pragma once

#include "zrparsersql/export.h"
#include "zrparsersql/wide_string.h"

// One column reference of a query: the texts of its table and column. Owned by the query whose m_fields holds
// it; not guarded against use from several threads.
class CFieldObject {
 public:
    CString m_table;
    CString m_field;
    CString m_aliasText;    // the item's alias text, where a dialect notes it
    int m_hasTable = 0;     // 1 when the table was read as a table, not as an alias
    int m_aliasTarget = 0;  // 1 when the column stands under an AS, where a dialect notes it
    CString m_reservedText;

    CFieldObject() = default;
    // The last text stays empty in copies.
    CFieldObject(const CFieldObject& other)
        : m_table(other.m_table),
          m_field(other.m_field),
          m_aliasText(other.m_aliasText),
          m_hasTable(other.m_hasTable),
          m_aliasTarget(other.m_aliasTarget) {}
    CFieldObject& operator=(const CFieldObject&) = delete;
};
