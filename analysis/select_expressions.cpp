// Expressions: operators, functions, parameters, literals.
#include <utility>

#include "analysis/select_state.h"
#include "parser/node_text.h"

namespace zr {

void SelectState::ProcessExpression(CZRSQLTree* node, ItemList* list, CZRSQLTree* parent) {
    if (!node) return;
    for (;;) {
        if (dialect_.leavesAreNoOperands && !node->GetChildCount()) return;
        if (IsOperator(node)) return ProcessOperator(node, list, parent);
        if (takeExpression(node, list, parent) || !node->GetChildCount()) return;
        parent = node;
        node = node->GetChild(0);
    }
}

bool SelectState::takeExpression(CZRSQLTree* node, ItemList* list, CZRSQLTree*) {
    switch (roleOf(node)) {
        case Role::SelectQuery:
            ProcessSubQuery(node, list);
            return true;
        case Role::ColumnSpecification:
            ProcessColumn(node, list);
            return true;
        case Role::TableSpecification:
            append(list, tableOperand(node));
            return true;
        case Role::Cast:
            return true;
        case Role::NewName:
            appendText(list, newNameText(node), SIK_NUMBER);
            return true;
        case Role::JoinPrefix:
            ProcessParams(&appendJoinPart(list).m_items, node);
            return true;
        case Role::JoinPostfix:
            work().forEachChild(*this, &SelectState::joinPostfixStep, node, list, node);
            return true;
        case Role::Function:
        case Role::GroupFunction:
        case Role::SearchCondition:
        case Role::ConvertFunction:
        case Role::UserFunction:
            ProcessFunction(node, list);
            return true;
        case Role::SqlLiteral:
        case Role::Style:
        case Role::DatePart:
            ProcessLiteral(node->GetChild(0), list);
            return true;
        case Role::DataType:
            ProcessLiteral(node, list);
            return true;
        case Role::InnerKeyword:
        case Role::LeftKeyword:
        case Role::RightKeyword:
        case Role::CrossKeyword:
            ProcessKeyword(node, list);
            return true;
        case Role::Identificator:
            appendText(list, node->GetText(), SIK_VALUE);
            return true;
        default:
            return false;
    }
}

void SelectState::joinPostfixStep(CZRSQLTree* node, ItemList* list, CZRSQLTree* parent) {
    if (roleOf(node) == Role::JoinDef)
        ProcessFromItem(node, &appendJoinPart(list).m_items, parent);
    else
        ProcessExpression(node, list, parent);
}

void SelectState::ProcessOperator(CZRSQLTree* node, ItemList* list, CZRSQLTree* parent) {
    SelectItem& item = append(list, newItem<SelectItem>());
    item.m_name = node->GetText().TrimLeft();
    item.m_isOperator = 1;
    item.m_kind = SIK_FUNCTION;
    item.m_tokenType = static_cast<int>(node->GetType());
    if (dialect_.fillsMissingJoinPrefix && item.m_name.EqualsNoCase(u"JOIN") &&
        roleOf(node->GetChild(0)) != Role::JoinPrefix)
        appendText(&item.m_items, u" ", SIK_VALUE);
    if (parent && roleOf(parent) == Role::NestedJoin) item.m_nested = 1;
    ProcessParams(&item.m_items, node);
}

void SelectState::ProcessParams(ItemList* list, CZRSQLTree* node) {
    work().forEachParameter(*this, &SelectState::ProcessExpression, node, list, node);
}

void SelectState::ProcessFunction(CZRSQLTree* node, ItemList* list) {
    if (dialect_.functionsArePlain) return appendFunction(node, list);
    CZRSQLTree* const head = node->GetChild(0);
    // A column at the head comes out by itself, ahead of the function.
    if (roleOf(head) == Role::ColumnSpecification) ProcessExpression(head, list, node);
    if (isEscape(head)) {
        // So does the function inside an escape, which then stands among the escape's parameters once more.
        work().once(*this, &SelectState::functionItemStep, node, list, nullptr);
        work().once(*this, &SelectState::functionStep, head->GetChild(0), list, nullptr);
        return;
    }
    appendFunction(node, list);
}

void SelectState::appendFunction(CZRSQLTree* node, ItemList* list) {
    CZRSQLTree* const head = node->GetChild(0);
    SelectItem& item = append(list, newItem<SelectItem>());
    item.m_name = functionName(head);
    item.m_tokenType = static_cast<int>(head->GetType());
    item.m_isOperator = IsOperator(head);
    if (roleOf(node) == Role::UserFunction) {
        item.m_kind = SIK_USER_FUNCTION;
        m_query->AddUserFunction(item.m_name, parameterCount(node));
    } else {
        item.m_kind = SIK_FUNCTION;
    }
    if (CZRSQLTree* const parameters = functionParameters(node)) ProcessParams(&item.m_items, parameters);
}

int SelectState::parameterCount(CZRSQLTree* node) {
    return node->GetChildCount() > 1 ? static_cast<int>(node->GetChild(1)->GetChildCount()) : 0;
}

CString SelectState::functionName(CZRSQLTree* head) const {
    CString name = head->GetText();
    return (dialect_.functionsArePlain ? unquoted(std::move(name)) : name).TrimLeft();
}

bool SelectState::isEscape(CZRSQLTree* head) const {
    return !dialect_.functionsArePlain && head->GetText().TrimLeft().EqualsNoCase(u"FN");
}

CZRSQLTree* SelectState::functionParameters(CZRSQLTree* node) {
    CZRSQLTree* const head = node->GetChild(0);
    if (roleOf(node) == Role::SearchCondition || isEscape(head)) return head;
    switch (roleOf(head)) {
        case Role::BetweenKeyword:
            return dialect_.functionsArePlain ? head : node;
        case Role::LikeKeyword:
            // As a function LIKE has no parameters, which is intended: those of its call are not looked for.
            return head;
        default:
            return node->GetChildCount() > 1 ? node->GetChild(1) : nullptr;
    }
}

void SelectState::ProcessLiteral(CZRSQLTree* node, ItemList* list) {
    SelectItem& item = append(list, newItem<SelectItem>());
    switch (roleOf(node)) {
        case Role::DataType:
            item.m_kind = SIK_DATA_TYPE;
            item.m_text = node->GetChild(0)->GetText().TrimLeft();
            work().forEachChild(*this, &SelectState::literalStep, node, &item.m_items, nullptr, 1);
            break;
        case Role::NumberLiteral:
        case Role::Asterisk: {
            item.m_kind = SIK_NUMBER;
            const unsigned int count = node->GetChildCount();
            for (unsigned int index = 0; index < count; ++index) {
                item.m_text += node->GetChild(index)->GetText();
                if (item.m_text.EqualsNoCase(u"notnull")) item.m_text = u"NOT NULL";
            }
            break;
        }
        case Role::Date:
            item.m_kind = SIK_DATE;
            item.m_text = concatenatedText(*node);
            break;
        case Role::SqlString:
            item.m_kind = SIK_STRING;
            item.m_text = quotedText(*node);
            // An empty string is stored as a blank, which hosts rely on.
            if (item.m_text.IsEmpty() && !node->GetChildCount()) item.m_text = u" ";
            break;
        default:
            item.m_text = node->GetText();
            break;
    }
}

void SelectState::ProcessKeyword(CZRSQLTree* node, ItemList* list) {
    switch (roleOf(node)) {
        case Role::NumberLiteral:
            appendText(list, node->GetChild(0)->GetText(), SIK_NUMBER);
            break;
        case Role::InnerKeyword:
        case Role::RightKeyword:
        case Role::LeftKeyword:
        case Role::CrossKeyword:
        case Role::OuterKeyword:
            appendText(list, node->GetText(), SIK_NUMBER);
            break;
        default:
            appendText(list, node->GetText(), SIK_VALUE);
            break;
    }
}

}  // namespace zr
