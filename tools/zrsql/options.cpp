#include "options.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <iostream>
#include <thread>

#include "host/catalog_reader.h"

namespace zr::tool {

namespace {

constexpr unsigned kMostJobs = 256;

// What the command line says, before it is checked as a whole.
struct Words {
    std::string dialect;
    std::string text;
    std::string file;
    std::string jsonLines;
    std::string format;
    std::string catalog;
    unsigned jobs = 1;
    std::uint64_t skip = 0;
    bool showsProgress = false;
};

CLI::App* addCommand(CLI::App& app, Words& words, const std::string& name, const std::string& help) {
    CLI::App* command = app.add_subcommand(name, help);
    command->add_option("-d,--dialect", words.dialect, "Dialect of the text: " + dialectNames())
        ->required()
        ->type_name("DIALECT");
    CLI::Option* text =
        command->add_option("TEXT", words.text, "The SQL text; - or nothing reads standard input");
    CLI::Option* file = command
                            ->add_option("-f,--file", words.file,
                                         "Read the SQL text from a file (UTF-8); - is standard input")
                            ->type_name("FILE")
                            ->excludes(text);
    CLI::Option* jsonLines =
        command
            ->add_option("--jsonl", words.jsonLines,
                         "Read {\"id\": ..., \"sql\": \"...\"} a line and write one JSON object a line; "
                         "- is standard input")
            ->type_name("FILE")
            ->excludes(text)
            ->excludes(file);
    command->add_option("--jobs", words.jobs, "Threads to work on the lines of --jsonl; 0 is one a processor")
        ->check(CLI::Range(0u, kMostJobs))
        ->needs(jsonLines)
        ->type_name("N");
    command
        ->add_option("--skip", words.skip,
                     "Pass the first N lines of --jsonl over, to go on behind a run that was interrupted")
        ->check(CLI::NonNegativeNumber)
        ->needs(jsonLines)
        ->type_name("N");
    command
        ->add_flag("--progress", words.showsProgress,
                   "Tell on standard error how far the lines of --jsonl are; a terminal is told anyway")
        ->needs(jsonLines);
    return command;
}

void addFormat(CLI::App* command, Words& words, const std::vector<std::string>& formats) {
    command->add_option("--format", words.format, "Form of the output: " + CLI::detail::join(formats, ", "))
        ->check(CLI::IsMember(formats))
        ->type_name("FORMAT");
}

TreeFormat treeFormat(const std::string& name) {
    if (name == "json") return TreeFormat::Json;
    if (name == "dot") return TreeFormat::Dot;
    return name == "pretty" ? TreeFormat::Pretty : TreeFormat::Sexpr;
}

std::string versionText() {
    return "zrsql " ZR_VERSION "\nimports from: " + CLI::detail::join(host::catalogReaders(), ", ");
}

// Empty, or why the dialect can't serve the command.
std::string complaintAbout(const Dialect* dialect, const Words& words, Command command) {
    if (!dialect) return "there is no dialect \"" + words.dialect + "\"; there are " + dialectNames();
    if (command == Command::Analyze && dialect->kind == DB_NONE)
        return words.dialect + " has tokens and a tree only; there is no analysis of it";
    return {};
}

}  // namespace

std::optional<Options> readOptions(int argc, char** argv, int& exitStatus) {
    CLI::App app("Shows what the library libzrparsersql sees in a SQL text.", "zrsql");
    app.set_version_flag("--version", versionText());
    app.require_subcommand(1);
    Words words;
    const CLI::App* tokens = addCommand(app, words, "tokens", "Show the tokens of the text");
    CLI::App* tree = addCommand(app, words, "tree", "Show the syntax tree of the text");
    addFormat(tree, words, {"sexpr", "json", "dot", "pretty"});
    CLI::App* analyze = addCommand(app, words, "analyze", "Show the query's descriptor");
    addFormat(analyze, words, {"json", "pretty"});
    analyze
        ->add_option("--catalog", words.catalog,
                     "Tables of the database, to resolve the query's sources: a JSON list or a project")
        ->type_name("FILE");

    ProjectWords projectWords;
    projectWords.addTo(app);
    LineageWords lineageWords;
    lineageWords.addTo(app);

    Options options;
    try {
        app.parse(argc, argv);
        options.project = projectWords.read();
        options.lineage = lineageWords.read();
        if (options.project || options.lineage) return options;
    } catch (const CLI::Success& asked) {  // help or version
        exitStatus = app.exit(asked);
        return std::nullopt;
    } catch (const CLI::ParseError& wrong) {
        std::cerr << "zrsql: " << wrong.what() << "\nzrsql: try \"zrsql --help\"\n";
        exitStatus = 2;
        return std::nullopt;
    }

    options.command = tokens->parsed() ? Command::Tokens : tree->parsed() ? Command::Tree : Command::Analyze;
    options.dialect = findDialect(words.dialect);
    if (const std::string complaint = complaintAbout(options.dialect, words, options.command);
        !complaint.empty()) {
        std::cerr << "zrsql: " << complaint << '\n';
        exitStatus = 2;
        return std::nullopt;
    }
    CLI::App* used = app.get_subcommands().front();
    if (used->count("TEXT") && words.text != "-") options.text = words.text;
    if (!words.file.empty()) options.file = words.file;
    options.jsonLines = words.jsonLines;
    options.treeFormat = treeFormat(words.format);
    options.asPicture = words.format == "pretty";
    options.catalog = words.catalog;
    options.jobs = words.jobs ? words.jobs : std::clamp(std::thread::hardware_concurrency(), 1u, kMostJobs);
    options.skip = words.skip;
    options.showsProgress = words.showsProgress;
    return options;
}

}  // namespace zr::tool
