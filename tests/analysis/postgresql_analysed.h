#pragma once

#include <string>
#include <string_view>

#include "tests/analysis/analysed.h"
#include "tests/analysis/descriptor_text.h"

// A PostgreSQL statement that was taken through its analysis, and its lists as text.
struct PostgresqlAnalysed : Analysed {
    explicit PostgresqlAnalysed(std::u16string_view sql) : Analysed(sql, DB_POSTGRESQL) {}

    std::string select() const { return listText(query.m_selectItems); }
    std::string from() const { return listText(query.m_fromItems); }
    std::string where() const { return query.m_whereItem ? listText(query.m_whereItem->m_items) : "none"; }
    std::string group() const { return listText(query.m_groupItems); }
    std::string having() const { return listText(query.m_havingItems); }
    std::string order() const { return listText(query.m_orderItems); }
};
