/// Nanoseconds, allocations and bytes a token by stage over files of queries, DIALECT.jsonl with a member
/// "sql" on each line: the median over the queries that are read to their end, and over the others.
///
///     corpus_bench [--rounds N] [--dialect NAME] [FOLDER]
///     corpus_bench --once --dialect NAME --stage NAME [FOLDER]     for a profiler: one stage, no clock
///
/// Without a folder the queries of bench/plain_queries.jsonl are taken. What goes by "tree" has lexing and
/// recognising in it, "facade" has "tree" in it, and "analyse" all.

#include <time.h>
#include <zrparsersql/analysis.h>
#include <zrparsersql/database_info.h>
#include <zrparsersql/query_info.h>
#include <zrparsersql/sql_parsers.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <functional>
#include <memory>
#include <nlohmann/json.hpp>
#include <string>
#include <thread>
#include <vector>

#include "analysis/driver.h"
#include "analysis/msaccess_state.h"
#include "analysis/mssql_state.h"
#include "analysis/mysql_state.h"
#include "analysis/oracle_state.h"
#include "analysis/postgresql_state.h"
#include "bench/counting_heap.h"
#include "grammar/engine/lexed_text.h"
#include "grammar/engine/rule_reading.h"
#include "grammar/engine/syntax_tree.h"
#include "parser/grammars.h"

namespace {

using zr::bench::HeapCount;
using zr::bench::HeapUse;
using zr::engine::GrammarTable;
using zr::engine::LexedText;
using zr::engine::RuleDerivation;
using zr::engine::SyntaxTree;

struct Query {
    CString text;
    std::uint32_t tokens = 0;
    bool isReadToEnd = false;
};

template <class Facade>
void useFacade(CString& text) {
    Facade facade;
    facade.SetSQL(text);
    facade.ParseSQL();
    CZRSQLTree* tree = nullptr;
    facade.GetSQLTree(&tree);
    delete tree;
}

/// Everything behind the parse: the views, the passes over them, and the descriptor's end.
template <class Facade, class State>
std::function<void()> walkOf(CString& text) {
    const auto facade = std::make_shared<Facade>();
    facade->SetSQL(text);
    facade->ParseSQL();
    return [facade, &text] {
        CZRQueryInfo query;
        CZRSQLTree* root = nullptr;
        facade->GetSQLTree(&root);
        const std::unique_ptr<CZRSQLTree> tree(root);
        CZRSQLTree* const selectNode = zr::findSelectNode(root, State::isSelectNode);
        if (!selectNode) return;
        State state(selectNode);
        state.m_query = &query;
        state.setItemLimit(zr::itemLimit(text));
        try {
            zr::runPasses(state);
            state.ProcessTail(root);
        } catch (...) {
            // As in BuildQueryInfo, the query keeps what it has.
        }
    };
}

struct Dialect {
    const char* name;
    const GrammarTable& grammar;
    DBTypes kind;
    void (*facade)(CString& text);
    std::function<void()> (*walk)(CString& text);
};

const Dialect kDialects[] = {
    {"mssql", zr::grammars::MSSQL, DB_MSSQL, &useFacade<CZRMSSQLParser>,
     &walkOf<CZRMSSQLParser, MSSQLStateSelectQuery>},
    {"mysql", zr::grammars::MySQLSelect, DB_MYSQL, &useFacade<CZRMySQLParcer>,
     &walkOf<CZRMySQLParcer, MySQLStateSelectQuery>},
    {"oracle", zr::grammars::Oracle, DB_ORACLE, &useFacade<CZROracleParser>,
     &walkOf<CZROracleParser, OracleStateSelectQuery>},
    {"postgresql", zr::grammars::PostgreSQL, DB_POSTGRESQL, &useFacade<CZRPostgreParser>,
     &walkOf<CZRPostgreParser, PostgreStateSelectQuery>},
    {"msaccess", zr::grammars::MSAccessSQL_v3, DB_MSACCESS, &useFacade<CZRMSAccessSQL_v3Parcer>,
     &walkOf<CZRMSAccessSQL_v3Parcer, MSAccessSQL_v3StateSelectQuery>},
};

/// The queries of a folder's file of the dialect, or without a folder the plain ones, of which a dialect can
/// have a form of its own.
std::vector<Query> readQueries(const Dialect& dialect, const std::string& folder) {
    const std::string path = folder.empty() ? ZR_PLAIN_QUERIES : folder + "/" + dialect.name + ".jsonl";
    std::vector<Query> queries;
    std::ifstream file(path);
    if (!file) std::fprintf(stderr, "corpus_bench: %s can't be read\n", path.c_str());
    for (std::string line; std::getline(file, line);) {
        if (line.empty()) continue;
        const nlohmann::json record = nlohmann::json::parse(line);
        const char* const form = record.contains(dialect.name) ? dialect.name : "sql";
        Query query;
        query.text = CString(record.at(form).get<std::string>().c_str());
        const LexedText lexed(*dialect.grammar.lexer, query.text);
        query.tokens = lexed.seenCount();
        if (query.tokens == 0) continue;
        const RuleDerivation derivation(*dialect.grammar.parser, lexed.types(), {},
                                        dialect.grammar.parser->statementRule);
        query.isReadToEnd = derivation.result().found && derivation.result().high == query.tokens;
        queries.push_back(std::move(query));
    }
    return queries;
}

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

double seconds(const timespec& a, const timespec& b) {
    return static_cast<double>(b.tv_sec - a.tv_sec) + 1e-9 * static_cast<double>(b.tv_nsec - a.tv_nsec);
}

double bestTime(const std::function<void()>& run, int rounds) {
    double best = 1e9;
    for (int i = 0; i < rounds; ++i) {
        timespec a{}, b{};
        clock_gettime(CLOCK_THREAD_CPUTIME_ID, &a);
        run();
        clock_gettime(CLOCK_THREAD_CPUTIME_ID, &b);
        best = std::min(best, seconds(a, b));
    }
    return best;
}

double median(std::vector<double> values) {
    if (values.empty()) return 0;
    const auto middle = values.begin() + static_cast<std::ptrdiff_t>(values.size() / 2);
    std::nth_element(values.begin(), middle, values.end());
    return *middle;
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
    bool once = false;
    std::string only, stageName, folder;
    for (int i = 1; i < argc; ++i) {
        const std::string word = argv[i];
        if (word == "--rounds" && i + 1 < argc)
            rounds = std::atoi(argv[++i]);
        else if (word == "--once")
            once = true;
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
    for (const Dialect& dialect : kDialects) {
        if (!only.empty() && only != dialect.name) continue;
        std::vector<Query> queries = readQueries(dialect, folder);
        if (!once) {
            measure(dialect, queries, rounds);
            continue;
        }
        std::uint64_t tokens = 0;
        for (const Stage& stage : stages()) {
            if (stageName != stage.name) continue;
            for (Query& query : queries) {
                if (!query.isReadToEnd) continue;
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
