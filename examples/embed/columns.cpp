// Analyses one query and lists its columns, sources and the text of each column reference.
#include <zrparsersql/analysis.h>
#include <zrparsersql/query_info.h>

#include <cstdio>

int main() {
    CZRQueryInfo query;
    query.SetSQL(u"SELECT o.id, SUM(price) AS total FROM orders o, order_lines WHERE o.id = order_id");
    BuildQueryInfo(&query, DB_MSSQL);

    std::printf("%d columns\n", query.m_selectItems.GetCount());
    for (const auto& source : query.m_sourceTables)
        std::printf("reads table %s\n", source.key.toUtf8().c_str());
    for (const auto& field : query.m_fields)
        std::printf("reads column %s\n", field.value->m_field.toUtf8().c_str());
}
