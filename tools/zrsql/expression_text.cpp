#include "expression_text.h"

#include <algorithm>
#include <iterator>
#include <string_view>
#include <utility>
#include <vector>

#include "host/descriptor_access.h"

namespace zr::tool {

namespace {

using Text = std::u16string;
using View = std::u16string_view;

bool isNamed(const SelectItem& item, std::initializer_list<View> names) {
    return std::any_of(names.begin(), names.end(), [&](View name) { return item.m_name.EqualsNoCase(name); });
}

Text quoted(View text) {
    // In a dialect whose lexer knows strings they bring their quotes along; elsewhere they hold none.
    if (text.size() > 1 && text.front() == u'\'' && text.back() == u'\'') return Text(text);
    Text result = u"'";
    for (const char16_t unit : text) {
        if (unit == u'\'') result += unit;
        result += unit;
    }
    return result + u"'";
}

// The word that an ordering puts behind the operands of its first item, whatever that item is.
bool isDirection(const SelectItem& item) {
    return item.m_kind == SIK_VALUE && item.m_name.IsEmpty() &&
           (item.m_text == u"ASC" || item.m_text == u"DESC");
}

// The text around the operands of an item.
struct Form {
    Text before;
    Text afterFirst;  // between the first and the second operand
    Text between;     // between later ones
    Text behind;
};

Form operatorForm(const SelectItem& item, std::size_t operands) {
    const Text name(item.m_name.View());
    const Text spaced = u" " + name + u" ";
    // A join without operands stands for one in parentheses, which the descriptor does not keep.
    if (isNamed(item, {u"DEF_JOIN"})) return {operands ? Text() : u"(...)", u" ", u" ", {}};
    if (operands == 0) return {name, {}, {}, {}};
    if (host::isAlias(item)) return {{}, u" AS ", u" AS ", {}};
    if (name == u",") return {{}, u", ", u", ", {}};
    // The blank is the name of an operator that groups a side of a join.
    if (name == u" ") return {{}, u" ", u" ", {}};
    if (isNamed(item, {u"JOIN"})) return {{}, spaced, u" ", {}};
    if (isNamed(item, {u"BETWEEN"})) return {{}, spaced, u" AND ", {}};
    if (operands == 1) return {name + u" ", {}, {}, {}};
    // A list of values, unless a nested query stands there, which comes with parentheses of its own.
    if (operands > 2 || (isNamed(item, {u"IN", u"NOT IN"}) && !host::classOf(*item.m_items.GetTail()).query))
        return {{}, spaced + u"(", u", ", u")"};
    return {{}, spaced, {}, {}};
}

Form formOf(const SelectItem& item, std::size_t operands) {
    const Text name(item.m_name.View());
    // Not every dialect counts NOT IN among its operators.
    if (item.m_isOperator || isNamed(item, {u"NOT IN"})) return operatorForm(item, operands);
    if (isNamed(item, {u"CASE"})) return {name + u" ", u" ", u" ", u" END"};
    if (isNamed(item, {u"WHEN", u"THEN", u"ELSE"})) return {name + u" ", u" ", u" ", {}};
    // A condition in parentheses may bear their name.
    if (name == u"(") return {name, u", ", u", ", u")"};
    const bool isFunction = item.m_kind == SIK_FUNCTION || item.m_kind == SIK_USER_FUNCTION;
    if (isFunction || operands)
        return {(isFunction ? name : Text(item.m_text.View())) + u"(", u", ", u", ", u")"};
    if (item.m_kind == SIK_STRING) return {quoted(item.m_text), {}, {}, {}};
    return {Text(item.m_text.IsEmpty() ? item.m_name.View() : item.m_text.View()), {}, {}, {}};
}

// Still to be written: text, and an item behind it.
struct Piece {
    Text text;
    const SelectItem* item = nullptr;
};

// In some calls the commas stand among the arguments.
bool isComma(const SelectItem* item) {
    return item->m_isOperator && item->m_items.IsEmpty() && item->m_name == u",";
}

std::vector<Piece> piecesOf(const SelectItem& item, const NameQuery& nameQuery) {
    std::vector<const SelectItem*> operands(item.m_items.begin(), item.m_items.end());
    std::erase_if(operands, isComma);
    Text directions;
    while (!operands.empty() && isDirection(*operands.back())) {
        directions.insert(0, u" " + Text(operands.back()->m_text.View()));
        operands.pop_back();
    }
    const host::ItemClass itemClass = host::classOf(item);
    if (itemClass.field) return {{fieldText(*itemClass.field) + directions}};
    if (itemClass.query) return {{nameQuery(*itemClass.query) + directions}};

    const Form form = formOf(item, operands.size());
    std::vector<Piece> pieces = {{form.before}};
    for (std::size_t at = 0; at < operands.size(); ++at) {
        if (at) pieces.push_back({at == 1 ? form.afterFirst : form.between});
        pieces.push_back({{}, operands[at]});
    }
    pieces.push_back({form.behind + directions});
    return pieces;
}

}  // namespace

Text fieldText(const SelectItemField& field) {
    Text text;
    for (const CString* part : {&field.m_dbName, &field.m_schemaName, &field.m_tableAlias,
                                &field.m_sourceTable, &field.m_sourceField}) {
        if (!text.empty() && !part->IsEmpty()) text += u'.';
        text += part->View();
    }
    return text.empty() ? Text(field.m_text.View()) : text;
}

Text expressionText(const SelectItem& root, const NameQuery& nameQuery) {
    Text out;
    std::vector<Piece> todo = {{{}, &root}};  // from the last to the first
    while (!todo.empty()) {
        const Piece piece = std::move(todo.back());
        todo.pop_back();
        out += piece.text;
        if (!piece.item) continue;
        std::vector<Piece> pieces = piecesOf(*piece.item, nameQuery);
        todo.insert(todo.end(), std::make_move_iterator(pieces.rbegin()),
                    std::make_move_iterator(pieces.rend()));
    }
    return out;
}

}  // namespace zr::tool
