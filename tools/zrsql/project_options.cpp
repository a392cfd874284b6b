#include "project_options.h"

#include <CLI/CLI.hpp>

#include "host/catalog_reader.h"
#include "progress_option.h"

namespace zr::tool {

namespace {

host::StorageForm formOf(const std::string& word, const std::string& file) {
    if (word == "json") return host::StorageForm::Json;
    if (word == "sqlite") return host::StorageForm::Sqlite;
    if (const auto form = host::formByName(file)) return *form;
    throw WrongUse(file +
                   ": the name tells no form; let it end in .json, .db, .sqlite or .sqlite3, or give --form");
}

const Dialect* dialectOfSource(const std::string& catalogue) {
    const auto kind = host::kindOfSource(catalogue);
    if (!kind)
        throw WrongUse(
            "--dialect is required, but where the address of a server or a file of MS Access tells it");
    return findDialect(*kind);
}

}  // namespace

CLI::App* ProjectWords::add(const std::string& name, const std::string& help, ProjectCommand command) {
    CLI::App* added = project_->add_subcommand(name, help);
    added->add_option("FILE", options_.file, "The project, a JSON or SQLite file")->required();
    commands_.emplace_back(added, command);
    return added;
}

// Gives the option that replaces a file.
CLI::Option* ProjectWords::addForm(CLI::App& app) {
    app.add_option("--form", form_, "Form of the file: json or sqlite; otherwise its name's ending tells")
        ->check(CLI::IsMember({"json", "sqlite"}))
        ->type_name("FORM");
    return app.add_flag("--force", options_.force, "Replace the file when it is there");
}

void ProjectWords::addTo(CLI::App& app) {
    project_ = app.add_subcommand("project", "Work on a stored project: tables and queries of one database");
    project_->require_subcommand(1);

    CLI::App* created = add("new", "Make a project", ProjectCommand::New);
    created->add_option("-d,--dialect", dialect_, "Dialect of its queries: " + dialectNames(true))
        ->required()
        ->type_name("DIALECT");
    created->add_option("--schema", options_.schema, "Schema of the database")->type_name("NAME");
    created
        ->add_option(
            "--catalog", options_.catalog,
            "Begin with the tables of a catalogue (JSON list) or the tables and queries of a project")
        ->type_name("FILE");
    addForm(*created);

    created->footer(
        "Example:\n  zrsql project new shop.json -d mssql --schema dbo\n\n"
        "Ends with status 1, and makes nothing, when the file is there or can't be written.");

    CLI::App* imported = project_->add_subcommand(
        "import", "Make a project of what a database tells of itself: tables, keys and views");
    imported
        ->add_option("CATALOGUE", catalogue_,
                     "An SQLite or MS Access database, a CSV or JSON dump of INFORMATION_SCHEMA or Oracle's "
                     "ALL_ views, or a "
                     "server, such as postgresql://USER@HOST:PORT/DATABASE?schema=NAME")
        ->required();
    imported->add_option("PROJECT", options_.file, "The project to make, a JSON or SQLite file")->required();
    commands_.emplace_back(imported, ProjectCommand::Import);
    imported
        ->add_option(
            "-d,--dialect", dialect_,
            "Dialect of its queries, which a server's address and a file of MS Access tell by themselves: " +
                dialectNames(true))
        ->type_name("DIALECT");
    imported
        ->add_option("--also", options_.catalogues,
                     "Another dump of the same database, such as its views or keys; may stand many times")
        ->type_name("FILE")
        ->allow_extra_args(false);
    imported->add_option("--schema", options_.schema, "Take this schema or owner only")->type_name("NAME");
    CLI::Option* force = addForm(*imported);
    imported
        ->add_flag("--continue", options_.goesOn,
                   "Add to the project, where it is there, what it does not have yet: goes on behind an "
                   "import that was interrupted")
        ->excludes(force);
    addProgressTo(*imported, options_.showsProgress);
    imported->footer(
        "Examples:\n  zrsql project import columns.csv shop.json -d mssql --also views.csv --schema dbo\n"
        "  zrsql project import mysql://reader@db.example/shop shop.json\n\n"
        "Passwords are taken from PGPASSWORD or ~/.pgpass, MYSQL_PWD or ~/.my.cnf.\n"
        "What can't be taken in is told on standard error, a line each, and the rest goes on. An interrupt\n"
        "while the texts of views are read leaves a project with those that were read.");

    CLI::App* table = add("add-table", "Add a table", ProjectCommand::AddTable);
    table->add_option("NAME", options_.name, "Name of the table")->required();
    table->add_option("COLUMN", options_.columns,
                      "Its columns, NAME or NAME:TYPE, such as id:int or \"price:decimal(10,2)\"");
    table->add_option("--key", options_.key, "Columns of the primary key, with commas between them")
        ->type_name("COLUMNS");
    table->add_option("--unique", options_.uniques, "Columns of a unique index; may stand many times")
        ->type_name("COLUMNS")
        ->allow_extra_args(false);
    table
        ->add_option("--references", options_.references,
                     "A foreign key, \"COLUMNS=TABLE(COLUMNS)\"; may stand many times")
        ->type_name("KEY")
        ->allow_extra_args(false);

    table->footer(
        "Example:\n  zrsql project add-table shop.json orders id:int customer_id:int \\\n"
        "      --key id --references \"customer_id=customers(id)\"");

    CLI::App* query = add("add-query", "Add a query", ProjectCommand::AddQuery);
    query->add_option("NAME", options_.name, "Name of the query")->required();
    CLI::Option* text = query->add_option("TEXT", text_, "The SQL text; - or nothing reads standard input");
    query->add_option("-f,--file", options_.textFile, "Read the SQL text from a file (UTF-8)")
        ->type_name("FILE")
        ->excludes(text);

    query->footer("Example:\n  zrsql project add-query shop.json all_orders \"SELECT * FROM orders\"");

    add("list", "List tables and queries", ProjectCommand::List);
    add("show", "Show a table, a query, or the project's options", ProjectCommand::Show)
        ->add_option("NAME", options_.name, "Name of the table or query");

    CLI::App* convert =
        add("convert", "Write the project into another file, of either form", ProjectCommand::Convert)
            ->alias("save");
    convert->add_option("TARGET", options_.target, "The file to write")->required();
    addForm(*convert);

    convert->footer(
        "Example:\n  zrsql project convert shop.json shop.db\n\n"
        "Nothing is lost: every stored name and value is written as it stands.");

    CLI::App* analyze = add("analyze", "Analyse the queries and show where each result column comes from",
                            ProjectCommand::Analyze);
    analyze->add_option("NAME", options_.names, "Show these queries only");
    analyze->add_option("--format", format_, "Form of the output: pretty, json")
        ->check(CLI::IsMember({"pretty", "json"}))
        ->type_name("FORMAT");
    addProgressTo(*analyze, options_.showsProgress);
    analyze->footer(
        "Example:\n  zrsql project analyze shop.json all_orders\n\n"
        "Each query is shown behind those that it reads from. Queries that read from each other in a\n"
        "ring are an error. Wrong SQL is none: what was read of it is shown.");
    project_->footer(
        "A project that is read may have any name. One that is made is JSON for a name that ends in .json,\n"
        "SQLite for .db, .sqlite or .sqlite3. Exit status: 0 done, 1 a file can't be read or written or is "
        "no\n"
        "whole project, 2 wrong use, 130 interrupted.");
}

std::optional<ProjectOptions> ProjectWords::read() const {
    if (!project_->parsed()) return std::nullopt;
    ProjectOptions options = options_;
    const CLI::App* used = nullptr;
    for (const auto& [app, command] : commands_) {
        if (!app->parsed()) continue;
        used = app;
        options.command = command;
    }
    if (options.command == ProjectCommand::Import)
        options.catalogues.insert(options.catalogues.begin(), catalogue_);
    if (options.command == ProjectCommand::New || options.command == ProjectCommand::Import) {
        options.dialect = findDialect(dialect_);
        if (dialect_.empty()) options.dialect = dialectOfSource(catalogue_);
        if (!options.dialect || options.dialect->kind == DB_NONE)
            throw WrongUse("there is no project in the dialect \"" + dialect_ + "\"; there are " +
                           dialectNames(true));
        options.form = formOf(form_, options.file);
    }
    if (options.command == ProjectCommand::Convert) options.form = formOf(form_, options.target);
    if (options.command == ProjectCommand::AddQuery && used->count("TEXT") && text_ != "-")
        options.text = text_;
    options.asJson = format_ == "json";
    return options;
}

}  // namespace zr::tool
