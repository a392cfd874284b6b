#include "grammar/engine/syntax_tree.h"

#include <utility>

#include "grammar/engine/diagnostics.h"
#include "grammar/engine/grow.h"
#include "grammar/engine/reports.h"
#include "grammar/engine/rule_reading.h"

namespace zr::engine {

/// A tree while it is built: what hangs on a node already stands where it stays.
class SyntaxTreeGrowth {
 public:
    using Node = SyntaxTree::Node;

    explicit SyntaxTreeGrowth(const LexedText& text) : text_(text) {}

    Node token(std::uint32_t position) const {
        return make(SyntaxTree::Kind::Token, text_.types()[position], text_.indexOf(position));
    }
    static Node end() { return make(SyntaxTree::Kind::End, 0, 0); }
    static Node imaginary(std::uint16_t type) { return make(SyntaxTree::Kind::Imaginary, type, 0); }
    static Node list() { return make(SyntaxTree::Kind::List, 0, 0); }
    Node error(std::uint32_t from, std::uint32_t) const {
        if (zr::diagnosticsWanted()) report(from);
        return make(SyntaxTree::Kind::Error, 0, 0);
    }
    void adopt(Node& root, const Node* children, std::uint32_t count) {
        if (nodes_.empty()) start();
        root.firstChild = static_cast<SyntaxNode>(nodes_.size());
        root.childCount = count;
        growSlowly(nodes_, count);
        nodes_.insert(nodes_.end(), children, children + count);
    }
    void bound(Node& node, std::uint32_t from, std::uint32_t to) const {
        node.first = text_.indexOf(from);
        node.last = text_.indexOf(to - 1);
    }

    /// All nodes of the tree; no more can be made then.
    std::vector<Node> whole(const Node& root) {
        if (nodes_.empty()) start();
        nodes_[SyntaxTree::root()] = root;
        return std::move(nodes_);
    }

 private:
    /// Takes memory with the first nodes: while a reading is looked for there are none.
    void start() {
        // Most texts have one to two nodes for a token.
        nodes_.reserve(text_.seenCount() * std::size_t{7} / 4 + 8);
        nodes_.resize(1);  // the place of the root
    }
    static Node make(SyntaxTree::Kind kind, std::uint16_t type, std::uint32_t token) {
        return {token, 0, 0, 0, 0, type, kind};
    }
    void report(std::uint32_t position) const {
        const std::u16string_view whole = text_.text();
        PlaceFinder places(whole);
        if (position >= text_.seenCount())
            return reportUnreadableEnd(places.at(static_cast<std::uint32_t>(whole.size())).line);
        const std::uint32_t index = text_.indexOf(position);
        reportUnreadable(places.at(text_.token(index).from), text_.unitsOf(index));
    }

    const LexedText& text_;
    std::vector<Node> nodes_;
};

SyntaxTree::SyntaxTree(const GrammarTable& grammar, std::u16string_view text, const Options& options)
    : grammar_(&grammar), text_(*grammar.lexer, text, options) {
    SyntaxTreeGrowth growth(text_);
    const auto read = readRule(grammar, text_.types(), options, grammar.parser->startRule, growth);
    nodes_ = growth.whole(read.root);
    text_.dropTypes();
}

const char* SyntaxTree::name(SyntaxNode node) const {
    switch (nodes_[node].kind) {
        case Kind::Imaginary:
            return grammar_->tokenNames[nodes_[node].type];
        case Kind::End:
            return "<EOF>";
        case Kind::Error:
            return "Tree Error Node";
        default:
            return "nil";
    }
}

}  // namespace zr::engine
