#include "parser/tree_view.h"

#include <gtest/gtest.h>

#include <string>

#include "parser/transform_tree.h"
#include "tests/parser/parsed.h"
#include "tests/parser/small_stack.h"
#include "tests/parser/tree_text.h"

namespace {

TEST(TreeView, AnswersOneObjectForOneChild) {
    const ParsedMssql parsed(u"SELECT a, b FROM t");
    EXPECT_EQ(parsed.tree->GetChild(0), parsed.tree->GetChild(0));
    EXPECT_EQ(parsed.tree->GetChild(1), parsed.tree->GetChild(1));
    EXPECT_NE(parsed.tree->GetChild(0), parsed.tree->GetChild(1));
    EXPECT_EQ(parsed.tree->GetChild(7), parsed.tree->GetChild(7));
    EXPECT_NE(parsed.tree->GetChild(7), parsed.tree->GetChild(8));
}

TEST(TreeView, BehindTheLastChildStandsAViewOverNoNode) {
    const ParsedMssql parsed(u"SELECT a");
    CZRSQLTree* const beyond = parsed.tree->GetChild(parsed.tree->GetChildCount());
    ASSERT_NE(beyond, nullptr);
    EXPECT_EQ(beyond->GetChildCount(), 0u);
    EXPECT_EQ(beyond->GetText(), u" ");
    EXPECT_EQ(beyond->GetType(), 0u);
    EXPECT_EQ(beyond->GetChild(0)->GetChild(4294967295u)->GetText(), u" ");
}

TEST(TreeView, ALeafHasNoChildren) {
    const ParsedMssql parsed(u"SELECT a");
    CZRSQLTree* const leaf = findNode(*parsed.tree, 249);
    ASSERT_NE(leaf, nullptr);
    EXPECT_EQ(leaf->GetChildCount(), 0u);
    EXPECT_EQ(leaf->GetText(), u"a");
}

TEST(TreeView, NamesNodesThatStandForNoToken) {
    const ParsedMssql parsed(u"SELECT a FROM t");
    EXPECT_EQ(parsed.tree->GetText(), u"SELECT_QUERY_");
    EXPECT_EQ(parsed.tree->GetType(), 7u);
    EXPECT_EQ(parsed.tree->GetChildCount(), 2u);
    EXPECT_EQ(parsed.tree->GetChild(1)->GetText(), u"FROM_DEF_");
}

TEST(TreeView, AnErrorNodeHasTypeZeroAndNoChildren) {
    const ParsedMssql parsed(u"nothing");
    EXPECT_EQ(parsed.tree->GetType(), 0u);
    EXPECT_EQ(parsed.tree->GetText(), u"Tree Error Node");
    EXPECT_EQ(parsed.tree->GetChildCount(), 0u);
}

TEST(TreeView, MakesChildrenOfItsOwnClass) {
    CZRMySQLTree view(nullptr);
    EXPECT_NE(dynamic_cast<CZRMySQLTree*>(view.GetChild(0)), nullptr);
    EXPECT_EQ(dynamic_cast<CZRMSSQLTree*>(view.GetChild(0)), nullptr);
    const ParsedMssql parsed(u"SELECT a");
    EXPECT_NE(dynamic_cast<CZRMSSQLTree*>(parsed.tree->GetChild(0)->GetChild(0)), nullptr);
}

TEST(TreeView, AssignmentLeavesAViewWhereItIs) {
    const ParsedMssql parsed(u"SELECT a");
    CZRSQLTree* const child = parsed.tree->GetChild(0);
    EXPECT_EQ(&(*parsed.tree = *child), parsed.tree.get());
    EXPECT_EQ(parsed.tree->GetText(), u"SELECT_QUERY_");
}

TEST(TreeView, DeepTreesAreWalkedAndDeletedOnASmallStack) {
    constexpr int kDepth = 10'000;
    std::u16string sql = u"SELECT a";
    for (int i = 0; i < kDepth; ++i) sql += u" + a";
    onSmallStack([&] {
        ParsedMssql parsed(sql);
        int depth = 0;
        for (CZRSQLTree* node = parsed.tree.get(); node->GetChildCount(); node = node->GetChild(0)) ++depth;
        EXPECT_GT(depth, kDepth);
        EXPECT_NO_THROW(parsed.tree.reset());
    });
}

TEST(TreeView, AWideNodeGivesEveryChild) {
    constexpr unsigned int kColumns = 10'000;
    std::u16string sql = u"SELECT a0";
    for (unsigned int i = 1; i < kColumns; ++i) {
        const std::string number = std::to_string(i);
        sql += u",a" + std::u16string(number.begin(), number.end());
    }
    const ParsedMssql parsed(sql);
    CZRSQLTree* const list = parsed.tree->GetChild(0);
    ASSERT_EQ(list->GetChildCount(), kColumns);
    EXPECT_EQ(findNode(*list->GetChild(kColumns - 1), 249)->GetText(), u"a9999");
}

TEST(TransformTree, IsAnEmptyClassToDeriveFrom) {
    static_assert(std::has_virtual_destructor_v<CZRTransformTree>);
    struct Pointer {
        virtual ~Pointer() = default;
    };
    EXPECT_EQ(sizeof(CZRTransformTree), sizeof(Pointer));
}

}  // namespace
