/// Nanoseconds, allocations and bytes a token by stage over files of queries, DIALECT.jsonl with a member
/// "sql" on each line: the median over the queries that are read to their end, and over the others.
///
///     corpus_bench [--rounds N] [--dialect NAME] [FOLDER]
///     corpus_bench --once [--part] --dialect NAME --stage NAME [FOLDER]
///
/// --once is for a profiler: one stage, no clock, of the queries that are read to their end, or with --part
/// of the others.
///
/// Without a folder the queries of bench/plain_queries.jsonl are taken. What goes by "tree" has lexing and
/// recognising in it, "facade" has "tree" in it, and "analyse" all.

#include <zrparsersql/analysis.h>
#include <zrparsersql/query_info.h>

#include <cstdio>
#include <cstdlib>
#include <functional>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include "bench/counting_heap.h"
#include "bench/dialects.h"
#include "bench/timing.h"
#include "grammar/engine/lexed_text.h"
#include "grammar/engine/rule_reading.h"
#include "grammar/engine/syntax_tree.h"

namespace {

using zr::bench::bestTime;
using zr::bench::Dialect;
using zr::bench::HeapCount;
using zr::bench::HeapUse;
using zr::bench::median;
using zr::bench::Query;
using zr::engine::LexedText;
using zr::engine::RuleDerivation;
using zr::engine::SyntaxTree;

/// A stage and what it needs to have been done before, which isn't measured.
struct Stage {
    const char* name;
    std::function<std::function<void()>(const Dialect&, Query&)> prepare;
};

const std::vector<Stage>& stages() {
    static const std::vector<Stage> all{
        {"lex",
         [](const Dialect& d, Query& q) -> std::function<void()> {
             return [&d, &q] { LexedText(*d.grammar.lexer, q.text); };
         }},
        {"recognise",
         [](const Dialect& d, Query& q) -> std::function<void()> {
             auto lexed = std::make_shared<LexedText>(*d.grammar.lexer, q.text);
             return [&d, lexed] {
                 RuleDerivation(*d.grammar.parser, lexed->types(), {}, d.grammar.parser->startRule);
             };
         }},
        {"tree",
         [](const Dialect& d, Query& q) -> std::function<void()> {
             return [&d, &q] { SyntaxTree(d.grammar, q.text); };
         }},
        {"facade",
         [](const Dialect& d, Query& q) -> std::function<void()> { return [&d, &q] { d.facade(q.text); }; }},
        {"walk", [](const Dialect& d, Query& q) -> std::function<void()> { return d.walk(q.text); }},
        {"analyse",
         [](const Dialect& d, Query& q) -> std::function<void()> {
             return [&d, &q] {
                 CZRQueryInfo query;
                 query.SetSQL(q.text);
                 BuildQueryInfo(&query, d.kind);
             };
         }},
    };
    return all;
}

/// On a thread of its own, so that the memory that a thread keeps between two texts counts as well.
HeapUse heapUse(const std::function<void()>& run) {
    HeapUse use;
    std::thread([&] {
        HeapCount count;
        run();
        use = count.use();
    }).join();
    return use;
}

void measure(const Dialect& dialect, std::vector<Query>& queries, int rounds) {
    for (const bool isReadToEnd : {true, false}) {
        for (const Stage& stage : stages()) {
            std::vector<double> ns, allocations, peaks;
            double all = 0, tokens = 0;
            for (Query& query : queries) {
                if (query.isReadToEnd != isReadToEnd) continue;
                const auto run = stage.prepare(dialect, query);
                const double time = bestTime(run, rounds);
                const HeapUse use = heapUse(run);
                const double count = query.tokens;
                ns.push_back(time * 1e9 / count);
                allocations.push_back(static_cast<double>(use.allocations) / count);
                peaks.push_back(static_cast<double>(use.peakBytes) / count);
                all += time;
                tokens += count;
            }
            if (ns.empty()) continue;
            std::printf("%-11s %-6s %5zu  %-10s %8.0f %8.0f %8.2f %8.0f\n", dialect.name,
                        isReadToEnd ? "whole" : "part", ns.size(), stage.name, median(ns),
                        tokens > 0 ? all * 1e9 / tokens : 0.0, median(allocations), median(peaks));
        }
    }
}

}  // namespace

/// What a profiler is told to look at: valgrind --toggle-collect='measuredRun*'.
__attribute__((noinline)) void measuredRun(const std::function<void()>& run) {
    run();
}

int main(int argc, char** argv) {
    int rounds = 20;
    bool once = false, part = false;
    std::string only, stageName, folder;
    for (int i = 1; i < argc; ++i) {
        const std::string word = argv[i];
        if (word == "--rounds" && i + 1 < argc)
            rounds = std::atoi(argv[++i]);
        else if (word == "--once")
            once = true;
        else if (word == "--part")
            part = true;
        else if (word == "--dialect" && i + 1 < argc)
            only = argv[++i];
        else if (word == "--stage" && i + 1 < argc)
            stageName = argv[++i];
        else
            folder = word;
    }
    if (!once)
        std::printf("%-11s %-6s %5s  %-10s %8s %8s %8s %8s\n", "dialect", "read", "n", "stage", "ns/token",
                    "(whole)", "allocs", "peak B");
    for (const Dialect& dialect : zr::bench::dialects()) {
        if (!only.empty() && only != dialect.name) continue;
        std::vector<Query> queries = zr::bench::readQueries(dialect, folder);
        if (!once) {
            measure(dialect, queries, rounds);
            continue;
        }
        std::uint64_t tokens = 0;
        for (const Stage& stage : stages()) {
            if (stageName != stage.name) continue;
            for (Query& query : queries) {
                if (query.isReadToEnd == part) continue;
                const auto run = stage.prepare(dialect, query);
                run();  // what a thread keeps for its next text is there
                measuredRun(run);
                tokens += query.tokens;
            }
        }
        std::printf("%s: %llu tokens\n", dialect.name, static_cast<unsigned long long>(tokens));
    }
    return 0;
}
