// The recognisers as hosts in C call them, with each allocation of this library failing in turn. What the
// runtime allocates by itself is another matter: docs/limits.md.
#include <gtest/gtest.h>
#include <zrparsersql/diagnostics.h>
#include <zrparsersql/input_stream.h>
#include <zrparsersql/recognizers/MSAccessSQL_v3.h>
#include <zrparsersql/recognizers/MSSQL.h>
#include <zrparsersql/recognizers/MSSQLfrom.h>
#include <zrparsersql/recognizers/MySQLSelect.h>
#include <zrparsersql/recognizers/Oracle.h>
#include <zrparsersql/recognizers/PostgreSQL.h>

#include <string>
#include <string_view>
#include <vector>

#include "tests/faults/failing_heap.h"

namespace zr::faults {
namespace {

/// Type numbers of a tree in preorder: what a reading comes to.
std::string outline(pANTLR3_BASE_TREE root) {
    std::string text;
    std::vector<pANTLR3_BASE_TREE> open{root};
    while (!open.empty()) {
        const pANTLR3_BASE_TREE node = open.back();
        open.pop_back();
        text += std::to_string(node->getType(node)) + ' ';
        for (ANTLR3_UINT32 i = node->getChildCount(node); i-- > 0;)
            open.push_back(static_cast<pANTLR3_BASE_TREE>(node->getChild(node, i)));
    }
    return text;
}

/// Sets the contexts up, runs the start rule and takes all down, with a failure from `successes` on. Gives
/// the outline of the tree, nothing where there is none.
template <auto NewLexer, auto NewParser>
std::string read(std::u16string_view text, long successes, Failure::Lasts lasts, bool& happened) {
    std::string outcome;
    const pANTLR3_INPUT_STREAM input =
        zrNewUtf16InPlaceStream(text.data(), static_cast<std::uint32_t>(text.size()));
    {
        const Failure failing(successes, lasts);
        if (auto* const lexer = NewLexer(input)) {
            if (const pANTLR3_COMMON_TOKEN_STREAM tokens =
                    antlr3CommonTokenStreamSourceNew(1025, lexer->pLexer->rec->state->tokSource)) {
                if (auto* const parser = NewParser(tokens)) {
                    if (const pANTLR3_BASE_TREE tree = parser->start_rule(parser).tree) {
                        const Pause pause;  // whoever reads the tree has memory again
                        outcome = outline(tree);
                    }
                    parser->free(parser);
                }
                tokens->free(tokens);
            }
            lexer->free(lexer);
        }
        happened = failing.happened();
    }
    input->close(input);
    return outcome;
}

struct Grammar {
    const char* name;
    std::string (*read)(std::u16string_view text, long successes, Failure::Lasts lasts, bool& happened);
    const char16_t* text;
};

const Grammar kGrammars[] = {
    {"Mssql", &read<MSSQLLexerNew, MSSQLParserNew>,
     u"SELECT TOP 5 a AS x, t.b + 'c d', dbo.g(1) FROM t INNER JOIN u ON t.h = u.i WHERE j IN (SELECT k FROM "
     u"v)"},
    {"MssqlRecovered", &read<MSSQLLexerNew, MSSQLParserNew>, u"SELECT TOP (1)) a ("},
    {"Mssqlfrom", &read<MSSQLfromLexerNew, MSSQLfromParserNew>, u"t INNER JOIN u ON t.h = u.i"},
    {"Mysql", &read<MySQLSelectLexerNew, MySQLSelectParserNew>,
     u"SELECT DISTINCT a AS x, ABS(c) FROM t AS y WHERE j IN (SELECT k FROM v) ORDER BY a DESC LIMIT 5"},
    {"Oracle", &read<OracleLexerNew, OracleParserNew>,
     u"SELECT a AS x, t.b || c, UPPER(d) FROM t, (SELECT e FROM f) s WHERE t.g = s.e ORDER BY a"},
    {"Postgresql", &read<PostgreSQLLexerNew, PostgreSQLParserNew>,
     u"SELECT a AS x, t.b + 1 AS y FROM s.t AS t WHERE j IN (SELECT k FROM v) ORDER BY a LIMIT 5 ; tail"},
    {"Msaccess", &read<MSAccessSQL_v3LexerNew, MSAccessSQL_v3ParserNew>,
     u"SELECT [t].[a] AS x, Left(b, 2) AS y FROM t WHERE (((j) In (SELECT k FROM v))) ORDER BY a DESC"},
};

class ExhaustedContexts : public testing::TestWithParam<Grammar> {};

// Whoever listens is told what there is memory to tell.
TEST_P(ExhaustedContexts, LoseAReportRatherThanThrow) {
    std::size_t reports = 0;
    zrSetDiagnosticFunction(
        [](void* count, const char16_t*, std::uint32_t) { ++*static_cast<std::size_t*>(count); }, &reports);
    const std::u16string text = u"= \xD800 " + std::u16string(GetParam().text);
    failEach([&](long successes) {
        bool failed = false;
        GetParam().read(text, successes, Failure::Lasts::ToTheEnd, failed);
        return failed;
    });
    zrSetDiagnosticFunction(nullptr, nullptr);
    EXPECT_GT(reports, 0U);
}

TEST(ExhaustedLexer, MatchesNoSingleRuleWithoutMemory) {
    const std::u16string_view text = u"SELECT";
    failEach([&](long successes) {
        const pANTLR3_INPUT_STREAM input =
            zrNewUtf16InPlaceStream(text.data(), static_cast<std::uint32_t>(text.size()));
        const pMSSQLLexer lexer = MSSQLLexerNew(input);
        bool happened = false;
        {
            const Failure failing(successes);
            lexer->mSELECT_KEYWORD(lexer);
            happened = failing.happened();
        }
        EXPECT_EQ(lexer->pLexer->rec->state->error == ANTLR3_TRUE, happened) << successes;
        lexer->free(lexer);
        input->close(input);
        return happened && !testing::Test::HasFailure();
    });
}

// No tree or the right one: never one with a part missing.
TEST_P(ExhaustedContexts, HaveTheWholeTreeOrNone) {
    const Grammar& grammar = GetParam();
    bool happened = false;
    const std::string whole = grammar.read(grammar.text, 1L << 40, Failure::Lasts::Once, happened);
    EXPECT_FALSE(happened);
    EXPECT_FALSE(whole.empty());
    for (const Failure::Lasts lasts : {Failure::Lasts::Once, Failure::Lasts::ToTheEnd}) {
        const long allocations = failEach([&](long successes) {
            bool failed = false;
            const std::string outcome = grammar.read(grammar.text, successes, lasts, failed);
            EXPECT_TRUE(outcome == whole || (failed && outcome.empty())) << successes << ": " << outcome;
            return failed && !testing::Test::HasFailure();
        });
        EXPECT_GT(allocations, 5);
    }
}

INSTANTIATE_TEST_SUITE_P(Grammars, ExhaustedContexts, testing::ValuesIn(kGrammars),
                         [](const auto& grammar) { return std::string(grammar.param.name); });

}  // namespace
}  // namespace zr::faults
