#pragma once

#include <zrparsersql/analysis.h>

#include <algorithm>
#include <memory>
#include <string>

#include "host/database.h"

/// A project as large ones are: tables with keys that refer to each other, and queries over tables and over
/// other queries.
namespace zr::bench {

struct ProjectSize {
    int tables;
    int fields;  ///< of each table
    int queries;
};

inline constexpr ProjectSize kLargeProject{2000, 25, 5000};

inline CString numbered(const char16_t* picture, int number) {
    CString name;
    name.Format(picture, number);
    return name;
}

template <class Object>
std::unique_ptr<Object> named(std::unique_ptr<Object> object, const CString& name) {
    host::setNames(*object, name);
    return object;
}

inline std::unique_ptr<host::Table> makeTable(int number, const ProjectSize& size) {
    auto table = named(std::make_unique<host::Table>(DB_MSSQL), numbered(u"table_%d", number));
    for (int at = 0; at < size.fields; ++at) {
        auto field = named(std::make_unique<host::Field>(), numbered(u"column_%d", at));
        field->Type = at % 3 ? u"varchar" : u"int";
        field->Length = at % 3 ? 50 : -1;
        table->addField(std::move(field));
    }
    auto key = named(std::make_unique<host::Index>(), numbered(u"pk_%d", number));
    key->PrimaryKey = 1;
    key->addColumn(u"column_0");
    table->addIndex(std::move(key));
    auto index = named(std::make_unique<host::Index>(), numbered(u"ix_%d", number));
    index->addColumn(u"column_1");
    index->addColumn(u"column_2");
    table->addIndex(std::move(index));
    if (number > 0) {
        auto reference = named(std::make_unique<host::ForeignKey>(), numbered(u"fk_%d", number));
        reference->ReferencedTable = numbered(u"table_%d", number / 2);
        reference->Columns.AddTail({u"column_3", u"column_0"});
        table->addForeignKey(std::move(reference));
    }
    return table;
}

/// Every fourth query reads from the query before it as well as from tables; so chains are four long.
inline CString queryText(int number, const ProjectSize& size) {
    const auto table = [&](int offset) { return (number * 7 + offset) % size.tables; };
    CString text;
    text.Format(
        u"SELECT a.column_0, a.column_1 AS name_%d, b.column_4, SUM(b.column_5 * 2) AS total FROM table_%d a "
        u"INNER JOIN table_%d b ON a.column_0 = b.column_3",
        number, table(0), table(1));
    if (number % 4) text += numbered(u" INNER JOIN query_%d q", number - 1) + u" ON q.column_0 = a.column_0";
    text += u" WHERE a.column_2 LIKE 'A%' AND b.column_6 > 10";
    if (number % 4) text += numbered(u" AND query_%d.total > 5", number - 1);
    return text + u" ORDER BY b.column_4";
}

inline std::unique_ptr<host::Database> makeProject(const ProjectSize& size) {
    auto database = std::make_unique<host::Database>(DB_MSSQL);
    database->SchemaName = u"dbo";
    for (int number = 0; number < size.tables; ++number) database->addTable(makeTable(number, size));
    for (int number = 0; number < size.queries; ++number) {
        auto query = named(std::make_unique<host::Query>(DB_MSSQL), numbered(u"query_%d", number));
        query->SetSQL(queryText(number, size));
        database->addQuery(std::move(query));
    }
    database->ResolveReferences();
    return database;
}

}  // namespace zr::bench
