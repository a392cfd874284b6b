#include "zrparsersql/select_item.h"

#include <gtest/gtest.h>

#include <memory>

#include "tests/model/small_host.h"
#include "tests/platform/print_string.h"

namespace {

using zr::test::fieldItem;
using zr::test::functionItem;
using zr::test::valueItem;

SelectItem* operatorItem(const CString& name, std::initializer_list<SelectItem*> items) {
    SelectItem* item = functionItem(name, items);
    item->m_isOperator = 1;
    return item;
}

TEST(SelectItem, StartsEmpty) {
    const SelectItem item;
    EXPECT_EQ(item.m_kind, 0);
    EXPECT_EQ(item.m_nested, 0);
    EXPECT_EQ(item.m_tokenType, 0);
    EXPECT_EQ(item.m_isOperator, 0);
    EXPECT_TRUE(item.m_items.IsEmpty());
    EXPECT_TRUE(item.GetItemText().IsEmpty());
}

TEST(SelectItem, ConstructorsSetTheKind) {
    EXPECT_EQ(SelectItemField().m_kind, 5);
    EXPECT_EQ(SelectItemSubQuery().m_kind, 6);
    EXPECT_EQ(SelectItemUnion().m_kind, 8);
    EXPECT_EQ(SelectItemSubQuery().m_query, nullptr);
    EXPECT_EQ(SelectItemUnion().m_query, nullptr);
}

TEST(SelectItem, CopyHoldsEveryFieldAndTheSubItems) {
    SelectItem item;
    item.m_nested = 1;
    item.m_name = u"name";
    item.m_tokenType = 17;
    item.m_text = u"text";
    item.m_kind = SIK_USER_FUNCTION;
    item.m_isOperator = 1;
    item.SetQuoteOpen(u"[");
    item.SetQuoteClose(u"]");
    item.m_computed = 1;
    item.m_items.AddTail(valueItem(u"a"));
    item.m_items.AddTail(nullptr);
    item.m_items.AddTail(valueItem(u"b"));
    const SelectItem copy(item);
    EXPECT_EQ(copy.m_nested, 1);
    EXPECT_EQ(copy.m_name, u"name");
    EXPECT_EQ(copy.m_tokenType, 17);
    EXPECT_EQ(copy.m_text, u"text");
    EXPECT_EQ(copy.m_kind, SIK_USER_FUNCTION);
    EXPECT_EQ(copy.m_isOperator, 1);
    EXPECT_EQ(copy.m_quoteOpen, u"[");
    EXPECT_EQ(copy.m_quoteClose, u"]");
    EXPECT_EQ(copy.m_computed, 1);
    ASSERT_EQ(copy.m_items.GetCount(), 2) << "a null entry is left out";
    EXPECT_EQ(copy.JoinItems(), u"a,b");
}

TEST(SelectItem, DeletingACloneLeavesItsSourceIntact) {
    const std::unique_ptr<SelectItem> item(
        operatorItem(u"+", {functionItem(u"f", {valueItem(u"x")}), valueItem(u"1")}));
    delete item->Clone();
    ASSERT_EQ(item->m_items.GetCount(), 2);
    EXPECT_EQ(item->m_items.GetHead()->GetExpressionText(), u"f(x)");
}

TEST(SelectItem, CloneKeepsClassesAndOrder) {
    const std::unique_ptr<SelectItem> item(functionItem(
        u"f", {fieldItem(u"t", u"a"), new SelectItemSubQuery, new SelectItemUnion, valueItem(u"1")}));
    const std::unique_ptr<SelectItem> clone(item->Clone());
    POSITION at = clone->m_items.GetHeadPosition();
    auto* field = dynamic_cast<SelectItemField*>(clone->m_items.GetNext(at));
    ASSERT_NE(field, nullptr);
    EXPECT_EQ(field->m_sourceField, u"a");
    EXPECT_NE(dynamic_cast<SelectItemSubQuery*>(clone->m_items.GetNext(at)), nullptr);
    EXPECT_NE(dynamic_cast<SelectItemUnion*>(clone->m_items.GetNext(at)), nullptr);
    EXPECT_EQ(clone->m_items.GetNext(at)->m_text, u"1");
}

TEST(SelectItem, CloneOfASubQueryHasItsOwnDescriptor) {
    SelectItemSubQuery item;
    item.m_query = new CZRQueryInfo;
    item.m_query->m_selectItems.AddTail(valueItem(u"x"));
    const std::unique_ptr<SelectItemSubQuery> clone(item.Clone());
    ASSERT_NE(clone->m_query, nullptr);
    EXPECT_NE(clone->m_query, item.m_query);
    EXPECT_EQ(clone->m_query->ID, item.m_query->ID);
    EXPECT_NE(clone->m_query->m_selectItems.GetHead(), item.m_query->m_selectItems.GetHead());
}

TEST(SelectItem, CloneOfAUnionHasItsOwnDescriptor) {
    SelectItemUnion item;
    item.m_query = new CZRQueryInfo;
    const std::unique_ptr<SelectItem> clone(static_cast<SelectItem&>(item).Clone());
    EXPECT_NE(static_cast<SelectItemUnion&>(*clone).m_query, item.m_query);
}

class HostItem : public SelectItemField {
 public:
    HostItem* Clone() const override { return new HostItem(*this); }
    CString GetItemText() const override { return u"host"; }
};

TEST(SelectItem, CloneAsksHostClassesForTheirOwnCopies) {
    const std::unique_ptr<SelectItem> item(functionItem(u"f", {new HostItem}));
    item->m_items.GetHead()->m_items.AddTail(valueItem(u"below"));
    const std::unique_ptr<SelectItem> clone(item->Clone());
    EXPECT_EQ(clone->JoinItems(), u"host");
    EXPECT_EQ(clone->m_items.GetHead()->JoinItems(), u"below");
}

TEST(SelectItem, ClearItemsEmptiesTheList) {
    const std::unique_ptr<SelectItem> item(
        functionItem(u"f", {functionItem(u"g", {valueItem(u"x")}), nullptr}));
    item->ClearItems();
    EXPECT_TRUE(item->m_items.IsEmpty());
    EXPECT_EQ(item->GetExpressionText(), u"f()");
}

TEST(SelectItem, JoinsItemsWithoutBlanks) {
    const std::unique_ptr<SelectItem> item(
        functionItem(u"f", {valueItem(u"a"), valueItem(u""), valueItem(u"c")}));
    EXPECT_EQ(item->JoinItems(), u"a,,c");
}

TEST(SelectItem, FunctionWithoutParametersShowsEmptyBrackets) {
    const std::unique_ptr<SelectItem> item(functionItem(u"NOW"));
    EXPECT_EQ(item->GetExpressionText(), u"NOW()");
}

TEST(SelectItem, OperatorStandsBetweenItsFirstAndLastOperand) {
    const std::unique_ptr<SelectItem> item(
        operatorItem(u"+", {valueItem(u"a"), valueItem(u"b"), valueItem(u"c")}));
    EXPECT_EQ(item->GetExpressionText(), u"a + c");
}

TEST(SelectItem, OperatorWithOneOperandShowsItOnBothSides) {
    const std::unique_ptr<SelectItem> item(operatorItem(u"NOT", {valueItem(u"a")}));
    EXPECT_EQ(item->GetExpressionText(), u"a NOT a");
}

TEST(SelectItem, OperatorWithoutOperandsRaises) {
    const std::unique_ptr<SelectItem> item(operatorItem(u"+", {}));
    EXPECT_THROW(item->GetExpressionText(), CInvalidArgException);
}

struct FieldTextCase {
    const char16_t* table;
    const char16_t* field;
    const char16_t* firstItem;  // null for no items
    const char16_t* text;
};

TEST(SelectItemField, TextFollowsNamesAndFirstItem) {
    const FieldTextCase cases[] = {
        {u"", u"", u"*", u"*"},         {u"", u"", u"x", u""},
        {u"", u"", nullptr, u""},       {u"t", u"f", nullptr, u"[t].[f]"},
        {u"t", u"f", u"*", u"[t].[f]"}, {u"", u"f", nullptr, u"[f]"},
        {u"", u"f", u"*", u"[f]"},      {u"t", u"", u"*", u"[t].*"},
        {u"t", u"", u"x", u""},         {u"t", u"", nullptr, u"[t]"},
    };
    for (const FieldTextCase& expected : cases) {
        SelectItemField item;
        item.m_quoteOpen = u"[";
        item.m_quoteClose = u"]";
        item.m_tableName = expected.table;
        item.m_fieldName = expected.field;
        if (expected.firstItem) item.m_items.AddTail(valueItem(expected.firstItem));
        EXPECT_EQ(item.GetItemText(), expected.text);
    }
}

TEST(SelectItemField, TextHasNoQuotesUnlessTheyAreSet) {
    SelectItemField item;
    item.m_tableName = u"t";
    item.m_fieldName = u"f";
    EXPECT_EQ(item.GetItemText(), u"t.f");
}

TEST(SelectItemField, CopyKeepsKindTenAndMakesEveryOtherAField) {
    SelectItemField item;
    item.m_kind = 10;
    EXPECT_EQ(std::unique_ptr<SelectItem>(item.Clone())->m_kind, 10);
    item.m_kind = 7;
    EXPECT_EQ(std::unique_ptr<SelectItem>(item.Clone())->m_kind, 5);
    EXPECT_EQ(item.m_kind, 7);
    const std::unique_ptr<SelectItem> parent(functionItem(u"f", {item.Clone()}));
    parent->m_items.GetHead()->m_kind = 1;
    EXPECT_EQ(std::unique_ptr<SelectItem>(parent->Clone())->m_items.GetHead()->m_kind, 5);
}

TEST(SelectItemField, CopyHoldsAllNames) {
    SelectItemField item;
    item.m_sourceTable = u"1";
    item.m_sourceField = u"2";
    item.m_tableName = u"3";
    item.m_fieldName = u"4";
    item.m_tableAlias = u"5";
    item.m_resolvedSchema = u"6";
    item.m_reservedText = u"7";
    item.m_schemaName = u"8";
    item.m_dbName = u"9";
    const SelectItemField copy(item);
    EXPECT_EQ(copy.m_sourceTable + copy.m_sourceField + copy.m_tableName + copy.m_fieldName +
                  copy.m_tableAlias + copy.m_resolvedSchema + copy.m_reservedText + copy.m_schemaName +
                  copy.m_dbName,
              u"123456789");
}

TEST(FieldObject, CopyLeavesTheLastTextEmpty) {
    CFieldObject field;
    field.m_table = u"t";
    field.m_field = u"f";
    field.m_aliasText = u"a";
    field.m_hasTable = 1;
    field.m_aliasTarget = 1;
    field.m_reservedText = u"r";
    const CFieldObject copy(field);
    EXPECT_EQ(copy.m_table, u"t");
    EXPECT_EQ(copy.m_field, u"f");
    EXPECT_EQ(copy.m_aliasText, u"a");
    EXPECT_EQ(copy.m_hasTable, 1);
    EXPECT_EQ(copy.m_aliasTarget, 1);
    EXPECT_TRUE(copy.m_reservedText.IsEmpty());
}

}  // namespace
