#include "zrparsersql/alias_info.h"

#include <gtest/gtest.h>

#include <memory>

#include "tests/model/small_host.h"
#include "tests/platform/print_string.h"

namespace {

TEST(AliasInfo, IsComputedAndHasNoExpressionAtFirst) {
    const CZRAliasInfo alias;
    EXPECT_EQ(alias.Computed, 1);
    EXPECT_EQ(alias.Expression, nullptr);
}

TEST(AliasInfo, CloneOwnsItsOwnExpression) {
    auto alias = std::make_unique<CZRAliasInfo>();
    alias->AliasText = u"never copied";
    alias->SetAliasTable(u" t ");
    alias->SetAliasField(u" f ");
    alias->Expression = zr::test::functionItem(u"SUM", {zr::test::valueItem(u"x")});
    const std::unique_ptr<CZRAliasInfo> clone(alias->Clone());
    EXPECT_EQ(clone->ID, alias->ID);
    EXPECT_TRUE(clone->AliasText.IsEmpty());
    EXPECT_EQ(clone->GetAliasTable(), u" t ");
    EXPECT_EQ(clone->GetAliasField(), u" f ");
    ASSERT_NE(clone->Expression, nullptr);
    EXPECT_NE(clone->Expression, alias->Expression);
    alias.reset();
    EXPECT_EQ(clone->Expression->GetExpressionText(), u"SUM(x)");
}

TEST(AliasInfo, CloneOfAnAliasWithoutExpressionHasNone) {
    const std::unique_ptr<CZRAliasInfo> clone(CZRAliasInfo().Clone());
    EXPECT_EQ(clone->Expression, nullptr);
    EXPECT_EQ(clone->Computed, 1);
}

TEST(AliasInfo, FindsNoFieldById) {
    CZRAliasInfo alias;
    EXPECT_EQ(alias.FindFieldByID(alias.ID), nullptr);
}

}  // namespace
