#include "project_report.h"

#include "dialects.h"
#include "host/descriptor_access.h"
#include "host/filters.h"
#include "json_text.h"
#include "lineage_format.h"
#include "picture.h"
#include "text_table.h"

namespace zr::tool {

namespace {

using Text = std::u16string;

Text textOf(const CString& text) {
    return Text(text.View());
}

Text textOf(std::string_view ascii) {
    return Text(ascii.begin(), ascii.end());
}

Text count(int objects, const char16_t* one, const char16_t* many) {
    return objects ? number(objects) + u" " + (objects == 1 ? one : many) : Text();
}

void join(Text& text, const Text& part) {
    if (!text.empty() && !part.empty()) text += u", ";
    text += part;
}

// The text in one line, cut where it gets long.
Text shortText(const CString& sql) {
    static constexpr std::size_t most = 70;
    Text line;
    for (const char16_t unit : sql.View()) {
        const bool isBlank = unit == u' ' || unit == u'\n' || unit == u'\r' || unit == u'\t';
        if (isBlank && (line.empty() || line.back() == u' ')) continue;
        if (line.size() == most) return line + u" ...";
        line += isBlank ? u' ' : unit;
    }
    return line;
}

void appendBlock(Text& out, std::u16string_view title, const TextTable& lines) {
    if (lines.isEmpty()) return;
    out += u'\n' + Text(title) + u'\n';
    lines.appendTo(out);
}

void appendUtf8(std::string& out, const Text& text) {
    out += CString(text).toUtf8();
}

Text indexColumns(const CZRIndexInfo& index) {
    Text columns;
    for (const CZRIndexColumn* column : index.Columns) join(columns, textOf(column->GetColumnID()));
    return columns;
}

void addForeignKey(TextTable& lines, const CZRForeignKeyInfo& key) {
    const auto* known = dynamic_cast<const host::ForeignKey*>(&key);
    if (!known) return;
    Text columns;
    Text referenced;
    for (const auto& pair : known->Columns) {
        join(columns, textOf(pair.column));
        join(referenced, textOf(pair.referenced));
    }
    lines.add({textOf(key.GetSrcName()), columns,
               u"to " + textOf(known->ReferencedTable) + u" (" + referenced + u")",
               known->GetReferencedTableID().IsEmpty() ? u"not in the project" : u""});
}

// What a source of the query is in the project.
std::string_view wordFor(const host::ColumnTracer::Meaning& meaning) {
    if (meaning.table) return "table";
    return meaning.query ? "query" : "unknown";
}

bool endsInFirstClause(const CZRQueryInfo& query) {
    return query.m_selectItems.IsEmpty() && !query.m_subQueries.IsEmpty();
}

void appendOrigins(std::string& out, const std::vector<host::ColumnOrigin>& origins) {
    out += '[';
    for (const host::ColumnOrigin& origin : origins) {
        if (out.back() == '}') out += ',';
        out += '{';
        JsonMembers members(out);
        members.name("table");
        if (origin.source.IsEmpty())
            out += "null";
        else
            appendJsonString(out, origin.source.View());
        members.text("column", origin.column.View());
        members.name("known");
        out += origin.isKnown() ? "true" : "false";
        out += '}';
    }
    out += ']';
}

void appendColumns(std::string& out, const host::ColumnTracer::Columns& columns) {
    out += '[';
    bool isFirst = true;
    for (const host::ResultColumn& column : columns) {
        out += isFirst ? "{" : ",{";
        isFirst = false;
        JsonMembers members(out);
        members.text("name", column.name.View());
        members.text("expression", expressionOf(column));
        members.name("from");
        appendOrigins(out, column.origins);
        out += '}';
    }
    out += ']';
}

}  // namespace

void appendList(std::string& out, const host::Database& database, const std::string& file,
                host::StorageForm form) {
    const Dialect* dialect = findDialect(database.GetDBType());
    out += file + ": " + (form == host::StorageForm::Json ? "JSON" : "SQLite");
    if (dialect) out += ", " + std::string(dialect->name);
    if (!database.SchemaName.IsEmpty()) out += ", schema " + database.SchemaName.toUtf8();
    out += '\n';

    Text text;
    TextTable tables;
    for (const CZRTableInfo* table : database.Tables) {
        Text parts = count(table->Fields.GetCount(), u"column", u"columns");
        join(parts, count(table->Indexes.GetCount(), u"index", u"indexes"));
        join(parts, count(table->ForeignKeys.GetCount(), u"foreign key", u"foreign keys"));
        tables.add({textOf(table->GetSrcName()), parts});
    }
    appendBlock(text, u"Tables", tables);
    TextTable queries;
    for (const CZRQueryInfo* query : database.Queries)
        queries.add({textOf(query->GetSrcName()), shortText(query->GetSQL())});
    appendBlock(text, u"Queries", queries);
    appendUtf8(out, text);
}

void appendProject(std::string& out, const host::Database& database) {
    TextTable lines;
    const auto addText = [&lines](const char16_t* name, const CString& value) {
        if (!value.IsEmpty()) lines.add({name, textOf(value)});
    };
    const auto addNumber = [&lines](const char16_t* name, int value) { lines.add({name, number(value)}); };
    if (const Dialect* dialect = findDialect(database.GetDBType()))
        lines.add({u"Dialect", textOf(dialect->name)});
    addText(u"SchemaName", database.SchemaName);
    addText(u"Version", database.Version);
    addNumber(u"OverwriteDatabase", database.OverwriteDatabase);
    addNumber(u"OverwriteTables", database.OverwriteTables);
    addNumber(u"AutoStructureUpdate", database.AutoStructureUpdate);
    addNumber(u"BulkInsert", database.BulkInsert);
    addNumber(u"MaxThreads", database.MaxThreads);
    addNumber(u"MaxQuant", database.MaxQuant);
    Text text;
    lines.appendTo(text);
    appendUtf8(out, text);
}

void appendTable(std::string& out, const CZRTableInfo& table) {
    Text text = u"Table " + textOf(table.GetSrcName()) + u'\n';
    TextTable columns;
    for (const CZRFieldInfo* field : table.Fields)
        columns.add({textOf(field->GetSrcName()), textOf(field->GetTypeDefinition()),
                     field->GetSelected() ? u"" : u"not selected"});
    appendBlock(text, u"Columns", columns);
    TextTable indexes;
    for (const CZRIndexInfo* index : table.Indexes)
        indexes.add({textOf(index->GetSrcName()), indexColumns(*index),
                     index->IsPrimaryKey() ? u"primary key"
                     : index->IsUnique()   ? u"unique"
                                           : u""});
    appendBlock(text, u"Indexes", indexes);
    TextTable keys;
    for (const CZRForeignKeyInfo* key : table.ForeignKeys) addForeignKey(keys, *key);
    appendBlock(text, u"Foreign keys", keys);
    if (table.Filter) {
        TextTable filter;
        filter.add({textOf(table.Filter->GetFilterText())});
        appendBlock(text, u"Filter", filter);
    }
    appendUtf8(out, text);
}

void appendQueryText(std::string& out, const CZRQueryInfo& query) {
    Text text = u"Query " + textOf(query.GetSrcName()) + u"\n\n";
    appendSql(text, query.GetSQL());
    appendUtf8(out, text);
}

void appendAnalysis(std::string& out, const CZRQueryInfo& query, host::ColumnTracer& tracer,
                    const ReadPlace& read) {
    Text text = u"Query " + textOf(query.GetSrcName()) + u'\n';
    TextTable columns;
    std::size_t place = 0;
    for (const host::ResultColumn& column : tracer.columnsOf(query)) {
        Text origins;
        for (const host::ColumnOrigin& origin : column.origins) join(origins, originName(origin));
        columns.add({number(++place), textOf(column.name), expressionOf(column),
                     origins.empty() ? origins : u"from " + origins});
    }
    if (columns.isEmpty())
        columns.add({endsInFirstClause(query)
                         ? u"none: a nested query stands in the first clause, and there the analysis ends"
                         : u"none"});
    appendBlock(text, u"Columns", columns);
    TextTable sources;
    for (const auto* source : host::sortedEntries(query.m_sourceTables)) {
        const std::string_view meaning = wordFor(tracer.meaningOf(query, source->key));
        sources.add({textOf(source->key), meaning == "unknown" ? u"not in the project" : textOf(meaning)});
    }
    appendBlock(text, u"Sources", sources);
    appendStop(text, read);
    appendUtf8(out, text);
}

void appendAnalysisJson(std::string& out, const CZRQueryInfo& query, host::ColumnTracer& tracer,
                        const ReadPlace& read) {
    out += '{';
    JsonMembers members(out);
    members.text("name", query.GetSrcName().View());
    members.name("columns");
    appendColumns(out, tracer.columnsOf(query));
    members.name("sources");
    out += '[';
    for (const auto* source : host::sortedEntries(query.m_sourceTables)) {
        if (out.back() == '}') out += ',';
        out += '{';
        JsonMembers entry(out);
        entry.text("name", source->key.View());
        entry.ascii("is", wordFor(tracer.meaningOf(query, source->key)));
        out += '}';
    }
    out += ']';
    members.name("read");
    appendRead(out, read);
    out += '}';
}

}  // namespace zr::tool
