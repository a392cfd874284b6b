#include "expression_text.h"

#include <iterator>
#include <utility>
#include <vector>

#include "descriptor_access.h"

namespace zr::tool {

namespace {

using Text = std::u16string;

bool isNamed(const SelectItem& item, std::u16string_view name) {
    return item.m_isOperator && item.m_name.EqualsNoCase(name);
}

Text quoted(std::u16string_view text) {
    Text result = u"'";
    for (const char16_t unit : text) {
        if (unit == u'\'') result += unit;
        result += unit;
    }
    return result + u"'";
}

// What stands ahead of the operands of an item, between them and behind them.
struct Form {
    Text before;
    Text between;
    Text behind;
    Text afterFirst;  // in place of between, behind the first operand
};

Form evenForm(Text before, Text between, Text behind) {
    return {std::move(before), between, std::move(behind), between};
}

Form operatorForm(const SelectItem& item) {
    const Text name(item.m_name.View());
    if (isAlias(item)) return evenForm(u"", u" AS ", u"");
    if (name == u",") return evenForm(u"", u", ", u"");
    // The name of an operator that only groups the sides of a join.
    if (name == u" ") return evenForm(u"", u" ", u"");
    if (isNamed(item, u"JOIN")) return {u"", u" ", u"", u" " + name + u" "};
    if (isNamed(item, u"BETWEEN")) return {u"", u" AND ", u"", u" " + name + u" "};
    if (item.m_items.GetCount() == 1) return evenForm(name + u" ", u"", u"");
    return evenForm(u"", u" " + name + u" ", u"");
}

Form formOf(const SelectItem& item) {
    if (item.m_isOperator) return operatorForm(item);
    const Text name(item.m_name.View());
    if (item.m_kind == SIK_DATA_TYPE) return evenForm(Text(item.m_text.View()) + u"(", u", ", u")");
    return evenForm(name + u"(", u", ", u")");
}

bool isFunction(const SelectItem& item) {
    return (item.m_kind == SIK_FUNCTION || item.m_kind == SIK_USER_FUNCTION) && !item.m_isOperator;
}

Text plainText(const SelectItem& item) {
    if (item.m_kind == SIK_STRING) return quoted(item.m_text);
    return Text(item.m_text.IsEmpty() ? item.m_name.View() : item.m_text.View());
}

}  // namespace

bool isAlias(const SelectItem& item) {
    return isNamed(item, u"ALIAS") && item.m_items.GetCount() >= 2;
}

Text fieldText(const SelectItemField& field) {
    Text text;
    const auto add = [&](const CString& part) {
        if (part.IsEmpty()) return;
        if (!text.empty()) text += u'.';
        text += part.View();
    };
    add(field.m_dbName);
    add(field.m_schemaName);
    add(field.m_tableAlias);
    add(field.m_sourceTable);
    add(field.m_sourceField);
    return text.empty() ? Text(field.m_text.View()) : text;
}

Text expressionText(const SelectItem& root, const NameQuery& nameQuery) {
    // Still to be written, from the last to the first: an item, or text.
    struct Piece {
        Text text;
        const SelectItem* item = nullptr;
    };
    Text out;
    std::vector<Piece> todo;
    todo.push_back({{}, &root});
    while (!todo.empty()) {
        const Piece piece = std::move(todo.back());
        todo.pop_back();
        out += piece.text;
        if (!piece.item) continue;
        const SelectItem& item = *piece.item;
        const ItemClass itemClass = classOf(item);
        const bool hasForm = item.m_isOperator || isFunction(item) || !item.m_items.IsEmpty();
        if (itemClass.field)
            out += fieldText(*itemClass.field);
        else if (itemClass.query)
            out += nameQuery(*itemClass.query);
        else if (!hasForm)
            out += plainText(item);
        if (itemClass.hasQuery || (itemClass.field ? item.m_items.IsEmpty() : !hasForm)) continue;

        // A column or a plain value has items only where an ordering was put: they follow.
        const Form form = itemClass.field ? evenForm(u" ", u" ", u"") : formOf(item);
        std::vector<Piece> pieces;
        pieces.push_back({form.before});
        int place = 0;
        for (const SelectItem* operand : item.m_items) {
            if (place) pieces.push_back({place == 1 ? form.afterFirst : form.between});
            pieces.push_back({{}, operand});
            ++place;
        }
        pieces.push_back({form.behind});
        todo.insert(todo.end(), std::make_move_iterator(pieces.rbegin()),
                    std::make_move_iterator(pieces.rend()));
    }
    return out;
}

}  // namespace zr::tool
