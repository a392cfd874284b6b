/// The same queries through this library, SQLite and, where it is installed, libpg_query, taking turns in one
/// process.
///
///     compare [--rounds N] [--dialect NAME] [--queries] [FOLDER]
///
/// Each of them gets a text as it wants it, UTF-16 or UTF-8, and makes and destroys its result: facade is
/// `SetSQL`, `ParseSQL`, `GetSQLTree`; analyse is `BuildQueryInfo`; prepare is sqlite3_prepare_v3() against
/// tables that have the columns which the queries name; pg_raw is libpg_query's parser with nothing behind
/// it, pg_protobuf with the tree as a protobuf message. Without a folder (DIALECT.jsonl in it) the plain
/// queries are taken.

#include <sqlite3.h>
#include <zrparsersql/analysis.h>
#include <zrparsersql/query_info.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <functional>
#include <limits>
#include <string>
#include <vector>

#include "bench/dialects.h"
#include "bench/matching_schema.h"
#include "bench/timing.h"

#ifdef ZR_WITH_PG_QUERY
#include <pg_query.h>

// Exported, but declared only in a header that wants those of a PostgreSQL server.
extern "C" {
struct PgQueryRawTree {
    void* tree;
    char* stderr_buffer;
    PgQueryError* error;
};
void* pg_query_enter_memory_context();
void pg_query_exit_memory_context(void* context);
PgQueryRawTree pg_query_raw_parse(const char* text);
void pg_query_free_error(PgQueryError* error);
}
#endif

namespace {

using zr::bench::Dialect;
using zr::bench::MatchingSchema;
using zr::bench::median;
using zr::bench::Query;

/// A text in both its forms.
struct Text {
    Query query;
    std::string utf8;
};

/// One of those that are compared. What it says against a text is empty where it reads it.
struct Reader {
    const char* name;
    std::function<std::string(Text&)> refusal;
    std::function<void(Text&)> run;
};

std::string refusalOfOurs(Text& text) {
    return text.query.isReadToEnd ? "" : "not read to its end";
}

#ifdef ZR_WITH_PG_QUERY
std::string refusalOfPostgres(Text& text) {
    const PgQueryProtobufParseResult result = pg_query_parse_protobuf(text.utf8.c_str());
    const std::string message = result.error ? result.error->message : "";
    pg_query_free_protobuf_parse_result(result);
    return message;
}

void parseRaw(Text& text) {
    void* const context = pg_query_enter_memory_context();
    const PgQueryRawTree result = pg_query_raw_parse(text.utf8.c_str());
    std::free(result.stderr_buffer);
    if (result.error) pg_query_free_error(result.error);
    pg_query_exit_memory_context(context);
}
#endif

std::vector<Reader> readersOf(const Dialect& dialect, MatchingSchema& schema) {
    std::vector<Reader> readers;
    readers.push_back({"facade", refusalOfOurs, [&dialect](Text& text) { dialect.facade(text.query.text); }});
    readers.push_back({"analyse", refusalOfOurs, [&dialect](Text& text) {
                           CZRQueryInfo query;
                           query.SetSQL(text.query.text);
                           BuildQueryInfo(&query, dialect.kind);
                       }});
    readers.push_back({"prepare", [&schema](Text& text) { return schema.refusal(text.utf8); },
                       [&schema](Text& text) {
                           sqlite3_stmt* statement = nullptr;
                           sqlite3_prepare_v3(schema.database(), text.utf8.c_str(), -1, 0, &statement,
                                              nullptr);
                           sqlite3_finalize(statement);
                       }});
#ifdef ZR_WITH_PG_QUERY
    readers.push_back({"pg_raw", refusalOfPostgres, parseRaw});
    readers.push_back({"pg_protobuf", refusalOfPostgres, [](Text& text) {
                           pg_query_free_protobuf_parse_result(pg_query_parse_protobuf(text.utf8.c_str()));
                       }});
#endif
    return readers;
}

/// Seconds a run; not a number where a text is not read.
struct Time {
    double least = std::numeric_limits<double>::quiet_NaN();
    double middle = std::numeric_limits<double>::quiet_NaN();
};

/// Shorter turns would measure the clock, longer ones would let the machine's other work fall on one reader.
constexpr int kRunsATurn = 16;

std::vector<Time> measure(const std::vector<Reader>& readers, Text& text, int rounds) {
    std::vector<std::vector<double>> turns(readers.size());
    std::vector<bool> reads;
    reads.reserve(readers.size());
    for (const Reader& reader : readers) reads.push_back(reader.refusal(text).empty());
    for (int round = 0; round < rounds; ++round) {
        for (std::size_t i = 0; i < readers.size(); ++i) {
            if (!reads[i]) continue;
            turns[i].push_back(zr::bench::secondsOf([&] {
                                   for (int run = 0; run < kRunsATurn; ++run) readers[i].run(text);
                               }) /
                               kRunsATurn);
        }
    }
    std::vector<Time> times(readers.size());
    for (std::size_t i = 0; i < readers.size(); ++i) {
        if (turns[i].empty()) continue;
        times[i].least = *std::min_element(turns[i].begin(), turns[i].end());
        times[i].middle = median(turns[i]);
    }
    return times;
}

/// What one reader takes, as a multiple of what the other one takes, and the most that this should be.
struct Bar {
    const char* reader;
    const char* other;
    double most;
};

constexpr Bar kBars[] = {
    {"facade", "prepare", 1.5},
    {"facade", "pg_raw", 8.0},
    {"facade", "pg_protobuf", 1.0},
    {"analyse", "prepare", 4.0},
};

/// The most nanoseconds that a token should take.
constexpr struct {
    const char* reader;
    double most;
} kTokenBars[] = {{"facade", 400}, {"analyse", 1000}};

std::size_t indexOf(const std::vector<Reader>& readers, const std::string& name) {
    const auto at = std::find_if(readers.begin(), readers.end(),
                                 [&](const Reader& reader) { return name == reader.name; });
    return static_cast<std::size_t>(at - readers.begin());
}

const char* verdict(double value, double most) {
    return value <= most ? "met" : "missed";
}

/// A line for each text that somebody can't read, since figures over different texts don't compare.
void tellRefusals(const std::vector<Reader>& readers, std::vector<Text>& texts) {
    for (Text& text : texts)
        for (const Reader& reader : readers)
            if (const std::string why = reader.refusal(text); !why.empty())
                std::printf("  skipped by %s (%s): %s\n", reader.name, why.c_str(), text.utf8.c_str());
}

/// A line a reader over the texts that it reads, then the bars over those that both sides read.
void tell(const std::vector<Reader>& readers, const std::vector<Text>& texts,
          const std::vector<std::vector<Time>>& times, bool isEachTold) {
    std::printf("  %-12s %7s %7s %10s %10s %10s %10s\n", "", "queries", "skipped", "ns/query", "(median)",
                "ns/token", "(median)");
    for (std::size_t i = 0; i < readers.size(); ++i) {
        std::vector<double> least, middle, leastToken, middleToken;
        for (std::size_t k = 0; k < texts.size(); ++k) {
            if (times[k][i].least != times[k][i].least) continue;
            least.push_back(times[k][i].least * 1e9);
            middle.push_back(times[k][i].middle * 1e9);
            leastToken.push_back(least.back() / texts[k].query.tokens);
            middleToken.push_back(middle.back() / texts[k].query.tokens);
        }
        std::printf("  %-12s %7zu %7zu %10.0f %10.0f %10.0f %10.0f\n", readers[i].name, least.size(),
                    texts.size() - least.size(), median(least), median(middle), median(leastToken),
                    median(middleToken));
        for (const auto& bar : kTokenBars)
            if (!least.empty() && std::string(bar.reader) == readers[i].name)
                std::printf("  %-12s at most %.0f ns/token: %s\n", "", bar.most,
                            verdict(median(leastToken), bar.most));
    }
    for (const Bar& bar : kBars) {
        const std::size_t one = indexOf(readers, bar.reader), other = indexOf(readers, bar.other);
        if (other == readers.size()) continue;
        std::vector<double> ratios;
        for (const auto& ofText : times)
            if (const double ratio = ofText[one].least / ofText[other].least; ratio == ratio)
                ratios.push_back(ratio);
        if (ratios.empty()) continue;
        std::printf("  %s / %s: %.2f, from %.2f to %.2f, at most %.1f: %s\n", bar.reader, bar.other,
                    median(ratios), *std::min_element(ratios.begin(), ratios.end()),
                    *std::max_element(ratios.begin(), ratios.end()), bar.most,
                    verdict(median(ratios), bar.most));
    }
    if (!isEachTold) return;
    for (std::size_t k = 0; k < texts.size(); ++k) {
        std::printf("  %4u tokens:", texts[k].query.tokens);
        for (std::size_t i = 0; i < readers.size(); ++i)
            std::printf(" %s %.0f", readers[i].name, times[k][i].least * 1e9);
        std::printf(" ns: %s\n", texts[k].utf8.c_str());
    }
}

}  // namespace

int main(int argc, char** argv) {
    int rounds = 100;
    bool isEachTold = false;
    std::string only, folder;
    for (int i = 1; i < argc; ++i) {
        const std::string word = argv[i];
        if (word == "--rounds" && i + 1 < argc)
            rounds = std::max(1, std::atoi(argv[++i]));
        else if (word == "--dialect" && i + 1 < argc)
            only = argv[++i];
        else if (word == "--queries")
            isEachTold = true;
        else
            folder = word;
    }
    std::printf("SQLite %s", sqlite3_libversion());
#ifdef ZR_WITH_PG_QUERY
    std::printf(", libpg_query of PostgreSQL %s\n", PG_VERSION);
#else
    std::printf("; built without libpg_query\n");
#endif
    std::printf("Least of %d turns of %d runs each; medians and ratios over the queries.\n", rounds,
                kRunsATurn);
    for (const Dialect& dialect : zr::bench::dialects()) {
        if (!only.empty() && only != dialect.name) continue;
        std::vector<Text> texts;
        MatchingSchema schema;
        for (Query& query : zr::bench::readQueries(dialect, folder)) {
            std::string utf8 = query.text.toUtf8();
            schema.addFor(utf8);
            texts.push_back({std::move(query), std::move(utf8)});
        }
        const std::vector<Reader> readers = readersOf(dialect, schema);
        std::vector<std::vector<Time>> times;
        times.reserve(texts.size());
        for (Text& text : texts) times.push_back(measure(readers, text, rounds));
        std::printf("%s\n", dialect.name);
        if (folder.empty() || isEachTold) tellRefusals(readers, texts);
        tell(readers, texts, times, isEachTold);
    }
    return 0;
}
