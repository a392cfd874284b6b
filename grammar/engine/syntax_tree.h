#pragma once

#include <cstdint>
#include <string_view>
#include <vector>

#include "grammar/engine/lexed_text.h"
#include "grammar/engine/options.h"
#include "grammar/engine/tables.h"

/// The tree of a text as the engine keeps it by itself: the same nodes in the same order as the runtime's,
/// in a few bytes each.
namespace zr::engine {

/// A node by its number. The children of a node have numbers in a row.
using SyntaxNode = std::uint32_t;

class SyntaxTree {
 public:
    /// Type and number of a node for the end of the text.
    static constexpr std::uint32_t kEndType = 0xFFFFFFFF;

    /// Reads a text with a grammar's start rule. The text is read in place and must outlive this object.
    SyntaxTree(const GrammarTable& grammar, std::u16string_view text, const Options& options = {});

    static constexpr SyntaxNode root() { return 0; }
    std::uint32_t nodeCount() const { return static_cast<std::uint32_t>(nodes_.size()); }

    std::uint32_t childCount(SyntaxNode node) const { return nodes_[node].childCount; }
    SyntaxNode firstChild(SyntaxNode node) const { return nodes_[node].firstChild; }
    /// The token number; 0 for a list and for an error.
    std::uint32_t type(SyntaxNode node) const {
        const Node& at = nodes_[node];
        return at.kind == Kind::End ? kEndType : at.type;
    }

    /// Whether the node stands for a token of the text, and which.
    bool isToken(SyntaxNode node) const { return nodes_[node].kind == Kind::Token; }
    std::uint32_t tokenOf(SyntaxNode node) const { return nodes_[node].token; }
    /// The text of a token, in place.
    std::u16string_view tokenText(SyntaxNode node) const { return text_.textOf(nodes_[node].token); }
    /// The name of a node that stands for no token, plain ASCII.
    const char* name(SyntaxNode node) const;

    /// The tokens that the node spans, both 0 where that was not noted.
    struct Span {
        std::uint32_t first, last;
    };
    Span span(SyntaxNode node) const { return {nodes_[node].first, nodes_[node].last}; }

    const LexedText& text() const { return text_; }

 private:
    friend class SyntaxTreeGrowth;

    enum class Kind : std::uint8_t { Token, Imaginary, End, Error, List };
    struct Node {
        std::uint32_t token;
        std::uint32_t first, last;
        std::uint32_t firstChild, childCount;
        std::uint16_t type;
        Kind kind;
    };

    const GrammarTable* grammar_;
    LexedText text_;
    std::vector<Node> nodes_;
};

}  // namespace zr::engine
