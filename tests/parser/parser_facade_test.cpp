#include <gtest/gtest.h>

#include <type_traits>

#include "tests/parser/parsed.h"
#include "tests/parser/tree_text.h"

namespace {

constexpr const char* kSelectA =
    "(7 \"SELECT_QUERY_\" (10 \"SELECT_LIST\" (11 \"COLUMN_SPECIFICATION\" (16 \"COLUMN_NAME\" (249 "
    "\"a\")))))";

template <class Facade>
class EveryFacade : public testing::Test {};
using Facades = testing::Types<CZROracleParser, CZRMSSQLParser, CZRMySQLParcer, CZRPostgreParser,
                               CZRMSAccessSQL_v3Parcer>;
TYPED_TEST_SUITE(EveryFacade, Facades);

void expectNoNode(CZRSQLTree* view) {
    ASSERT_NE(view, nullptr);
    EXPECT_EQ(view->GetChildCount(), 0u);
    EXPECT_EQ(view->GetText(), u" ");
    EXPECT_EQ(view->GetType(), 0u);
}

TYPED_TEST(EveryFacade, ParseWithoutTextDoesNothing) {
    TypeParam facade;
    facade.ParseSQL();
    CZRSQLTree* tree = nullptr;
    facade.GetSQLTree(&tree);
    expectNoNode(tree);
    delete tree;
}

TYPED_TEST(EveryFacade, HasTheViewOverNoNodeAheadOfTheFirstParse) {
    CString text = u"SELECT a";
    TypeParam facade;
    facade.SetSQL(text);
    CZRSQLTree* tree = nullptr;
    facade.GetSQLTree(&tree);
    expectNoNode(tree);
    delete tree;
}

TYPED_TEST(EveryFacade, TakesAnyTextWithoutThrowing) {
    for (CString text :
         {CString(u""), CString(u"SELECT"), CString(u"\0\xd800\xdfff'[\"", 6), CString(u"x")}) {
        TypeParam facade;
        EXPECT_NO_THROW({
            facade.SetSQL(text);
            facade.ParseSQL();
            CZRSQLTree* tree = nullptr;
            facade.GetSQLTree(&tree);
            ASSERT_NE(tree, nullptr);
            EXPECT_EQ(tree->GetChild(tree->GetChildCount())->GetText(), u" ");
            delete tree;
        });
    }
}

TYPED_TEST(EveryFacade, IsAParserThatIsNotCopied) {
    static_assert(std::is_base_of_v<CZRSQLParser, TypeParam>);
    static_assert(!std::is_copy_constructible_v<TypeParam>);
    static_assert(std::has_virtual_destructor_v<TypeParam>);
    // Deleted through the base, as hosts do.
    CZRSQLParser* parser = new TypeParam;
    EXPECT_NO_THROW(parser->ParseSQL());
    delete parser;
}

TEST(MssqlFacade, GivesTheTreeOfTheQuery) {
    EXPECT_EQ(treeText(*ParsedMssql(u"SELECT a").tree), kSelectA);
}

TEST(MssqlFacade, EmptyTextGivesAnErrorNodeAndNoSelect) {
    const ParsedMssql parsed(u"");
    EXPECT_EQ(treeText(*parsed.tree), "(0 \"Tree Error Node\")");
    EXPECT_EQ(findNode(*parsed.tree, 7), nullptr);
}

TEST(MssqlFacade, TwoTreesOfOneParseAreIndependentViews) {
    ParsedMssql parsed(u"SELECT a");
    std::unique_ptr<CZRSQLTree> second = parsed.newTree();
    EXPECT_NE(second.get(), parsed.tree.get());
    EXPECT_EQ(treeText(*parsed.tree), kSelectA);
    parsed.tree.reset();
    EXPECT_EQ(treeText(*second), kSelectA);
}

TEST(MssqlFacade, TokensBehindACompleteQueryAreNoError) {
    EXPECT_EQ(treeText(*ParsedMssql(u"SELECT a ) garbage 1 2 3").tree), kSelectA);
}

TEST(MssqlFacade, ASecondParseGivesTheSameTreeAndLeavesTheFirstAlone) {
    ParsedMssql parsed(u"SELECT a");
    parsed.facade.ParseSQL();
    const std::unique_ptr<CZRSQLTree> second = parsed.newTree();
    EXPECT_EQ(treeText(*second), kSelectA);
    EXPECT_EQ(treeText(*parsed.tree), kSelectA);
}

TEST(MssqlFacade, ASecondTextReplacesTheFirst) {
    ParsedMssql parsed(u"SELECT b");
    CString text = u"SELECT a";
    parsed.facade.SetSQL(text);
    // The tree stays that of the last parse until the next one.
    const std::unique_ptr<CZRSQLTree> before = parsed.newTree();
    EXPECT_NE(treeText(*before).find("\"b\""), std::string::npos);
    parsed.facade.ParseSQL();
    const std::unique_ptr<CZRSQLTree> behind = parsed.newTree();
    EXPECT_EQ(treeText(*behind), kSelectA);
    EXPECT_NE(treeText(*parsed.tree).find("\"b\""), std::string::npos);
}

TEST(MssqlFacade, ATextThatIsNeverParsedIsDropped) {
    CString first = u"SELECT b", second = u"SELECT a";
    CZRMSSQLParser facade;
    facade.SetSQL(first);
    facade.SetSQL(second);
    facade.ParseSQL();
    CZRSQLTree* root = nullptr;
    facade.GetSQLTree(&root);
    const std::unique_ptr<CZRSQLTree> tree(root);
    EXPECT_EQ(treeText(*tree), kSelectA);
}

TEST(MssqlFacade, ReadsTheTextInPlace) {
    ParsedMssql parsed(u"SELECT a");
    // Only to show whose buffer the tokens stand in: a host keeps its hands off.
    const_cast<char16_t*>(parsed.text.GetString())[7] = u'b';
    EXPECT_NE(treeText(*parsed.tree).find("\"b\""), std::string::npos);
}

TEST(MssqlFacade, TheFromTreeStandsOverNoNode) {
    ParsedMssql parsed(u"SELECT a FROM t");
    CZRSQLTree* tree = nullptr;
    parsed.facade.GetSQLFromTree(&tree);
    expectNoNode(tree);
    delete tree;
}

TEST(MssqlFacade, FacadesDoNotShareState) {
    const ParsedMssql first(u"SELECT a"), second(u"SELECT b");
    EXPECT_EQ(treeText(*first.tree), kSelectA);
    EXPECT_NE(treeText(*second.tree), kSelectA);
}

// The tree of an MS Access text is a list of the query and whatever stands behind it.
TEST(MsAccessFacade, TheRootViewIsAListThatEndsWithTheEndOfTheText) {
    const ParsedMsAccess parsed(u"SELECT [a b], 'c' FROM t ORDER BY d tail");
    EXPECT_EQ(parsed.tree->GetText(), u"nil");
    EXPECT_EQ(parsed.tree->GetType(), 0u);
    ASSERT_EQ(parsed.tree->GetChildCount(), 3u);
    EXPECT_EQ(parsed.tree->GetChild(0)->GetText(), u"SELECT_QUERY");
    EXPECT_EQ(parsed.tree->GetChild(1)->GetText(), u"tail");
    EXPECT_EQ(parsed.tree->GetChild(2)->GetText(), u"<EOF>");
}

TEST(MsAccessFacade, NamesAndStringsComeWithoutTheirDelimiters) {
    const ParsedMsAccess parsed(u"SELECT [a b], 'c', \"\" FROM t");
    CZRSQLTree* const list = parsed.tree->GetChild(0)->GetChild(0);
    EXPECT_EQ(list->GetChild(0)->GetChild(0)->GetChild(0)->GetText(), u"a b");
    EXPECT_EQ(list->GetChild(1)->GetChild(0)->GetChild(0)->GetText(), u"c");
    EXPECT_EQ(list->GetChild(2)->GetChild(0)->GetChild(0)->GetText(), u"");
}

TEST(MsAccessFacade, DoesNothingToTheText) {
    const ParsedMsAccess parsed(u"SELECT [a.b] FROM t");
    EXPECT_EQ(parsed.tree->GetChild(0)->GetChild(0)->GetChild(0)->GetChild(0)->GetChild(0)->GetText(),
              u"a.b");
}

}  // namespace
