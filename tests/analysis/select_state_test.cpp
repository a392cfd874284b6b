// Steps of the walk on trees that no text leads to, or that are simpler than a text's.
#include <gtest/gtest.h>
#include <zrparsersql/recognizers/MSSQL_tokens.h>

#include <memory>
#include <set>
#include <string>

#include "analysis/driver.h"
#include "analysis/mssql_state.h"
#include "tests/analysis/analysed.h"
#include "tests/analysis/descriptor_text.h"
#include "tests/analysis/hand_made_tree.h"
#include "tests/parser/small_stack.h"

namespace {

struct Walk {
    TestDatabase database;
    CZRQueryInfo query;
    std::unique_ptr<HandMadeTree> tree;
    MSSQLStateSelectQuery state;
    CList<SelectItem*> items;

    explicit Walk(std::unique_ptr<HandMadeTree> root) : tree(std::move(root)), state(tree.get()) {
        query.SetDatabase(&database);
        state.m_query = &query;
    }
    explicit Walk(std::string_view text) : Walk(HandMadeTree::read(text)) {}
    ~Walk() { query.RetireItems(items); }

    std::string expression(CZRSQLTree* parent = nullptr) {
        state.ProcessExpression(tree.get(), &items, parent);
        state.finish();
        return listText(items);
    }
    std::string selectItem() {
        state.ProcessSelectItem(tree.get(), &items);
        state.finish();
        return listText(items);
    }
    std::string fromItem() {
        state.ProcessFromItem(tree.get(), &items, nullptr);
        state.finish();
        return listText(items);
    }
    std::string literal() {
        state.ProcessLiteral(tree.get(), &items);
        state.finish();
        return listText(items);
    }
};

TEST(SelectState, KnowsItsOperators) {
    const std::set<unsigned int> operators{MSSQL_ALIAS,
                                           MSSQL_AND,
                                           MSSQL_LITERAL_AS,
                                           MSSQL_JOIN_KEYWORD,
                                           MSSQL_ON_KEYWORD,
                                           MSSQL_UNION_KEYWORD_,
                                           MSSQL_AND_KEYWORD,
                                           MSSQL_AND_KEYWORD2,
                                           MSSQL_OR_KEYWORD,
                                           MSSQL_OR_KEYWORD2,
                                           MSSQL_LIKE_KEYWORD,
                                           MSSQL_IS_KEYWORD,
                                           MSSQL_BETWEEN_KEYWORD,
                                           MSSQL_IN_KEYWORD,
                                           MSSQL_COMMA,
                                           MSSQL_ASTERISK,
                                           MSSQL_PLUS,
                                           MSSQL_MINUS,
                                           MSSQL_EQ,
                                           MSSQL_L_T,
                                           MSSQL_GT,
                                           MSSQL_NOT_EQ,
                                           MSSQL_LE,
                                           MSSQL_GE,
                                           MSSQL_LOJ,
                                           MSSQL_GOJ,
                                           MSSQL_DIVIDE,
                                           MSSQL_AMPERSAND};
    ASSERT_EQ(operators.size(), 28u);
    const Walk walk("(7 \"\")");
    for (unsigned int type = 0; type < 1000; ++type) {
        HandMadeTree node(type, u"");
        EXPECT_EQ(walk.state.IsOperator(&node), operators.contains(type)) << type;
    }
    HandMadeTree endOfFile(4294967295u, u"<EOF>");
    EXPECT_FALSE(walk.state.IsOperator(&endOfFile));
}

TEST(SelectState, PassesOverWhatItDoesNotKnow) {
    EXPECT_EQ(Walk("(0 \"Tree Error Node\")").expression(), "");
    EXPECT_EQ(Walk("(0 \"Tree Error Node\")").selectItem(), "");
    EXPECT_EQ(Walk("(0 \"Tree Error Node\")").fromItem(), "");
    EXPECT_EQ(Walk("(999 \"?\" (998 \"?\" (249 \"x\") (249 \"y\")))").expression(), "(0 text=x)");
    EXPECT_EQ(Walk("(15 \"TABLE_NAME\" (249 \"x\"))").selectItem(), "");
}

TEST(SelectState, ANullNodeIsNoWork) {
    Walk walk("(7 \"\")");
    walk.state.ProcessExpression(nullptr, &walk.items, nullptr);
    walk.state.CollectAliases(nullptr);
    walk.state.CollectSubQueries(nullptr);
    walk.state.finish();
    EXPECT_TRUE(walk.items.IsEmpty());
    EXPECT_TRUE(walk.query.m_subQueries.IsEmpty());
}

TEST(SelectState, AnErrorNodeAmongTheClausesIsPassedOver) {
    Walk walk(
        "(7 \"\" (10 \"SELECT_LIST\" (0 \"Tree Error Node\")) (51 \"FROM_DEF_\" (12 \"\" (15 \"\" (249 "
        "\"t\")))))");
    zr::runPasses(walk.state);
    EXPECT_EQ(listText(walk.query.m_selectItems), "");
    EXPECT_EQ(listText(walk.query.m_fromItems), "(5 table=t)");
    EXPECT_EQ(keysOf(walk.query.m_sourceTables), "t");
}

TEST(SelectState, AnOperatorUnderANestedJoinIsMarked) {
    Walk walk("(254 \" =\" (249 \"a\"))");
    HandMadeTree parent(MSSQL_NESTED_JOIN, u"NESTED_JOIN");
    EXPECT_EQ(walk.expression(&parent), "(4 name== op nested type=254 (0 text=a))");
    EXPECT_EQ(Walk("(26 \"NESTED_JOIN\" (254 \"=\"))").expression(), "(4 name== op nested type=254)");
}

TEST(SelectState, APostfixTakesAJoinAsAPartOfItsOwn) {
    EXPECT_EQ(Walk("(24 \"JOIN_POSTFIX\" (21 \"JOIN_DEF\" (12 \"\" (15 \"\" (249 \"t\"))) (94 \"JOIN\")) (12 "
                   "\"\" (15 \"\" (249 \"u\"))))")
                  .expression(),
              "(0 name=  op (5 table=t) (4 name=JOIN op type=94)) (5 table=u)");
}

TEST(SelectState, ParametersEndAtTheFirstClosingParenthesis) {
    EXPECT_EQ(Walk("(254 \"=\" (249 \"a\") (105 \"(\") (106 \")\") (249 \"b\") (106 \")\"))").expression(),
              "(4 name== op type=254 (0 text=a))");
}

TEST(SelectState, ABetweenTakesItsParametersFromTheNodeItself) {
    EXPECT_EQ(
        Walk("(27 \"FUNCTION\" (129 \"BETWEEN\" (249 \"x\")) (28 \"FUNC_PARAM\" (249 \"a\")))").expression(),
        "(4 name=BETWEEN op type=129 (4 name=BETWEEN op type=129 (0 text=x)) (0 text=a))");
}

TEST(SelectState, AFunctionWithoutParametersIsJustItsName) {
    EXPECT_EQ(Walk("(27 \"FUNCTION\" (159 \" GETDATE \"))").expression(), "(4 name=GETDATE  type=159)");
    EXPECT_EQ(Walk("(27 \"FUNCTION\")").expression(), "(4)");
    Walk user("(48 \"USER_FUNCTION\" (249 \"f\"))");
    EXPECT_EQ(user.expression(), "(7 name=f type=249)");
    EXPECT_EQ(*user.database.UserFunctions.Find(u"f"), u"0");
}

TEST(SelectState, AQueryWithoutADatabaseNotesNoFunctions) {
    Walk walk("(48 \"USER_FUNCTION\" (249 \"f\") (28 \"FUNC_PARAM\" (249 \"a\")))");
    walk.query.SetDatabase(nullptr);
    EXPECT_EQ(walk.expression(), "(7 name=f type=249 (0 text=a))");
}

TEST(SelectState, KeywordsOfJoinsAreItems) {
    EXPECT_EQ(Walk("(92 \"INNER\")").expression(), "(1 text=INNER)");
    EXPECT_EQ(Walk("(95 \"LEFT\")").expression(), "(1 text=LEFT)");
    EXPECT_EQ(Walk("(97 \"RIGHT\")").expression(), "(1 text=RIGHT)");
    EXPECT_EQ(Walk("(103 \"CROSS\")").expression(), "(1 text=CROSS)");
    EXPECT_EQ(Walk("(100 \"OUTER\")").expression(), "");
    EXPECT_EQ(Walk("(99 \"FULL\")").expression(), "");
}

TEST(SelectState, TheKeywordStepTakesNumbersAndOtherWordsToo) {
    Walk walk("(7 \"\")");
    const auto number = HandMadeTree::read("(42 \"NUMBER_LITERAL\" (266 \"5\") (266 \"6\"))");
    const auto outer = HandMadeTree::read("(100 \"OUTER\")"), other = HandMadeTree::read("(99 \"FULL\")");
    walk.state.ProcessKeyword(number.get(), &walk.items);
    walk.state.ProcessKeyword(outer.get(), &walk.items);
    walk.state.ProcessKeyword(other.get(), &walk.items);
    EXPECT_EQ(listText(walk.items), "(1 text=5) (1 text=OUTER) (0 text=FULL)");
}

TEST(SelectState, LiteralsOfEveryKind) {
    EXPECT_EQ(Walk("(42 \"\" (133 \"nOt\") (108 \"nUll\"))").literal(), "(1 text=NOT NULL)");
    EXPECT_EQ(Walk("(42 \"\" (133 \"NOT\") (108 \"NULL\") (249 \"x\"))").literal(), "(1 text=NOT NULLx)");
    EXPECT_EQ(Walk("(57 \"\" (251 \"*\"))").literal(), "(1 text=*)");
    EXPECT_EQ(Walk("(43 \"\" (249 \"a\") (249 \"b\"))").literal(), "(3 text=ab)");
    EXPECT_EQ(Walk("(22 \"\" (249 \"a\") (249 \"b\"))").literal(), "(2 text=ab)");
    EXPECT_EQ(Walk("(22 \"\")").literal(), "(2 text= )");
    EXPECT_EQ(Walk("(46 \"\" (141 \"  CHAR\") (42 \"\" (266 \"1\")) (42 \"\" (266 \"2\")))").literal(),
              "(9 text=CHAR (1 text=1) (1 text=2))");
    EXPECT_EQ(Walk("(298 \"dd\")").literal(), "(0 text=dd)");
}

TEST(SelectState, AnAsteriskNodeIsALiteralOfTheSelectList) {
    EXPECT_EQ(Walk("(57 \"ASTERISK_\" (251 \"*\"))").selectItem(), "(1 text=*)");
    // Elsewhere it stands for its first child.
    EXPECT_EQ(Walk("(57 \"ASTERISK_\" (251 \"*\"))").expression(), "(4 name=* op type=251)");
}

TEST(SelectState, AnOrderWithoutItemsIsAnInvalidArgument) {
    Walk walk("(119 \"DESC\")");
    EXPECT_THROW(walk.state.ProcessOrder(walk.tree.get(), &walk.items), CInvalidArgException);
}

TEST(SelectState, AnInvalidArgumentLeavesWhatWasWrittenBefore) {
    Walk walk(
        "(7 \"\" (10 \"\" (11 \"\" (16 \"\" (249 \"a\")))) (37 \"\" (119 \"DESC\")) (34 \"\" (249 \"b\")))");
    EXPECT_THROW(zr::runPasses(walk.state), CInvalidArgException);
    EXPECT_EQ(listText(walk.query.m_selectItems), "(5 field=a)");
    EXPECT_TRUE(walk.query.m_groupItems.IsEmpty());
}

TEST(SelectState, AnInvalidArgumentOfASubQueryEndsTheSubQueryOnly) {
    // IN over a sub-query whose order is empty, with a further operand behind it.
    Walk walk(
        "(134 \"IN\" (7 \"\" (10 \"\" (11 \"\" (16 \"\" (249 \"a\")))) (37 \"\" (119 \"DESC\")) (51 \"\" (12 "
        "\"\" (15 \"\" "
        "(249 \"t\"))))) (249 \"b\"))");
    EXPECT_EQ(walk.expression(), "(4 name=IN op type=134 (6 name=SUB_QUERY query) (0 text=b))");
    const auto& item = dynamic_cast<const SelectItemSubQuery&>(*walk.items.GetHead()->m_items.GetHead());
    EXPECT_EQ(listText(item.m_query->m_selectItems), "(5 field=a)");
    EXPECT_TRUE(item.m_query->m_fromItems.IsEmpty());
}

TEST(SelectState, AnInvalidArgumentGoesToTheNearestSubQuery) {
    // The inner sub-query ends, the outer one goes on with its FROM.
    Walk walk(
        "(134 \"IN\" (7 \"\" (33 \"\" (134 \"IN\" (7 \"\" (37 \"\" (118 \"ASC\")) (51 \"\" (12 \"\" (15 \"\" "
        "(249 \"u\"))))))) "
        "(51 \"\" (12 \"\" (15 \"\" (249 \"t\"))))))");
    ASSERT_EQ(walk.expression(), "(4 name=IN op type=134 (6 name=SUB_QUERY query))");
    const auto& outer = dynamic_cast<const SelectItemSubQuery&>(*walk.items.GetHead()->m_items.GetHead());
    EXPECT_EQ(listText(outer.m_query->m_fromItems), "(5 table=t)");
    ASSERT_NE(outer.m_query->m_whereItem, nullptr);
    EXPECT_EQ(listText(outer.m_query->m_whereItem->m_items),
              "(4 name=IN op type=134 (6 name=SUB_QUERY query))");
}

TEST(SelectState, ASubQueryWithoutASelectHasAnEmptyDescriptor) {
    Walk walk("(36 \"UNION\" (72 \"ALL\") (249 \"x\"))");
    CZRQueryInfo* const branch = walk.state.ProcessUnion(walk.tree.get(), &walk.items);
    walk.state.finish();
    EXPECT_EQ(listText(walk.items), "(8 name=UNION query)");
    EXPECT_EQ(branch->DataType, 8);
    EXPECT_EQ(branch->m_database, nullptr);
}

TEST(SelectState, CopiesItsSourcesOverThoseOfTheTarget) {
    Walk walk("(7 \"\")");
    auto* const field = new CFieldObject;
    field->m_field = u"a";
    field->m_hasTable = 1;
    walk.query.m_fields.SetAt(u"a", field);
    walk.query.m_fields.SetAt(u"empty", nullptr);
    walk.query.m_sourceTables.SetAt(u"t", u"id");
    auto* const alias = new CZRAliasInfo;
    walk.query.m_aliases.SetAt(u"x", alias);
    CZRQueryInfo target;
    target.m_fields.SetAt(u"a", new CFieldObject);
    target.m_sourceTables.SetAt(u"t", u"t");
    walk.state.CopySources(target);
    EXPECT_EQ((*target.m_fields.Find(u"a"))->m_field, u"a");
    EXPECT_EQ((*target.m_fields.Find(u"a"))->m_hasTable, 1);
    EXPECT_NE(*target.m_fields.Find(u"a"), field);
    EXPECT_EQ(*target.m_fields.Find(u"empty"), nullptr);
    EXPECT_EQ(*target.m_sourceTables.Find(u"t"), u"id");
    EXPECT_EQ((*target.m_aliases.Find(u"x"))->ID, alias->ID);
    EXPECT_NE(*target.m_aliases.Find(u"x"), alias);
}

TEST(SelectState, KnowsAliasesThatTheQueryHadBefore) {
    Walk walk("(7 \"\")");
    walk.query.m_aliases.SetAt(u"StRa\u00dfe", new CZRAliasInfo);
    EXPECT_TRUE(walk.state.IsKnownAlias(u"stra\u00dfe"));
    EXPECT_TRUE(walk.state.IsKnownAlias(u"STRA\u00dfE"));
    EXPECT_FALSE(walk.state.IsKnownAlias(u"strasse"));
    EXPECT_FALSE(walk.state.IsKnownAlias(u""));
}

TEST(SelectState, StopsAtItsLimitOfItems) {
    const char* const text = "(252 \"+\" (249 \"a\") (249 \"b\"))";
    Walk enough(text);
    enough.state.setItemLimit(3);
    EXPECT_EQ(enough.expression(), "(4 name=+ op type=252 (0 text=a) (0 text=b))");
    Walk tooFew(text);
    tooFew.state.setItemLimit(2);
    EXPECT_THROW(tooFew.expression(), std::length_error);
    EXPECT_EQ(listText(tooFew.items), "(4 name=+ op type=252 (0 text=a))");
}

// A chain of nodes of one type, with a leaf at its end.
std::unique_ptr<HandMadeTree> chain(unsigned int type, int depth) {
    auto root = std::make_unique<HandMadeTree>(type, u"x");
    HandMadeTree* end = root.get();
    for (int i = 1; i < depth; ++i) end = &end->add(std::make_unique<HandMadeTree>(type, u"x"));
    end->add(std::make_unique<HandMadeTree>(MSSQL_IDENTIFICATOR, u"end"));
    return root;
}

TEST(SelectState, WalksChainsOfAnyDepthOnASmallStack) {
    for (const unsigned int type :
         {unsigned{MSSQL_PLUS}, unsigned{MSSQL_FUNC_PARAM}, unsigned{MSSQL_JOIN_POSTFIX},
          unsigned{MSSQL_JOIN_PREFIX}, unsigned{MSSQL_SEARCH_CONDITION}}) {
        onSmallStack([type] {
            Walk walk(chain(type, 50'000));
            walk.state.ProcessExpression(walk.tree.get(), &walk.items, nullptr);
            walk.state.finish();
            EXPECT_EQ(walk.items.GetCount(), 1) << type;
            walk.state.CollectAliases(walk.tree.get());
            walk.state.CollectTables();
            walk.state.CollectFields();
            walk.state.CollectSubQueries(walk.tree.get());
        });
    }
}

TEST(SelectState, FindsTheSelectNodeDownTheFirstChildren) {
    const auto isSelect = MSSQLStateSelectQuery::isSelectNode;
    const auto below =
        HandMadeTree::read("(0 \"nil\" (5 \"x\" (7 \"SELECT_QUERY_\" (7 \"inner\"))) (7 \"second\"))");
    EXPECT_EQ(zr::findSelectNode(below.get(), isSelect)->GetText(), u"SELECT_QUERY_");
    const auto none = HandMadeTree::read("(0 \"Tree Error Node\")");
    EXPECT_EQ(zr::findSelectNode(none.get(), isSelect), nullptr);
    const auto aside = HandMadeTree::read("(0 \"nil\" (5 \"x\") (7 \"second\"))");
    EXPECT_EQ(zr::findSelectNode(aside.get(), isSelect), nullptr);
}

}  // namespace
