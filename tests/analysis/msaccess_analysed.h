#pragma once

#include <initializer_list>
#include <string>

#include "tests/analysis/analysed.h"
#include "tests/analysis/descriptor_text.h"

// An MS Access query that was taken through its analysis. Tables have to be there ahead of it.
struct AccessAnalysed {
    TestDatabase database;
    CZRQueryInfo query;

    AccessAnalysed() { query.SetDatabase(&database); }
    explicit AccessAnalysed(std::u16string_view sql) : AccessAnalysed() { analyse(sql); }

    void addTable(const CString& name, std::initializer_list<const char16_t*> columns) {
        auto table = std::make_unique<TestTable>(name);
        for (const char16_t* column : columns) {
            auto field = std::make_unique<TestField>(column);
            table->Fields.AddTail(field.get());
            static_cast<void>(field.release());
        }
        database.Tables.AddTail(table.get());
        static_cast<void>(table.release());
    }
    void analyse(std::u16string_view sql) {
        query.SetSQL(CString(sql));
        BuildQueryInfo(&query, DB_MSACCESS);
    }

    std::string selectItems() const { return listText(query.m_selectItems); }
    std::string fromItems() const { return listText(query.m_fromItems); }
    std::string whereItems() const {
        return query.m_whereItem ? listText(query.m_whereItem->m_items) : "none";
    }
    // What an alias stands for.
    std::string expression(std::u16string_view alias) const {
        const auto* const found = query.m_aliases.Find(alias);
        return found ? listText((*found)->Expression->m_items) : "none";
    }
};
