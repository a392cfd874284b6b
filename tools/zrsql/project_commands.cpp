#include "project_commands.h"

#include <algorithm>
#include <cstdio>
#include <filesystem>
#include <unordered_map>

#include "host/analysis_order.h"
#include "host/catalog.h"
#include "host/catalog_reader.h"
#include "host/kinds.h"
#include "input.h"
#include "long_work.h"
#include "project_report.h"
#include "query_summary.h"
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

struct Count {
    std::uint64_t tables = 0;
    std::uint64_t queries = 0;
};

bool holds(const host::Database& database, const CString& name) {
    return database.FindTableBySrcName(name) || database.FindQueryBySrcName(name);
}

// Takes in copies of the tables and queries whose names are free, made over into the project's kind.
Count addMissing(host::Database& database, const host::Database& catalog) {
    Count added;
    std::vector<std::unique_ptr<host::Table>> tables;
    for (const CZRTableInfo* table : catalog.Tables) {
        if (holds(database, table->GetSrcName())) continue;
        auto& copy = tables.emplace_back(std::make_unique<host::Table>(database.GetDBType()));
        copy->SetSrcName(table->GetSrcName());
        copy->SetName(table->GetName());
        for (const CZRFieldInfo* field : table->Fields)
            copy->addField(std::make_unique<host::Field>(*dynamic_cast<const host::Field*>(field)));
        for (const CZRIndexInfo* index : table->Indexes)
            copy->addIndex(std::make_unique<host::Index>(*dynamic_cast<const host::Index*>(index)));
        for (const CZRForeignKeyInfo* key : table->ForeignKeys)
            copy->addForeignKey(
                std::make_unique<host::ForeignKey>(*dynamic_cast<const host::ForeignKey*>(key)));
    }
    for (const CZRQueryInfo* query : catalog.Queries) {
        if (holds(database, query->GetSrcName())) continue;
        auto copy = std::make_unique<host::Query>(database.GetDBType());
        copy->SetSrcName(query->GetSrcName());
        copy->SetName(query->GetName());
        copy->m_sql = query->m_sql;
        database.addQuery(std::move(copy));
        ++added.queries;
    }
    added.tables = tables.size();
    for (auto& table : tables) database.addTable(std::move(table));
    return added;
}

// Queries that are views of the catalogue get its order, each group in the places that it has: a project that
// was gone on with is the one that would have been made at once.
void arrange(host::Database& database, const host::CatalogRows& rows) {
    std::unordered_map<const CZRQueryInfo*, std::size_t> places;
    for (const host::CatalogRows::View& view : rows.views)
        if (const CZRQueryInfo* query = database.FindQueryBySrcName(view.name))
            places.try_emplace(query, places.size());
    std::vector<CZRQueryInfo*> known;
    for (CZRQueryInfo* query : database.Queries)
        if (places.contains(query)) known.push_back(query);
    std::sort(known.begin(), known.end(),
              [&](const auto* one, const auto* other) { return places.at(one) < places.at(other); });
    auto next = known.begin();
    for (CZRQueryInfo*& query : database.Queries)
        if (places.contains(query)) query = *next++;
}

void makeProject(const ProjectOptions& options) {
    requireFree(options.file, options.force);
    host::Database database(options.dialect->kind);
    database.SchemaName = CString(options.schema.c_str());
    if (!options.catalog.empty()) addMissing(database, *host::openCatalog(options.catalog));
    host::saveProject(database, options.file, options.form);
}

std::string readSoFar(const host::CatalogRows& rows) {
    if (!rows.isWholeButViews) {
        // Readers tell the columns of one table after the other.
        std::uint64_t tables = 0;
        for (std::size_t at = 0; at < rows.columns.size(); ++at)
            if (at == 0 || rows.columns[at].table != rows.columns[at - 1].table) ++tables;
        return counted(tables, "table", "tables") + " read";
    }
    const auto open = std::count_if(rows.views.begin(), rows.views.end(),
                                    [](const host::CatalogRows::View& view) { return view.isOpen; });
    return std::to_string(rows.views.size() - static_cast<std::size_t>(open)) + " of " +
           counted(rows.views.size(), "view", "views") + " read";
}

// Reads the catalogues; true when an interrupt ended that while the texts of views were read. An earlier one
// ends the program.
bool readCatalogues(const ProjectOptions& options, const host::Database* before, host::CatalogRows& rows,
                    CString& schema, LongWork& work) {
    // A whole project is not given up for a part of one.
    const bool replaces = options.force && std::filesystem::exists(options.file);
    host::CatalogReading reading;
    reading.look = [&](const host::CatalogRows& soFar) {
        if (soFar.isWholeButViews && !replaces) work.endAtSteps();
        work.step([&] { return readSoFar(soFar); });
    };
    if (before) reading.isKnown = [&](const CString& view) { return holds(*before, view); };
    for (const std::string& catalogue : options.catalogues) {
        const auto reader = host::readerFor(catalogue, CString::fromUtf8(options.schema));
        if (schema.IsEmpty()) schema = reader->schema();
        try {
            reader->read(rows, reading);
        } catch (const Interrupted&) {
            return true;
        }
    }
    return false;
}

// The project to be gone on with; none where a new one is made.
DatabasePointer projectBefore(const ProjectOptions& options) {
    if (!options.goesOn) requireFree(options.file, options.force);
    if (!options.goesOn || !std::filesystem::exists(options.file)) return nullptr;
    DatabasePointer before = host::loadProject(options.file);
    if (before->GetDBType() != options.dialect->kind)
        throw ProjectFailure(options.file + ": is a project of another dialect, " +
                             std::string(dialectOf(*before, options.file).name));
    return before;
}

Told importCatalogue(const ProjectOptions& options) {
    LongWork work("reading " + options.catalogues.front(), options.showsProgress);
    work.endAtOnceWith("interrupted while the catalogue was read; " + options.file +
                       (std::filesystem::exists(options.file) ? " is as it was" : " was not made"));
    const DatabasePointer before = projectBefore(options);
    host::CatalogRows rows;
    CString schema = CString::fromUtf8(options.schema);
    const bool interrupted = readCatalogues(options, before.get(), rows, schema, work);
    work.endAtSteps();  // and there is none from here on
    const DatabasePointer made = host::makeDatabase(rows, options.dialect->kind, schema);
    for (const std::string& note : rows.notes) std::fprintf(stderr, "zrsql: %s\n", note.c_str());
    Count added{static_cast<std::uint64_t>(made->Tables.GetCount()),
                static_cast<std::uint64_t>(made->Queries.GetCount())};
    Count there;
    if (before) {
        there = {static_cast<std::uint64_t>(before->Tables.GetCount()),
                 static_cast<std::uint64_t>(before->Queries.GetCount())};
        added = addMissing(*before, *made);
        arrange(*before, rows);
    }
    host::Database& project = before ? *before : *made;
    if (project.Tables.IsEmpty() && project.Queries.IsEmpty())
        throw ProjectFailure(options.catalogues.front() + ": there is no table or view in it");
    host::saveProject(project, options.file, before ? host::formOfFile(options.file) : options.form);

    Told told;
    Summary& summary = told.summary.emplace();
    summary.interrupted = interrupted;
    summary.elapsed = work.elapsed();
    const auto text = [](const Count& count) {
        return counted(count.tables, "table", "tables") + " and " +
               counted(count.queries, "query", "queries");
    };
    summary.parts.push_back(text(added) + " done");
    if (before) summary.parts.push_back(text(there) + " there before");
    if (!rows.notes.empty()) summary.parts.push_back(std::to_string(rows.notes.size()) + " left out");
    if (interrupted) {
        const auto isOpen = [&](const host::CatalogRows::View& view) {
            return view.isOpen && !holds(project, view.name);
        };
        const auto open =
            static_cast<std::uint64_t>(std::count_if(rows.views.begin(), rows.views.end(), isOpen));
        summary.parts.push_back(counted(open, "view", "views") + " not read");
        summary.goesOn = options.file + " holds what was read, and the same command with --continue goes on";
    }
    return told;
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

Told analyze(const ProjectOptions& options) {
    LongWork work("analysing " + options.file, options.showsProgress);
    const DatabasePointer database = host::loadProject(options.file);
    const Dialect& dialect = dialectOf(*database, options.file);
    try {
        host::analyseQueries(
            *database, [&work](std::size_t done, std::size_t all) { work.step("analysed", done, all); });
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
    Told told;
    QuerySummary summary;
    if (options.asJson) told.out += "{\"queries\":[";
    bool isFirst = true;
    std::size_t done = 0;
    for (const CZRQueryInfo* query : shown) {
        work.step("followed", done++, shown.size());
        if (!isFirst) told.out += options.asJson ? "," : "\n";
        isFirst = false;
        const ReadPlace read = readPlace(dialect, query->m_sql);
        if (options.asJson)
            appendAnalysisJson(told.out, *query, tracer, read);
        else
            appendAnalysis(told.out, *query, tracer, read);
        summary.add({false, read.stop ? host::Unknown::PartOfText : tracer.missingOf(*query),
                     hasUnknownSource(tracer.columnsOf(*query))});
    }
    if (options.asJson) told.out += "]}\n";
    told.summary = summary.summary(work.elapsed());
    return told;
}

}  // namespace

const Dialect& dialectOf(const host::Database& database, const std::string& file) {
    const Dialect* dialect = findDialect(database.GetDBType());
    if (!dialect) throw ProjectFailure(file + ": no dialect belongs to its kind of database");
    return *dialect;
}

Told runProject(const ProjectOptions& options) {
    Told told;
    switch (options.command) {
        case ProjectCommand::New:
            makeProject(options);
            break;
        case ProjectCommand::Import:
            return importCatalogue(options);
        case ProjectCommand::AddTable:
            addTable(options);
            break;
        case ProjectCommand::AddQuery:
            addQuery(options);
            break;
        case ProjectCommand::List:
            appendList(told.out, *host::loadProject(options.file), options.file,
                       host::formOfFile(options.file));
            break;
        case ProjectCommand::Show:
            show(options, told.out);
            break;
        case ProjectCommand::Convert:
            requireFree(options.target, options.force);
            host::convertProject(options.file, options.target, options.form);
            break;
        case ProjectCommand::Analyze:
            return analyze(options);
    }
    return told;
}

}  // namespace zr::tool
