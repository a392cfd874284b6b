#include "parser/node_text.h"

#include <algorithm>
#include <utility>

#include "parser/token_text.h"
#include "parser/tree_view.h"

namespace zr {

namespace {

using Token = ANTLR3_COMMON_TOKEN;

// The tokens of a query by their number.
class TokenRow {
 public:
    explicit TokenRow(pANTLR3_COMMON_TOKEN_STREAM stream) : tokens_(stream ? stream->tokens : nullptr) {}

    // A token that the grammar saw and that was read from the text, or null.
    const Token* at(ANTLR3_MARKER index) const {
        if (!tokens_ || index < 0) return nullptr;
        const auto* token =
            static_cast<const Token*>(tokens_->get(tokens_, static_cast<ANTLR3_UINT32>(index)));
        return token && token->channel == ANTLR3_TOKEN_DEFAULT_CHANNEL && wasRead(*token) ? token : nullptr;
    }
    static bool wasRead(const Token& token) { return token.start != 0 && token.input; }

 private:
    pANTLR3_VECTOR tokens_;
};

const char16_t* unitsBegin(const Token& token) {
    return reinterpret_cast<const char16_t*>(token.start);
}
const char16_t* unitsEnd(const Token& token) {
    return unitsBegin(token) + tokenUnits(token).size();
}

// Puts the texts of a node's children together.
class Joiner {
 public:
    explicit Joiner(const TokenRow& row) : row_(row) {}

    // From behind this token on, characters that no token took count.
    void startBehind(const Token& token) { last_ = &token; }
    void add(ANTLR3_BASE_TREE& child) {
        Token* token = child.getToken(&child);
        if (token && TokenRow::wasRead(*token)) {
            addGapsUpTo(*token);
            text_ += tokenText(*token);
            last_ = token;
        } else {
            text_ += nodeText(child);
            last_ = nullptr;
        }
    }
    void addGapsUpTo(const Token& token) {
        if (!last_) return;
        // Tokens between the two took their characters, whether they are in the tree or not. Hidden ones
        // reached no grammar: row_ leaves them out, and so what they cover counts.
        const char16_t* from = unitsEnd(*last_);
        for (ANTLR3_MARKER index = last_->index + 1; index <= token.index; ++index) {
            const Token* next = row_.at(index);
            if (!next) continue;
            if (unitsBegin(*next) > from)
                text_ += std::u16string_view(from, static_cast<std::size_t>(unitsBegin(*next) - from));
            from = std::max(from, unitsEnd(*next));
        }
    }
    CString text() && { return std::move(text_); }

 private:
    const TokenRow& row_;
    const Token* last_ = nullptr;
    CString text_;
};

bool isLoneQuote(const Token* token) {
    if (!token) return false;
    const std::u16string_view units = tokenUnits(*token);
    return units == u"'" || units == u"\"";
}

// The quote tokens around a string's children, each null when the quotes are part of the child's own token.
struct Quotes {
    const Token* open = nullptr;
    const Token* close = nullptr;
};

Quotes quotesOf(ANTLR3_BASE_TREE& string, const TokenRow& row) {
    const auto& tree = *static_cast<pANTLR3_COMMON_TREE>(string.super);
    // The tokens of the string. A tree builder that notes no boundaries leaves both 0.
    ANTLR3_MARKER first = tree.startIndex;
    ANTLR3_MARKER last = tree.stopIndex;
    const bool isBounded = last > first;
    // Where the children begin and end: the quotes stand outside.
    ANTLR3_MARKER openEnd = last, closeBegin = first;
    const ANTLR3_UINT32 count = string.getChildCount(&string);
    if (count) {
        auto* head = static_cast<pANTLR3_BASE_TREE>(string.getChild(&string, 0));
        auto* tail = static_cast<pANTLR3_BASE_TREE>(string.getChild(&string, count - 1));
        const Token* headToken = head->getToken(head);
        const Token* tailToken = tail->getToken(tail);
        if (!headToken || !tailToken) return {};
        openEnd = headToken->index - 1;
        closeBegin = tailToken->index + 1;
        if (!isBounded) {
            first = openEnd;
            last = closeBegin;
        }
    } else if (!isBounded) {
        return {};
    }
    Quotes quotes;
    for (ANTLR3_MARKER index = first; index <= openEnd && !quotes.open; ++index)
        if (isLoneQuote(row.at(index))) quotes.open = row.at(index);
    for (ANTLR3_MARKER index = last; index >= closeBegin && !quotes.close; --index)
        if (isLoneQuote(row.at(index))) quotes.close = row.at(index);
    return quotes;
}

template <class Visit>
void forEachChild(ANTLR3_BASE_TREE& node, Visit visit) {
    const ANTLR3_UINT32 count = node.getChildCount(&node);
    for (ANTLR3_UINT32 index = 0; index < count; ++index)
        visit(*static_cast<pANTLR3_BASE_TREE>(node.getChild(&node, index)));
}

}  // namespace

CString joinedText(CZRSQLTree& name) {
    const auto* view = dynamic_cast<TreeView*>(&name);
    if (!view || !view->tree()) return concatenatedText(name);
    const TokenRow row(view->tokens());
    Joiner joiner(row);
    forEachChild(*view->tree(), [&](ANTLR3_BASE_TREE& child) { joiner.add(child); });
    return std::move(joiner).text();
}

CString quotedText(CZRSQLTree& string) {
    const auto* view = dynamic_cast<TreeView*>(&string);
    if (!view || !view->tree()) return concatenatedText(string);
    const TokenRow row(view->tokens());
    const Quotes quotes = quotesOf(*view->tree(), row);
    Joiner joiner(row);
    if (quotes.open) joiner.startBehind(*quotes.open);
    forEachChild(*view->tree(), [&](ANTLR3_BASE_TREE& child) { joiner.add(child); });
    if (quotes.close && quotes.close != quotes.open) joiner.addGapsUpTo(*quotes.close);
    return std::move(joiner).text();
}

CString concatenatedText(CZRSQLTree& node) {
    CString text;
    if (const auto* view = dynamic_cast<TreeView*>(&node); view && view->tree()) {
        forEachChild(*view->tree(), [&](ANTLR3_BASE_TREE& child) { text += nodeText(child); });
        return text;
    }
    const unsigned int count = node.GetChildCount();
    for (unsigned int index = 0; index < count; ++index) text += node.GetChild(index)->GetText();
    return text;
}

}  // namespace zr
