/// Microseconds a query and nanoseconds a token by stage: lex, a facade's whole road, the same through
/// contexts of the runtime, and BuildQueryInfo; and how the time of each shape of text grows when the text
/// doubles.

#include <benchmark/benchmark.h>
#include <zrparsersql/analysis.h>
#include <zrparsersql/database_info.h>
#include <zrparsersql/input_stream.h>
#include <zrparsersql/query_info.h>
#include <zrparsersql/recognizers/MSSQL.h>
#include <zrparsersql/sql_parsers.h>

#include <cstdio>
#include <cstdlib>
#include <string>

#include "bench/queries.h"
#include "bench/timing.h"
#include "grammar/engine/lexed_text.h"
#include "parser/grammars.h"

/// What a profiler is told to look at: valgrind --toggle-collect='measuredRun*'.
__attribute__((noinline)) void measuredRun(std::size_t (*stage)(const std::u16string&),
                                           const std::u16string& text) {
    stage(text);
}

namespace {

std::u16string wide(const std::string& text) {
    return {text.begin(), text.end()};
}

std::size_t lex(const std::u16string& text) {
    return zr::engine::LexedText(*zr::grammars::MSSQL.lexer, text).seenCount();
}

/// The facade's road.
std::size_t parse(const std::u16string& text) {
    CString sql(text);
    CZRMSSQLParser facade;
    facade.SetSQL(sql);
    facade.ParseSQL();
    CZRSQLTree* tree = nullptr;
    facade.GetSQLTree(&tree);
    delete tree;
    return 0;
}

/// The road of whoever holds contexts: tokens and nodes of the runtime.
std::size_t parseWithContexts(const std::u16string& text) {
    const pANTLR3_INPUT_STREAM input =
        zrNewUtf16InPlaceStream(text.data(), static_cast<std::uint32_t>(text.size()));
    const pMSSQLLexer lexer = MSSQLLexerNew(input);
    const pANTLR3_COMMON_TOKEN_STREAM tokens =
        antlr3CommonTokenStreamSourceNew(1025, lexer->pLexer->rec->state->tokSource);
    const pMSSQLParser parser = MSSQLParserNew(tokens);
    benchmark::DoNotOptimize(parser->start_rule(parser).tree);
    parser->free(parser);
    tokens->free(tokens);
    lexer->free(lexer);
    input->close(input);
    return 0;
}

std::size_t analyse(const std::u16string& text) {
    CZRQueryInfo query;
    query.SetSQL(CString(text.data(), static_cast<int>(text.size())));
    BuildQueryInfo(&query, DB_MSSQL);
    benchmark::DoNotOptimize(query.m_selectItems.GetCount());
    return 0;
}

template <typename Run>
void run(benchmark::State& state, const std::string& query, Run stage) {
    const std::u16string text = wide(query);
    const std::size_t tokens = lex(text);
    for (auto _ : state) benchmark::DoNotOptimize(stage(text));
    state.counters["tokens"] = static_cast<double>(tokens);
    state.counters["ns/token"] =
        benchmark::Counter(static_cast<double>(tokens) * 1e-9,
                           benchmark::Counter::kIsIterationInvariantRate | benchmark::Counter::kInvert);
}

double seconds(std::size_t (*stage)(const std::u16string&), const std::u16string& text) {
    return zr::bench::bestTime([&] { stage(text); }, 5);
}

/// The table of growth: time at n, and time(2n)/time(n) for parse and for the whole analysis.
void printGrowth() {
    std::printf("%-28s %6s %8s %10s %7s %10s %7s\n", "shape", "n", "tokens", "parse ns", "ratio", "all ns",
                "ratio");
    std::printf("%-28s %6s %8s %10s %7s %10s %7s\n", "", "", "at 2n", "/token", "2n/n", "/token", "2n/n");
    for (const auto& family : zr::bench::families()) {
        const std::u16string one = wide(family.text(family.n)), two = wide(family.text(2 * family.n));
        const std::size_t tokens = lex(two);
        const double p1 = seconds(&parse, one), p2 = seconds(&parse, two);
        const double a1 = seconds(&analyse, one), a2 = seconds(&analyse, two);
        std::printf("%-28s %6d %8zu %10.0f %7.2f %10.0f %7.2f\n", family.name, family.n, tokens,
                    p2 * 1e9 / static_cast<double>(tokens), p2 / p1, a2 * 1e9 / static_cast<double>(tokens),
                    a2 / a1);
    }
}

/// One run over a shape at a size, for growth.sh; says how many tokens that is. False where there is no such
/// shape or stage.
bool runOnce(const std::string& shape, const std::string& stage, int n) {
    for (const auto& family : zr::bench::families()) {
        if (family.name != shape) continue;
        const std::u16string text = wide(family.text(n));
        if (stage != "analyse" && stage != "parse") return false;
        measuredRun(stage == "analyse" ? &analyse : &parse, text);
        std::printf("%zu tokens\n", lex(text));
        return true;
    }
    return false;
}

void registerAll() {
    for (const int blocks : {1, 4, 16, 48}) {
        const std::string query = zr::bench::plainQuery(blocks);
        const std::string suffix = "/plain_" + std::to_string(blocks);
        benchmark::RegisterBenchmark(("lex" + suffix).c_str(),
                                     [query](benchmark::State& s) { run(s, query, lex); });
        benchmark::RegisterBenchmark(("parse" + suffix).c_str(),
                                     [query](benchmark::State& s) { run(s, query, parse); });
        benchmark::RegisterBenchmark(("contexts" + suffix).c_str(),
                                     [query](benchmark::State& s) { run(s, query, parseWithContexts); });
        benchmark::RegisterBenchmark(("analyse" + suffix).c_str(),
                                     [query](benchmark::State& s) { run(s, query, analyse); });
    }
}

}  // namespace

int main(int argc, char** argv) {
    const std::string word = argc > 1 ? argv[1] : "";
    if (word == "--growth") {
        printGrowth();
        return 0;
    }
    if (word == "--shapes") {
        for (const auto& family : zr::bench::families()) std::printf("%s %d\n", family.name, family.n);
        return 0;
    }
    if (word == "--once") {
        if (argc == 5 && runOnce(argv[2], argv[3], std::atoi(argv[4]))) return 0;
        std::fprintf(stderr, "stages_bench --once SHAPE parse|analyse N; --shapes lists the shapes\n");
        return 1;
    }
    registerAll();
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
    return 0;
}
