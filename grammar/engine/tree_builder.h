#pragma once

#include <cstdint>
#include <vector>

#include "grammar/engine/derivation_steps.h"

/// Builds the tree along the derivation that the recogniser chose.
namespace zr::engine {

/// `Tree` makes the nodes, the runtime's or the engine's own:
///
///     Tree::Node                              a node, or the absence of one
///     token(position)                         a node for a token
///     imaginary(type)                         a node for none
///     error(from, to)                         what stands for tokens that were skipped
///     adopt(root, child)                      adds a last child
///     bound(node, from, to)                   notes the tokens from one position up to another
template <class Tree>
class TreeBuilder {
 public:
    using Node = typename Tree::Node;

    /// `types` are the tokens that the recogniser saw.
    TreeBuilder(const ParserTable& table, const Recogniser& recogniser,
                const std::vector<std::uint16_t>& types, Tree& tree)
        : table_(table), recogniser_(recogniser), steps_(table, recogniser, types), tree_(tree) {}

    /// The roots that the derivation yields, in order: one for a rule with a root, several for a list.
    std::vector<Node>& build(const Recogniser::Result& result);

 private:
    struct Scope {
        Mark mark;
        bool rooted;          ///< the first value is a root: what comes behind it are its children
        std::uint32_t base;   ///< first value of this scope
        std::uint32_t start;  ///< first token
    };

    void take(const Step& step);
    void token(const NodeRow& node, std::uint32_t at);
    void openScope(Mark mark, std::uint32_t at);
    void closeScope(std::uint32_t at);
    void adoptAll(Node root, std::uint32_t base, std::uint32_t end);
    void becomeRoot(Scope& scope, std::uint32_t end, Node root);
    std::uint32_t valueCount() const { return static_cast<std::uint32_t>(values_.size()); }

    const ParserTable& table_;
    const Recogniser& recogniser_;
    DerivationSteps steps_;
    Tree& tree_;
    std::vector<Scope> scopes_;
    std::vector<Node> values_;
    std::uint32_t dropped_ = 0;  ///< scopes at work whose tree is left out
};

template <class Tree>
std::vector<typename Tree::Node>& TreeBuilder<Tree>::build(const Recogniser::Result& result) {
    openScope(Mark::None, recogniser_.startOf(result.entry));
    steps_.open(result.entry, result.endState, result.high);
    while (steps_.isOpen()) {
        if (const Step* step = steps_.next())
            take(*step);
        else
            closeScope(steps_.close());
    }
    return values_;
}

template <class Tree>
void TreeBuilder<Tree>::take(const Step& step) {
    const NodeRow& node = table_.nodes[step.node];
    switch (node.op) {
        case Op::Token:
        case Op::Set:
        case Op::Hard:
            token(node, step.at);
            break;
        case Op::Soft:
            if (step.high > step.at) token(node, step.at);
            break;
        case Op::ScopeBegin:
            openScope(node.mark, step.at);
            break;
        case Op::ScopeEnd:
            closeScope(step.at);
            break;
        case Op::Root:
            if (dropped_ == 0) becomeRoot(scopes_.back(), valueCount(), tree_.imaginary(node.arg));
            break;
        case Op::Call: {
            const std::uint32_t endState = recogniser_.end(step.childEnd).state;
            openScope(node.mark, step.at);
            if (endState == Recogniser::kNone) {
                values_.push_back(tree_.error(step.at, step.high));
                closeScope(step.at);
            } else {
                steps_.open(step.child, endState, step.high);
            }
            break;
        }
        default:
            break;
    }
}

template <class Tree>
void TreeBuilder<Tree>::token(const NodeRow& node, std::uint32_t at) {
    if (node.mark == Mark::Drop || dropped_ != 0) return;
    const Node made = tree_.token(at);
    if (node.mark == Mark::Root)
        becomeRoot(scopes_.back(), valueCount(), made);
    else
        values_.push_back(made);
}

template <class Tree>
void TreeBuilder<Tree>::openScope(Mark mark, std::uint32_t at) {
    if (mark == Mark::Drop) ++dropped_;
    scopes_.push_back({mark, false, valueCount(), at});
}

template <class Tree>
void TreeBuilder<Tree>::closeScope(std::uint32_t at) {
    const Scope scope = scopes_.back();
    scopes_.pop_back();
    std::uint32_t end = valueCount();
    if (scope.rooted) {
        adoptAll(values_[scope.base], scope.base + 1, end);
        end = scope.base + 1;
        values_.resize(end);
    }
    if (end == scope.base + 1 && at > scope.start) tree_.bound(values_.back(), scope.start, at);
    if (scope.mark == Mark::Drop) {
        --dropped_;
    } else if (scope.mark == Mark::Root && end > scope.base) {
        // The rule's tree becomes the root of what the scope around it has built so far.
        const Node root = values_[scope.base];
        adoptAll(root, scope.base + 1, end);
        values_.resize(scope.base);
        becomeRoot(scopes_.back(), scope.base, root);
    }
}

template <class Tree>
void TreeBuilder<Tree>::adoptAll(Node root, std::uint32_t base, std::uint32_t end) {
    for (std::uint32_t i = base; i < end; ++i) tree_.adopt(root, values_[i]);
}

/// `root` becomes the root of the scope's values up to `end`; values behind `end` must be gone already.
template <class Tree>
void TreeBuilder<Tree>::becomeRoot(Scope& scope, std::uint32_t end, Node root) {
    if (scope.rooted) {
        adoptAll(values_[scope.base], scope.base + 1, end);
        end = scope.base + 1;
    }
    adoptAll(root, scope.base, end);
    values_.resize(scope.base);
    values_.push_back(root);
    scope.rooted = true;
}

}  // namespace zr::engine
