#include "project_commands.h"

#include <cstdio>
#include <filesystem>

#include "host/analysis_order.h"
#include "host/catalog.h"
#include "host/catalog_reader.h"
#include "host/kinds.h"
#include "input.h"
#include "long_work.h"
#include "project_report.h"
#include "table_words.h"

namespace zr::tool {

namespace {

using DatabasePointer = std::unique_ptr<host::Database>;

// Names on the command line are UTF-8.
CString nameOf(const std::string& word) {
    CString name(word.c_str());
    name.Trim();
    if (name.IsEmpty()) throw WrongUse("a name may not be empty");
    return name;
}

void requireFree(const std::string& file, bool force) {
    if (!force && std::filesystem::exists(std::filesystem::symlink_status(file)))
        throw ProjectFailure(file + ": is there already; --force replaces it");
}

void requireNew(const host::Database& database, const CString& name, const std::string& file) {
    if (database.FindTableBySrcName(name))
        throw ProjectFailure(file + ": there is a table " + name.toUtf8() + " already");
    if (database.FindQueryBySrcName(name))
        throw ProjectFailure(file + ": there is a query " + name.toUtf8() + " already");
}

[[noreturn]] void failUnknown(const ProjectOptions& options, const std::string& what,
                              const std::string& name) {
    throw ProjectFailure(options.file + ": there is no " + what + " " + name);
}

void saveBack(host::Database& database, const std::string& file) {
    host::saveProject(database, file, host::formOfFile(file));
}

// The tables and queries of a catalogue, made over into a project of a kind.
void takeCatalog(host::Database& database, const std::string& file) {
    const DatabasePointer catalog = host::openCatalog(file);
    for (const CZRTableInfo* table : catalog->Tables) {
        auto copy = std::make_unique<host::Table>(database.GetDBType());
        copy->SetSrcName(table->GetSrcName());
        copy->SetName(table->GetName());
        for (const CZRFieldInfo* field : table->Fields)
            copy->addField(std::make_unique<host::Field>(*dynamic_cast<const host::Field*>(field)));
        for (const CZRIndexInfo* index : table->Indexes)
            copy->addIndex(std::make_unique<host::Index>(*dynamic_cast<const host::Index*>(index)));
        for (const CZRForeignKeyInfo* key : table->ForeignKeys)
            copy->addForeignKey(
                std::make_unique<host::ForeignKey>(*dynamic_cast<const host::ForeignKey*>(key)));
        database.addTable(std::move(copy));
    }
    for (const CZRQueryInfo* query : catalog->Queries) {
        auto copy = std::make_unique<host::Query>(database.GetDBType());
        copy->SetSrcName(query->GetSrcName());
        copy->SetName(query->GetName());
        copy->m_sql = query->m_sql;
        database.addQuery(std::move(copy));
    }
}

void makeProject(const ProjectOptions& options) {
    requireFree(options.file, options.force);
    host::Database database(options.dialect->kind);
    database.SchemaName = CString(options.schema.c_str());
    if (!options.catalog.empty()) takeCatalog(database, options.catalog);
    host::saveProject(database, options.file, options.form);
}

void importCatalogue(const ProjectOptions& options, std::string& out) {
    requireFree(options.file, options.force);
    host::CatalogRows rows;
    CString schema = CString::fromUtf8(options.schema);
    for (const std::string& catalogue : options.catalogues) {
        const auto reader = host::readerFor(catalogue, CString::fromUtf8(options.schema));
        if (schema.IsEmpty()) schema = reader->schema();
        reader->read(rows);
    }
    const DatabasePointer database = host::makeDatabase(rows, options.dialect->kind, schema);
    for (const std::string& note : rows.notes) std::fprintf(stderr, "zrsql: %s\n", note.c_str());
    if (database->Tables.IsEmpty() && database->Queries.IsEmpty())
        throw ProjectFailure(options.catalogues.front() + ": there is no table or view in it");
    host::saveProject(*database, options.file, options.form);
    out += std::to_string(database->Tables.GetCount()) + " tables and " +
           std::to_string(database->Queries.GetCount()) + " queries; " + std::to_string(rows.notes.size()) +
           " left out\n";
}

void addTable(const ProjectOptions& options) {
    const DatabasePointer database = host::loadProject(options.file);
    const CString name = nameOf(options.name);
    requireNew(*database, name, options.file);
    auto table = std::make_unique<host::Table>(database->GetDBType());
    host::setNames(*table, name);
    for (const std::string& word : options.columns) {
        auto field = readColumn(word);
        if (table->FindFieldBySrcName(field->GetSrcName()))
            throw WrongUse("\"" + word + "\": the table has that column already");
        table->addField(std::move(field));
    }
    int indexes = 0;
    const auto addIndex = [&](const std::string& columns, bool isPrimaryKey) {
        auto index = readIndex(columns, *table);
        CString indexName;
        indexName.Format(isPrimaryKey ? u"pk_%s" : u"ux_%s_%d", name, ++indexes);
        host::setNames(*index, indexName);
        index->PrimaryKey = isPrimaryKey;
        index->Unique = 1;
        table->addIndex(std::move(index));
    };
    if (!options.key.empty()) addIndex(options.key, true);
    for (const std::string& columns : options.uniques) addIndex(columns, false);
    int references = 0;
    for (const std::string& word : options.references) {
        auto key = readForeignKey(word, *table);
        CString keyName;
        keyName.Format(u"fk_%s_%d", name, ++references);
        host::setNames(*key, keyName);
        table->addForeignKey(std::move(key));
    }
    database->addTable(std::move(table));
    saveBack(*database, options.file);
}

void addQuery(const ProjectOptions& options) {
    const DatabasePointer database = host::loadProject(options.file);
    const CString name = nameOf(options.name);
    requireNew(*database, name, options.file);
    auto query = std::make_unique<host::Query>(database->GetDBType());
    host::setNames(*query, name);
    query->SetSQL(decodeText(options.text ? *options.text : readBytes(options.textFile)));
    if (query->GetSQL().IsEmpty()) throw ProjectFailure("the text of the query is empty");
    database->addQuery(std::move(query));
    saveBack(*database, options.file);
}

void show(const ProjectOptions& options, std::string& out) {
    const DatabasePointer database = host::loadProject(options.file);
    if (options.name.empty()) return appendProject(out, *database);
    const CString name = nameOf(options.name);
    if (const CZRTableInfo* table = database->FindTableBySrcName(name)) return appendTable(out, *table);
    if (const CZRQueryInfo* query = database->FindQueryBySrcName(name)) return appendQueryText(out, *query);
    failUnknown(options, "table or query", options.name);
}

void analyze(const ProjectOptions& options, std::string& out) {
    LongWork work("analysing " + options.file);
    const DatabasePointer database = host::loadProject(options.file);
    const Dialect& dialect = dialectOf(*database, options.file);
    try {
        host::analyseQueries(*database, [&work](std::size_t done, std::size_t all) { work.step(done, all); });
    } catch (const host::CyclicQueries& ring) {
        throw ProjectFailure(options.file + ": " + ring.what());
    }
    std::vector<const CZRQueryInfo*> shown;
    for (const std::string& name : options.names) {
        shown.push_back(database->FindQueryBySrcName(nameOf(name)));
        if (!shown.back()) failUnknown(options, "query", name);
    }
    if (options.names.empty()) shown.assign(database->Queries.begin(), database->Queries.end());

    host::ColumnTracer tracer(*database);
    if (options.asJson) out += "{\"queries\":[";
    bool isFirst = true;
    std::size_t done = 0;
    for (const CZRQueryInfo* query : shown) {
        work.step(done++, shown.size());
        if (!isFirst) out += options.asJson ? "," : "\n";
        isFirst = false;
        if (options.asJson)
            appendAnalysisJson(out, *query, tracer, dialect);
        else
            appendAnalysis(out, *query, tracer, dialect);
    }
    if (options.asJson) out += "]}\n";
}

}  // namespace

const Dialect& dialectOf(const host::Database& database, const std::string& file) {
    const Dialect* dialect = findDialect(database.GetDBType());
    if (!dialect) throw ProjectFailure(file + ": no dialect belongs to its kind of database");
    return *dialect;
}

void runProject(const ProjectOptions& options, std::string& out) {
    switch (options.command) {
        case ProjectCommand::New:
            return makeProject(options);
        case ProjectCommand::Import:
            return importCatalogue(options, out);
        case ProjectCommand::AddTable:
            return addTable(options);
        case ProjectCommand::AddQuery:
            return addQuery(options);
        case ProjectCommand::List:
            return appendList(out, *host::loadProject(options.file), options.file,
                              host::formOfFile(options.file));
        case ProjectCommand::Show:
            return show(options, out);
        case ProjectCommand::Convert:
            requireFree(options.target, options.force);
            return host::convertProject(options.file, options.target, options.form);
        case ProjectCommand::Analyze:
            return analyze(options, out);
    }
}

}  // namespace zr::tool
