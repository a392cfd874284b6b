#pragma once

#include "zrparsersql/export.h"
#include "zrparsersql/wide_string.h"

// One column reference of a query: the texts of its table and column.
class CFieldObject {
 public:
    CString m_table;
    CString m_field;
    CString m_reservedText1;
    int m_hasTable = 0;  // 1 when the table was read as a table, not as an alias
    int m_reservedNumber = 0;
    CString m_reservedText2;

    CFieldObject() = default;
    // The last text stays empty in copies.
    CFieldObject(const CFieldObject& other)
        : m_table(other.m_table),
          m_field(other.m_field),
          m_reservedText1(other.m_reservedText1),
          m_hasTable(other.m_hasTable),
          m_reservedNumber(other.m_reservedNumber) {}
    CFieldObject& operator=(const CFieldObject&) = delete;
};
