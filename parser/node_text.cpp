#include "parser/node_text.h"

#include <algorithm>
#include <cstdint>
#include <string_view>
#include <utility>

#include "parser/tree_view.h"

namespace zr {

namespace {

using engine::LexedText;
using engine::SyntaxNode;
using engine::SyntaxTree;

// Numbers of tokens; a place ahead of the first one is one as well.
using TokenIndex = std::int64_t;

// A view over a node of the engine's, and null for any other view.
const TreeView* nodeBehind(CZRSQLTree& view) {
    const TreeView* behind = TreeView::of(view);
    return behind && behind->node() != TreeView::kNoNode ? behind : nullptr;
}

// Whether the grammar saw a token of that number.
bool isSeen(const LexedText& text, TokenIndex index) {
    return index >= 0 && index < text.count() && !text.isHidden(static_cast<std::uint32_t>(index));
}

CString plainText(ViewStore& store, SyntaxNode node) {
    const SyntaxTree& tree = *store.tree();
    return tree.isToken(node) ? store.textOf(node) : CString(tree.name(node));
}

// Puts the texts of a node's children together.
class Joiner {
 public:
    explicit Joiner(ViewStore& store) : store_(store), tree_(*store.tree()), text_(tree_.text()) {}

    // From behind this token on, characters that no token took count.
    void startBehind(TokenIndex token) { last_ = token; }
    void add(SyntaxNode child) {
        if (tree_.isToken(child)) {
            addGapsUpTo(tree_.tokenOf(child));
            joined_ += store_.textOf(child);
            last_ = tree_.tokenOf(child);
        } else {
            joined_ += CString(tree_.name(child));
            last_ = kNone;
        }
    }
    void addGapsUpTo(TokenIndex token) {
        if (last_ == kNone) return;
        // Tokens between the two took their characters, whether they are in the tree or not. Hidden ones
        // reached no grammar, and so what they cover counts.
        std::uint32_t from = text_.token(static_cast<std::uint32_t>(last_)).to;
        for (TokenIndex index = last_ + 1; index <= token; ++index) {
            if (!isSeen(text_, index)) continue;
            const engine::LexedToken& next = text_.token(static_cast<std::uint32_t>(index));
            if (next.from > from) joined_ += text_.text().substr(from, next.from - from);
            from = std::max(from, next.to);
        }
    }
    CString text() && { return std::move(joined_); }

 private:
    static constexpr TokenIndex kNone = -1;

    ViewStore& store_;
    const SyntaxTree& tree_;
    const LexedText& text_;
    TokenIndex last_ = kNone;
    CString joined_;
};

bool isLoneQuote(const LexedText& text, TokenIndex index) {
    if (!isSeen(text, index)) return false;
    const std::u16string_view units = text.unitsOf(static_cast<std::uint32_t>(index));
    return units == u"'" || units == u"\"";
}

// The quote tokens around a string's children, each -1 when the quotes are part of the child's own token.
struct Quotes {
    TokenIndex open = -1;
    TokenIndex close = -1;
};

Quotes quotesOf(const SyntaxTree& tree, SyntaxNode string) {
    const LexedText& text = tree.text();
    // The tokens of the string. A tree builder that notes no boundaries leaves both 0.
    TokenIndex first = tree.span(string).first;
    TokenIndex last = tree.span(string).last;
    const bool isBounded = last > first;
    // Where the children begin and end: the quotes stand outside.
    TokenIndex openEnd = last, closeBegin = first;
    if (const std::uint32_t count = tree.childCount(string)) {
        const SyntaxNode head = tree.firstChild(string);
        openEnd = static_cast<TokenIndex>(tree.tokenOf(head)) - 1;
        closeBegin = static_cast<TokenIndex>(tree.tokenOf(head + count - 1)) + 1;
        if (!isBounded) {
            first = openEnd;
            last = closeBegin;
        }
    } else if (!isBounded) {
        return {};
    }
    Quotes quotes;
    for (TokenIndex index = first; index <= openEnd && quotes.open < 0; ++index)
        if (isLoneQuote(text, index)) quotes.open = index;
    for (TokenIndex index = last; index >= closeBegin && quotes.close < 0; --index)
        if (isLoneQuote(text, index)) quotes.close = index;
    return quotes;
}

template <class Visit>
void forEachChild(const SyntaxTree& tree, SyntaxNode node, Visit visit) {
    const SyntaxNode first = tree.firstChild(node);
    for (std::uint32_t index = 0; index < tree.childCount(node); ++index) visit(first + index);
}

}  // namespace

CString joinedText(CZRSQLTree& name) {
    const TreeView* view = nodeBehind(name);
    if (!view) return concatenatedText(name);
    const SyntaxTree& tree = *view->store().tree();
    // Most names are one token.
    if (tree.childCount(view->node()) == 1) return plainText(view->store(), tree.firstChild(view->node()));
    Joiner joiner(view->store());
    forEachChild(tree, view->node(), [&](SyntaxNode child) { joiner.add(child); });
    return std::move(joiner).text();
}

CString quotedText(CZRSQLTree& string) {
    const TreeView* view = nodeBehind(string);
    if (!view) return concatenatedText(string);
    const SyntaxTree& tree = *view->store().tree();
    const Quotes quotes = quotesOf(tree, view->node());
    Joiner joiner(view->store());
    if (quotes.open >= 0) joiner.startBehind(quotes.open);
    forEachChild(tree, view->node(), [&](SyntaxNode child) { joiner.add(child); });
    if (quotes.close >= 0 && quotes.close != quotes.open) joiner.addGapsUpTo(quotes.close);
    return std::move(joiner).text();
}

CString concatenatedText(CZRSQLTree& node) {
    CString text;
    if (const TreeView* view = nodeBehind(node)) {
        const SyntaxTree& tree = *view->store().tree();
        forEachChild(tree, view->node(), [&](SyntaxNode child) { text += plainText(view->store(), child); });
        return text;
    }
    const unsigned int count = node.GetChildCount();
    for (unsigned int index = 0; index < count; ++index) text += node.GetChild(index)->GetText();
    return text;
}

}  // namespace zr
