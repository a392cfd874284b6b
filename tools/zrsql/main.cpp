// zrsql: shows what the library sees in a SQL text.

#include <cstdio>
#include <exception>
#include <fstream>
#include <iostream>
#include <memory>

#include "analyst.h"
#include "batch.h"
#include "host/catalog.h"
#include "input.h"
#include "json_line.h"
#include "json_text.h"
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
constexpr int kInterrupted = 130;  // as shells tell a program that SIGINT ended

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

std::string lineAnswer(const Options& options, CZRDatabaseInfo& database, std::string_view bytes) {
    const JsonLine line = readJsonLine(bytes);
    const std::string head = "{\"id\":" + line.id + ",";
    std::string error = line.error;
    if (error.empty()) {
        try {
            std::string out = head;
            appendAnswerMembers(out, options, database, CString(*line.sql));
            return out += '}';
        } catch (const std::exception& problem) {
            error = problem.what();
        }
    }
    std::string out = head + "\"error\":";
    appendUtf8String(out, error);
    return out += '}';
}

void runLines(const Options& options, const CZRDatabaseInfo& prototype) {
    // Clones keep the IDs, so that all threads answer alike.
    const auto newWorker = [&]() -> LineWorker {
        const std::shared_ptr<CZRDatabaseInfo> database(prototype.Clone());
        return [&options, database](std::string_view line) { return lineAnswer(options, *database, line); };
    };
    std::ifstream file;
    if (options.jsonLines != "-") {
        file.open(options.jsonLines, std::ios::binary);
        if (!file) throw InputError(options.jsonLines + ": can't be opened");
    }
    std::istream& input = options.jsonLines == "-" ? std::cin : file;
    runBatch(input, stdout, options.jobs, newWorker);
    if (input.bad()) throw InputError(options.jsonLines + ": can't be read to its end");
}

void run(const Options& options) {
    if (options.project || options.lineage) {
        std::string told;
        if (options.project)
            runProject(*options.project, told);
        else
            runLineage(*options.lineage, told);
        std::fwrite(told.data(), 1, told.size(), stdout);
        return;
    }
    const auto database = openDatabase(options);
    if (!options.jsonLines.empty()) return runLines(options, *database);
    const std::string bytes = options.text ? *options.text : readBytes(options.file);
    std::string out;
    appendAnswer(out, options, *database, decodeText(bytes));
    std::fwrite(out.data(), 1, out.size(), stdout);
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
        run(*options);
        if (std::fflush(stdout) != 0 || std::ferror(stdout)) {
            std::fputs("zrsql: standard output can't be written\n", stderr);
            return kUnreadable;
        }
        return 0;
    } catch (const WrongUse& problem) {
        std::fprintf(stderr, "zrsql: %s\n", problem.what());
        return kWrongUse;
    } catch (const Interrupted& interrupt) {
        std::fprintf(stderr, "zrsql: %s\n", interrupt.what());
        return kInterrupted;
    } catch (const std::exception& problem) {
        std::fprintf(stderr, "zrsql: %s\n", problem.what());
        return kUnreadable;
    }
}
