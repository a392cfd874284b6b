// zrsql: shows what the library sees in a SQL text.

#include <fcntl.h>
#include <unistd.h>

#include <cstdio>
#include <exception>
#include <iostream>
#include <memory>
#include <optional>

#include "analyst.h"
#include "batch.h"
#include "host/catalog.h"
#include "input.h"
#include "json_line.h"
#include "json_text.h"
#include "line_chunks.h"
#include "lineage_commands.h"
#include "long_work.h"
#include "options.h"
#include "project_commands.h"
#include "token_format.h"
#include "tree_format.h"

namespace zr::tool {

namespace {

constexpr int kUnreadable = 1;
constexpr int kWrongUse = 2;

std::unique_ptr<CZRDatabaseInfo> openDatabase(const Options& options) {
    if (options.catalog.empty()) return std::make_unique<host::Database>();
    if (options.catalog != "-") return host::openCatalog(options.catalog);
    try {
        return host::readCatalog(readBytes("-"));
    } catch (const host::CatalogError& problem) {
        throw InputError(std::string("standard input: ") + problem.what());
    }
}

// What the program says about one text that stands by itself.
void appendAnswer(std::string& out, const Options& options, CZRDatabaseInfo& database, const CString& text) {
    const Grammar& grammar = *options.dialect->grammar;
    Analyst analyst(*options.dialect, database);
    switch (options.command) {
        case Command::Tokens:
            appendTokenLines(out, grammar, text);
            return;
        case Command::Tree:
            appendTree(out, options.treeFormat, grammar, text);
            if (out.back() != '\n') out += '\n';
            return;
        case Command::Analyze:
            if (options.asPicture) {
                analyst.appendPicture(out, text);
            } else {
                out += '{';
                analyst.appendJsonMembers(out, text);
                out += "}\n";
            }
            return;
    }
}

void appendUtf8String(std::string& out, std::string_view utf8) {
    appendJsonString(out, CString::fromUtf8(utf8));
}

// The same as members of a line's object. Forms that are no JSON go into a string.
void appendAnswerMembers(std::string& out, const Options& options, CZRDatabaseInfo& database,
                         const CString& text) {
    const Grammar& grammar = *options.dialect->grammar;
    Analyst analyst(*options.dialect, database);
    std::string form;
    switch (options.command) {
        case Command::Tokens:
            out += "\"tokens\":";
            appendTokenJson(out, grammar, text);
            return;
        case Command::Tree:
            out += "\"tree\":";
            if (options.treeFormat == TreeFormat::Json)
                return appendTree(out, TreeFormat::Json, grammar, text);
            appendTree(form, options.treeFormat, grammar, text);
            return appendUtf8String(out, form);
        case Command::Analyze:
            if (!options.asPicture) return analyst.appendJsonMembers(out, text);
            out += "\"query\":";
            analyst.appendPicture(form, text);
            return appendUtf8String(out, form);
    }
}

bool appendLineAnswer(std::string& out, const Options& options, CZRDatabaseInfo& database,
                      std::string_view bytes, std::uint64_t number) {
    const JsonLine line = readJsonLine(bytes);
    out += "{\"id\":" + line.id + ",";
    const std::size_t head = out.size();
    std::string error = line.error;
    if (error.empty()) {
        try {
            appendAnswerMembers(out, options, database, CString(*line.sql));
            out += '}';
            return true;
        } catch (const std::exception& problem) {
            error = problem.what();
        }
    }
    out.resize(head);
    out += "\"error\":";
    appendUtf8String(out, error);
    out += ",\"line\":" + std::to_string(number) + "}";
    return false;
}

// The input of --jsonl.
class OpenInput {
 public:
    explicit OpenInput(const std::string& path)
        : descriptor_(path == "-" ? STDIN_FILENO : open(path.c_str(), O_RDONLY | O_CLOEXEC)) {
        if (descriptor_ < 0) throw InputError(path + ": can't be opened");
    }
    ~OpenInput() {
        if (descriptor_ != STDIN_FILENO) close(descriptor_);
    }
    OpenInput(const OpenInput&) = delete;
    OpenInput& operator=(const OpenInput&) = delete;
    int descriptor() const { return descriptor_; }

 private:
    int descriptor_;
};

// Gives the exit status.
int runLines(const Options& options, const CZRDatabaseInfo& catalogue) {
    const OpenInput input(options.jsonLines);
    const bool isTerminal = isatty(STDERR_FILENO) != 0;
    Progress progress(stderr, isTerminal);
    Batch batch;
    batch.input = input.descriptor();
    batch.output = stdout;
    batch.jobs = options.jobs;
    batch.skip = options.skip;
    if (options.showsProgress || isTerminal) batch.progress = &progress;
    // An analysis writes user functions into its database, and a look-up of columns marks sources. Clones
    // keep the IDs, so that all threads answer alike.
    batch.newWorker = [&]() -> LineWorker {
        const auto database = std::shared_ptr<CZRDatabaseInfo>(catalogue.Clone());
        return [&options, database](std::string_view line, std::uint64_t number, std::string& out) {
            return appendLineAnswer(out, options, *database, line, number);
        };
    };
    try {
        const BatchState end = runBatch(batch);
        if (batch.progress || end.interrupted) progress.end("zrsql: " + summaryText(end));
        return end.interrupted ? kInterruptedStatus : 0;
    } catch (const ReadError&) {
        throw InputError(options.jsonLines + ": can't be read to its end");
    }
}

// Gives the exit status.
int run(const Options& options) {
    if (options.project || options.lineage) {
        const Told told = options.project ? runProject(*options.project) : runLineage(*options.lineage);
        std::fwrite(told.out.data(), 1, told.out.size(), stdout);
        if (std::fflush(stdout) == 0 && told.summary)
            std::fprintf(stderr, "zrsql: %s\n", summaryText(*told.summary).c_str());
        return told.summary && told.summary->interrupted ? kInterruptedStatus : 0;
    }
    const auto database = openDatabase(options);
    if (!options.jsonLines.empty()) return runLines(options, *database);
    const std::string bytes = options.text ? *options.text : readBytes(options.file);
    std::string out;
    appendAnswer(out, options, *database, decodeText(bytes));
    std::fwrite(out.data(), 1, out.size(), stdout);
    return 0;
}

}  // namespace

}  // namespace zr::tool

int main(int argc, char** argv) {
    using namespace zr::tool;
    try {
        std::ios::sync_with_stdio(false);
        int exitStatus = 0;
        const auto options = readOptions(argc, argv, exitStatus);
        if (!options) return exitStatus;
        exitStatus = run(*options);
        if (std::fflush(stdout) != 0 || std::ferror(stdout)) {
            std::fputs("zrsql: standard output can't be written\n", stderr);
            return kUnreadable;
        }
        return exitStatus;
    } catch (const WrongUse& problem) {
        std::fprintf(stderr, "zrsql: %s\n", problem.what());
        return kWrongUse;
    } catch (const Interrupted& interrupt) {
        std::fprintf(stderr, "zrsql: %s\n", interrupt.what());
        return kInterruptedStatus;
    } catch (const std::exception& problem) {
        std::fprintf(stderr, "zrsql: %s\n", problem.what());
        return kUnreadable;
    }
}
