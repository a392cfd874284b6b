// Analyses a query that knows the tables of its database: sources become objects of the model, columns are
// looked up in them, and user functions are noted.
#include <zrparsersql/analysis.h>

#include <cstdio>
#include <memory>

#include "small_model.h"

int main() {
    Database database;
    database.addTable(u"orders", {u"id", u"customer", u"price"});
    database.addTable(u"customers", {u"id", u"name"});

    CZRQueryInfo query;
    query.SetDatabase(&database);  // ahead of the analysis, and alive as long as the query
    query.SetSQL(
        u"SELECT c.name, o.price, dbo.discount(o.price) AS less, o.colour FROM orders o, customers c, "
        u"archive");
    BuildQueryInfo(&query, DB_MSSQL);

    for (const auto& source : query.m_sourceTables) {
        const CZRTableInfo* table = database.FindTableByID(source.value);
        std::printf("source %s: %s\n", source.key.toUtf8().c_str(),
                    table ? "a table of the model" : "unknown");
    }
    // A reference names its table only where the text does so without an alias; a look-up needs no table.
    for (const auto& entry : query.m_fields) {
        const CFieldObject* field = entry.value;
        if (!field) continue;
        const CZRSourceFildInfo* column = query.FindField(field->m_table, field->m_field);
        std::printf("column %s: %s\n", field->m_field.toUtf8().c_str(), column ? "known" : "unknown");
    }
    for (const auto& function : database.UserFunctions)
        std::printf("user function %s with %s parameter\n", function.key.toUtf8().c_str(),
                    function.value.toUtf8().c_str());
}
