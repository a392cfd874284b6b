#include "grammar/engine/syntax_tree.h"

#include "grammar/engine/diagnostics.h"
#include "grammar/engine/grow.h"
#include "grammar/engine/reports.h"
#include "grammar/engine/rule_reading.h"

namespace zr::engine {

/// A tree while it is built: children hang on each other, since a node may get more of them at any time.
class SyntaxTreeGrowth {
 public:
    using Node = std::uint32_t;

    explicit SyntaxTreeGrowth(const LexedText& text) : text_(text) {
        constexpr std::size_t kNodesOfToken = 2;  // what is guessed too high stays unused
        nodes_.swap(spare());
        nodes_.clear();
        if (nodes_.capacity() == 0) nodes_.reserve(kNodesOfToken * text.seenCount() + 8);
    }
    ~SyntaxTreeGrowth() {
        if (nodes_.capacity() > spare().capacity() && nodes_.capacity() * sizeof(Grown) <= kSpareBytes / 2)
            nodes_.swap(spare());
    }
    SyntaxTreeGrowth(const SyntaxTreeGrowth&) = delete;
    SyntaxTreeGrowth& operator=(const SyntaxTreeGrowth&) = delete;

    Node token(std::uint32_t position) {
        return make(SyntaxTree::Kind::Token, text_.types()[position], text_.indexOf(position));
    }
    Node end() { return make(SyntaxTree::Kind::End, 0, 0); }
    Node imaginary(std::uint16_t type) { return make(SyntaxTree::Kind::Imaginary, type, 0); }
    Node list() { return make(SyntaxTree::Kind::List, 0, 0); }
    Node error(std::uint32_t from, std::uint32_t) {
        if (zr::diagnosticsWanted()) report(from);
        return make(SyntaxTree::Kind::Error, 0, 0);
    }
    void adopt(Node root, Node child) {
        // The last child knows the first.
        Grown& parent = nodes_[root];
        if (parent.childCount == 0) {
            nodes_[child].next = child;
        } else {
            nodes_[child].next = nodes_[parent.lastChild].next;
            nodes_[parent.lastChild].next = child;
        }
        parent.lastChild = child;
        ++parent.childCount;
    }
    void bound(Node node, std::uint32_t from, std::uint32_t to) {
        nodes_[node].first = text_.indexOf(from);
        nodes_[node].last = text_.indexOf(to - 1);
    }

    /// Lays the nodes out with all children of a node in a row.
    std::vector<SyntaxTree::Node> laidOut(Node root) const;

 private:
    struct Grown {
        std::uint32_t token;
        std::uint32_t first, last;
        std::uint32_t lastChild, childCount;
        std::uint32_t next;
        std::uint16_t type;
        SyntaxTree::Kind kind;
    };

    /// The nodes of a thread's last tree, kept for its next one.
    static std::vector<Grown>& spare() {
        static thread_local std::vector<Grown> mine;
        return mine;
    }
    Node make(SyntaxTree::Kind kind, std::uint16_t type, std::uint32_t token) {
        growSlowly(nodes_);
        nodes_.push_back({token, 0, 0, 0, 0, 0, type, kind});
        return static_cast<Node>(nodes_.size()) - 1;
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
    std::vector<Grown> nodes_;
};

std::vector<SyntaxTree::Node> SyntaxTreeGrowth::laidOut(Node root) const {
    std::vector<SyntaxTree::Node> out;
    out.reserve(nodes_.size());
    // Until a node's turn comes, firstChild tells which of the grown ones it is.
    const auto add = [&](Node node) {
        const Grown& grown = nodes_[node];
        out.push_back({grown.token, grown.first, grown.last, node, grown.childCount, grown.type, grown.kind});
    };
    add(root);
    for (std::size_t i = 0; i < out.size(); ++i) {
        const Grown& grown = nodes_[out[i].firstChild];
        out[i].firstChild = static_cast<std::uint32_t>(out.size());
        Node child = grown.lastChild;
        for (std::uint32_t left = grown.childCount; left != 0; --left) {
            child = nodes_[child].next;
            add(child);
        }
    }
    return out;
}

SyntaxTree::SyntaxTree(const GrammarTable& grammar, std::u16string_view text, const Options& options)
    : grammar_(&grammar), text_(*grammar.lexer, text, options) {
    SyntaxTreeGrowth growth(text_);
    const auto read = readRule(grammar, text_.types(), options, grammar.parser->startRule, growth);
    nodes_ = growth.laidOut(read.root);
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
