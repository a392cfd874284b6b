// A facade's tree stands on nodes of the engine's own; whoever holds a context gets the runtime's. Both are
// the same tree, node by node, with the same reports on the way.

#include <gtest/gtest.h>
#include <zrparsersql/diagnostics.h>
#include <zrparsersql/recognizers/MSAccessSQL_v3.h>
#include <zrparsersql/recognizers/MSSQL.h>
#include <zrparsersql/recognizers/MSSQLfrom.h>
#include <zrparsersql/recognizers/MySQLSelect.h>
#include <zrparsersql/recognizers/Oracle.h>
#include <zrparsersql/recognizers/PostgreSQL.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <memory>
#include <string>
#include <vector>

#include "grammar/engine/syntax_tree.h"
#include "tests/engine/sentence_source.h"
#include "tests/grammar/contexts.h"
#include "tests/grammar/corpus_file.h"
#include "tests/grammar/json_string.h"
#include "tests/grammar/reading.h"
#include "zrparsersql/sql_parsers.h"

namespace zr::test {
namespace {

using engine::SyntaxNode;
using engine::SyntaxTree;

/// What came of comparing, so that a test can tell that it compared anything.
struct Counts {
    int texts = 0, errors = 0, lists = 0;
};

struct Pair {
    pANTLR3_BASE_TREE runtime;
    SyntaxNode own;
    CZRSQLTree* view;  // null where the grammar has no facade
};

void compareToken(const SyntaxTree& tree, const Pair& at) {
    const pANTLR3_COMMON_TOKEN token = at.runtime->getToken(at.runtime);
    const bool isOfText =
        token != nullptr && token->type != ANTLR3_TOKEN_EOF && token->start != 0 && token->input != nullptr;
    ASSERT_EQ(tree.isToken(at.own), isOfText);
    if (!isOfText) return;
    EXPECT_EQ(tree.tokenOf(at.own), static_cast<std::uint32_t>(token->index));
    const engine::LexedToken& own = tree.text().token(tree.tokenOf(at.own));
    EXPECT_EQ(tree.text().text().data() + own.from, reinterpret_cast<const char16_t*>(token->start));
    EXPECT_EQ(tree.text().text().data() + own.to, reinterpret_cast<const char16_t*>(token->stop) + 1);
}

void compareNode(const SyntaxTree& tree, const Pair& at, Counts& counts) {
    const bool isList = at.runtime->isNilNode(at.runtime) != 0;
    const std::uint32_t type = isList ? 0 : at.runtime->getType(at.runtime);
    EXPECT_EQ(tree.type(at.own), type);
    const std::u16string text = textOf(at.runtime);
    EXPECT_EQ(tree.isToken(at.own) ? CString(tree.tokenText(at.own)) : CString(tree.name(at.own)),
              CString(text));
    compareToken(tree, at);
    const auto& common = *static_cast<pANTLR3_COMMON_TREE>(at.runtime->super);
    EXPECT_EQ(static_cast<ANTLR3_MARKER>(tree.span(at.own).first), common.startIndex);
    EXPECT_EQ(static_cast<ANTLR3_MARKER>(tree.span(at.own).last), common.stopIndex);
    EXPECT_EQ(tree.childCount(at.own), at.runtime->getChildCount(at.runtime));
    counts.lists += isList;
    counts.errors += type == 0 && !isList;
    if (at.view == nullptr) return;
    EXPECT_EQ(at.view->GetType(), type);
    EXPECT_EQ(at.view->GetText(), CString(text));
    EXPECT_EQ(at.view->GetChildCount(), tree.childCount(at.own));
}

void compareTrees(pANTLR3_BASE_TREE runtime, const SyntaxTree& tree, CZRSQLTree* view, Counts& counts) {
    std::size_t nodes = 0;
    std::vector<Pair> open{{runtime, SyntaxTree::root(), view}};
    while (!open.empty() && !testing::Test::HasFailure()) {
        const Pair at = open.back();
        open.pop_back();
        ++nodes;
        compareNode(tree, at, counts);
        for (std::uint32_t i = 0; i < tree.childCount(at.own) && !testing::Test::HasFailure(); ++i)
            open.push_back({static_cast<pANTLR3_BASE_TREE>(at.runtime->getChild(at.runtime, i)),
                            tree.firstChild(at.own) + i, at.view ? at.view->GetChild(i) : nullptr});
    }
    EXPECT_EQ(tree.nodeCount(), nodes);
}

using Reports = std::vector<std::u16string>;

void keep(void* user, const char16_t* text, std::uint32_t length) {
    static_cast<Reports*>(user)->emplace_back(text, length);
}

/// What is reported while something is done.
template <class Action>
Reports reportsOf(Action action) {
    Reports reports;
    zrSetDiagnosticFunction(&keep, &reports);
    action();
    zrSetDiagnosticFunction(nullptr, nullptr);
    return reports;
}

struct NoFacade {};

template <class Contexts, class Facade>
void compareText(const engine::GrammarTable& tables, const std::u16string& sql, Counts& counts) {
    SCOPED_TRACE(quoteJson(sql));
    ++counts.texts;
    CString text(sql);
    std::unique_ptr<Contexts> contexts;
    pANTLR3_BASE_TREE runtime = nullptr;
    const Reports reports = reportsOf([&] {
        contexts = std::make_unique<Contexts>(text.View());
        runtime = contexts->start();
    });
    std::unique_ptr<SyntaxTree> tree;
    EXPECT_EQ(reportsOf([&] { tree = std::make_unique<SyntaxTree>(tables, text.View()); }), reports);
    if constexpr (std::is_same_v<Facade, NoFacade>) {
        compareTrees(runtime, *tree, nullptr, counts);
    } else {
        Facade facade;
        facade.SetSQL(text);
        facade.ParseSQL();
        CZRSQLTree* root = nullptr;
        facade.GetSQLTree(&root);
        const std::unique_ptr<CZRSQLTree> view(root);
        compareTrees(runtime, *tree, root, counts);
    }
}

struct Road {
    std::string_view corpus;
    void (*compare)(const engine::GrammarTable& tables, const std::u16string& sql, Counts& counts);
};

#define ZR_ROAD(NAME, CORPUS, FACADE)                                             \
    Road {                                                                        \
        CORPUS, &compareText<ContextsOf<NAME##LexerNew, NAME##ParserNew>, FACADE> \
    }

const Road kRoads[] = {
    ZR_ROAD(MSAccessSQL_v3, "msaccess", CZRMSAccessSQL_v3Parcer),
    ZR_ROAD(MSSQL, "mssql", CZRMSSQLParser),
    ZR_ROAD(MSSQLfrom, "mssqlfrom", NoFacade),
    ZR_ROAD(MySQLSelect, "mysql", CZRMySQLParcer),
    ZR_ROAD(Oracle, "oracle", CZROracleParser),
    ZR_ROAD(PostgreSQL, "postgresql", CZRPostgreParser),
};

class SameTree : public testing::TestWithParam<Road> {
 protected:
    const Grammar& grammar() const {
        return *std::find_if(kGrammars, kGrammars + kGrammarCount,
                             [](const Grammar& grammar) { return grammar.corpus == GetParam().corpus; });
    }
    void compare(const std::u16string& sql) { GetParam().compare(grammar().tables(), sql, counts); }

    Counts counts;
};

TEST_P(SameTree, OnTheCorpusAndItsPrefixes) {
    for (const CorpusFile& file : readCorpus(std::filesystem::path(ZR_CORPUS_DIR) / grammar().corpus))
        for (const CorpusCase& one : file.cases) {
            const std::u16string text = one.text();
            compare(text);
            compare(text.substr(0, text.size() / 2));
            compare(text.substr(text.size() / 2));
            if (HasFailure()) return;
        }
    EXPECT_GT(counts.texts, 300);
    EXPECT_GT(counts.errors, 50);
    if (grammar().tables().parser->keepTail) {
        EXPECT_GT(counts.lists, 100);
    }
}

TEST_P(SameTree, OnRealQueries) {
    const auto path = std::filesystem::path(ZR_REAL_QUERIES) / (std::string(grammar().corpus) + ".jsonl");
    std::ifstream in(path);
    if (!in) GTEST_SKIP() << path << " is not here";
    for (std::string line; std::getline(in, line) && !HasFailure();) {
        const std::size_t at = line.find("\"sql\": ");
        ASSERT_NE(at, std::string::npos) << line;
        std::string_view rest = std::string_view(line).substr(at + 7);
        compare(readJsonString(rest));
    }
    EXPECT_GT(counts.texts, 500);
}

TEST_P(SameTree, OnRandomSentencesAndSpoiltOnes) {
    const engine::GrammarTable& tables = grammar().tables();
    SentenceSource source(tables, 17);
    for (int i = 0; i < 500 && !HasFailure(); ++i) {
        std::vector<std::uint16_t> tokens =
            source.sentence(tables.parser->statementRule, 4 + source.number(60));
        compare(source.text(tokens));
        source.spoil(tokens);
        compare(source.text(tokens));
    }
    EXPECT_EQ(counts.texts, 1000);
}

TEST_P(SameTree, OnTextsThatNoGrammarKnows) {
    for (const std::u16string_view text :
         {u"", u" ", u"\n\n", u";", u"hello", u"\nhello \u00e4", u"SELECT", u"SELECT\n,\nFROM t", u"\xd800",
          u"SELECT 'a\u00e9 b' FROM t \u65e5 tail\n\n", u"SELECT FROM t ;\n"})
        compare(std::u16string(text));
    EXPECT_GT(counts.errors, 3);
}

TEST_P(SameTree, MoreTokensThanAllowedAreAnErrorNode) {
    const std::u16string_view text = u"SELECT a FROM t";
    engine::Options options;
    options.maxTokens = engine::LexedText(*grammar().tables().lexer, text).seenCount();
    const SyntaxTree within(grammar().tables(), text, options);
    --options.maxTokens;
    const SyntaxTree beyond(grammar().tables(), text, options);
    EXPECT_STREQ(beyond.name(SyntaxTree::root()), "Tree Error Node");
    EXPECT_EQ(beyond.type(SyntaxTree::root()), 0u);
    EXPECT_EQ(beyond.nodeCount(), 1u);
    const SyntaxTree unbounded(grammar().tables(), text);
    EXPECT_EQ(within.nodeCount(), unbounded.nodeCount());
}

// A node tells the tokens that its rule took: a root made in one those of all its operands and what stood
// around them, such as parentheses that were dropped.

std::string spansBelow(const SyntaxTree& tree, SyntaxNode node) {
    std::string text;
    if (tree.isToken(node))
        for (const char16_t unit : tree.tokenText(node)) text += static_cast<char>(unit);
    else
        text = tree.name(node);
    const SyntaxTree::Span span = tree.span(node);
    if (span.last != 0) text += " " + std::to_string(span.first) + "-" + std::to_string(span.last);
    for (std::uint32_t i = 0; i < tree.childCount(node); ++i)
        text += (i == 0 ? " (" : ", ") + spansBelow(tree, tree.firstChild(node) + i);
    return tree.childCount(node) == 0 ? text : text + ")";
}

std::string spansOf(std::string_view corpus, std::u16string_view text) {
    const auto* grammar = std::find_if(kGrammars, kGrammars + kGrammarCount,
                                       [corpus](const Grammar& each) { return each.corpus == corpus; });
    const SyntaxTree tree(grammar->tables(), text);
    return spansBelow(tree, SyntaxTree::root());
}

TEST(Spans, AreThoseOfTheRulesThatANodeCameFrom) {
    EXPECT_EQ(spansOf("mssql", u"SELECT a.b,(1+c) FROM t WHERE x IS NULL"),
              "SELECT_QUERY_ 0-15 (SELECT_LIST 1-9 (COLUMN_SPECIFICATION 1-3 (TABLE_NAME 1-1 (a 1-1), "
              "COLUMN_NAME 3-3 "
              "(b 3-3)), + 5-9 (SQL_LITERAL 6-6 (NUMBER_LITERAL 6-6 (1 6-6)), COLUMN_SPECIFICATION 8-8 "
              "(COLUMN_NAME "
              "8-8 (c 8-8)))), FROM_DEF_ 10-11 (TABLE_SPECIFICATION 11-11 (TABLE_NAME 11-11 (t 11-11))), "
              "WHERE_CONDITION 12-15 (SEARCH_CONDITION 12-15 (IS 13-15 (COLUMN_SPECIFICATION 13-13 "
              "(COLUMN_NAME 13-13 "
              "(x 13-13)), SQL_LITERAL 15-15 (NUMBER_LITERAL 15-15 (NULL 15-15))))))");
}

TEST(Spans, CountTokensThatTheParserDoesNotSee) {
    EXPECT_EQ(
        spansOf("msaccess", u"SELECT a.b FROM t WHERE x > (1)"),
        "nil 0-18 (SELECT_QUERY 0-18 (SELECT_LIST 2-4 (COLUMN_SPECIFICATION 2-4 (TABLE_NAME 2-2 (a 2-2), "
        "COLUMN_NAME 4-4 (b 4-4))), FROM_DEF_ 6-8 (TABLE_SPECIFICATION 8-8 (TABLE_NAME 8-8 (t 8-8))), "
        "WHERE_CONDITION 10-18 (SEARCH_CONDITION 10-18 (> 12-18 (COLUMN_SPECIFICATION 12-12 (COLUMN_NAME "
        "12-12 (x 12-12)), ( 16-18 (SQL_LITERAL 17-17 (NUMBER_LITERAL 17-17 (1 17-17)), )))))), <EOF>)");
}

INSTANTIATE_TEST_SUITE_P(Grammars, SameTree, testing::ValuesIn(kRoads),
                         [](const auto& road) { return std::string(road.param.corpus); });

}  // namespace
}  // namespace zr::test
