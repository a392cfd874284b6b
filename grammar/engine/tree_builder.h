#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <vector>

#include "grammar/engine/closer_steps.h"
#include "grammar/engine/derivation.h"
#include "grammar/engine/options.h"
#include "grammar/engine/tables.h"

/// Builds the tree along the derivation that the recogniser found.
namespace zr::engine {

/// `Tree` makes the nodes, the runtime's or the engine's own:
///
///     Tree::Node                              a node, or the absence of one; cheap to copy
///     token(position)                         a node for a token
///     imaginary(type)                         a node for none
///     error(from, to)                         what stands for tokens that were skipped
///     adopt(root, children, count)            gives a root its children, all of them; these don't change
///                                             any more
///     bound(node, from, to)                   notes the tokens from one position up to another
///
/// A node gets its children once it can't get any more: until then they stand behind it among the values.
/// That costs each node one step for each rule that hands its tree on as a root (`rule^`) with all that hangs
/// on it, so a rule that did so within itself would cost the square of its depth.
template <class Tree>
class TreeBuilder {
 public:
    using Node = typename Tree::Node;

    /// `types` are the tokens that the recogniser saw.
    TreeBuilder(const ParserTable& table, const Derivation& derivation,
                const std::vector<std::uint16_t>& types, Tree& tree)
        : table_(table), derivation_(derivation), types_(types), tree_(tree), run_(types, table.closer) {
        work_.swap(spare());
    }
    ~TreeBuilder() {
        if (work_.bytes() <= spare().bytes() || work_.bytes() > kSpareBytes / 2) return;
        work_.clear();
        work_.swap(spare());
    }
    TreeBuilder(const TreeBuilder&) = delete;
    TreeBuilder& operator=(const TreeBuilder&) = delete;

    /// The roots that the derivation yields, in order: one for a rule with a root, several for a list.
    std::vector<Node>& build();

 private:
    /// A rule at work, called or inlined, and its tree so far: the values from `base` on. Once it has a root,
    /// that is the first of them and the others are the root's children.
    struct Scope {
        std::uint32_t base;
        std::uint32_t start;   ///< first token
        std::uint32_t part;    ///< of a call: what is called; else kInlined
        std::uint32_t end;     ///< of a call: where that ends
        std::uint16_t behind;  ///< of a call: where its caller goes on; kNone16 along settled steps
        Mark mark;
        bool rooted;
    };

    static constexpr std::uint32_t kInlined = 0xFFFFFFFF;

    /// A part is followed as it stands as long as every place in it is one position. Where places become
    /// intervals, the rest of it is settled first and followed step by step.
    struct Settled {
        std::uint32_t nextStep, firstStep;
        std::uint32_t part, end;
    };

    /// Where the builder stands; at `kNone16` it follows the steps settled last.
    struct Place {
        std::uint16_t node;
        std::uint32_t position;
    };

    /// What grows with a text; a thread keeps that of its last tree for the next one.
    struct Work {
        std::vector<Step> steps;
        std::vector<Settled> settled;
        std::vector<Scope> scopes;
        std::vector<Node> values;

        std::size_t bytes() const {
            return steps.capacity() * sizeof(Step) + settled.capacity() * sizeof(Settled) +
                   scopes.capacity() * sizeof(Scope) + values.capacity() * sizeof(Node);
        }
        void clear() {
            steps.clear();
            settled.clear();
            scopes.clear();
            values.clear();
        }
        void swap(Work& other) {
            steps.swap(other.steps);
            settled.swap(other.settled);
            scopes.swap(other.scopes);
            values.swap(other.values);
        }
    };
    static Work& spare() {
        static thread_local Work mine;
        return mine;
    }

    Place follow(Place place);
    Place followSettled();
    Place settle(Place place);
    Place enter(const NodeRow& call, std::uint32_t from, std::uint32_t to, std::uint16_t behind);
    bool isCloserAt(std::uint32_t position) const {
        return position < types_.size() && types_[position] == table_.closer;
    }

    void token(const NodeRow& node, std::uint32_t at) {
        if (node.mark == Mark::Drop || dropped_ != 0) return;
        work_.values.push_back(tree_.token(at));
        if (node.flags & kOwnSpan) tree_.bound(work_.values.back(), at, at + 1);
        if (node.mark == Mark::Root) becomeRoot(valueCount() - 1);
    }
    void root(const NodeRow& node) {
        if (dropped_ != 0) return;
        work_.values.push_back(tree_.imaginary(node.arg));
        becomeRoot(valueCount() - 1);
    }
    void openScope(Mark mark, std::uint32_t at) {
        if (mark == Mark::Drop) ++dropped_;
        work_.scopes.push_back({valueCount(), at, kInlined, 0, 0, mark, false});
    }
    void closeScope(std::uint32_t at);
    void closeShapedScope(std::uint32_t at);
    void becomeRoot(std::uint32_t from);
    void adopt(std::uint32_t root, std::uint32_t end) {
        tree_.adopt(work_.values[root], work_.values.data() + root + 1, end - root - 1);
    }
    std::uint32_t valueCount() const { return static_cast<std::uint32_t>(work_.values.size()); }

    const ParserTable& table_;
    const Derivation& derivation_;
    const std::vector<std::uint16_t>& types_;
    Tree& tree_;
    CloserRun run_;
    Work work_;
    Cursor cursor_{0, 1};
    std::uint32_t dropped_ = 0;  ///< scopes at work whose tree is left out
};

template <class Tree>
std::vector<typename Tree::Node>& TreeBuilder<Tree>::build() {
    const Derivation::Part& whole = derivation_.parts[0];
    work_.scopes.push_back({0, whole.position, 0, whole.high, kNone16, Mark::None, false});
    Place place{table_.rules[derivation_.rule].entry, whole.position};
    while (!work_.scopes.empty()) place = place.node == kNone16 ? followSettled() : follow(place);
    return work_.values;
}

/// Follows parts as they stand until one has to be settled, a settled one goes on or the whole has ended.
template <class Tree>
typename TreeBuilder<Tree>::Place TreeBuilder<Tree>::follow(Place place) {
    auto [at, position] = place;
    BranchPath path;
    for (;;) {
        const NodeRow& node = table_.nodes[at];
        switch (node.op) {
            case Op::Choice:
                at = path.next(table_, derivation_, cursor_.choice);
                continue;
            case Op::Token:
            case Op::Set:
                token(node, position++);
                break;
            case Op::ScopeBegin:
                openScope(node.mark, position);
                break;
            case Op::ScopeEnd:
                closeScope(position);
                break;
            case Op::Root:
                root(node);
                break;
            case Op::Soft:
            case Op::SoftStar:
            case Op::Hard:
                if (isCloserAt(position)) return settle({at, position});
                break;
            case Op::Call: {
                const Derivation::Part& part = derivation_.parts[cursor_.part];
                if (part.low != part.high) return settle({at, position});
                const Place next = enter(node, position, part.high, node.next);
                at = next.node;
                position = next.position;
                continue;
            }
            case Op::End: {
                const std::uint16_t behind = work_.scopes.back().behind;
                closeScope(position);
                if (behind == kNone16) return {kNone16, position};
                at = behind;
                continue;
            }
        }
        at = node.next;
    }
}

/// Settles what is left of the part at work.
template <class Tree>
typename TreeBuilder<Tree>::Place TreeBuilder<Tree>::settle(Place place) {
    auto call = work_.scopes.rbegin();
    while (call->part == kInlined) ++call;
    const auto first = static_cast<std::uint32_t>(work_.steps.size());
    work_.settled.push_back({first, first, call->part, call->end});
    settleSteps(table_, derivation_, run_, place.node, place.position, call->end, cursor_, work_.steps);
    return {kNone16, place.position};
}

/// The same as follow() along the steps settled last, until one of them calls a rule or they are over.
template <class Tree>
typename TreeBuilder<Tree>::Place TreeBuilder<Tree>::followSettled() {
    Settled& settled = work_.settled.back();
    while (settled.nextStep < work_.steps.size()) {
        const Step& step = work_.steps[settled.nextStep++];
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
                root(node);
                break;
            case Op::Call:
                cursor_ = {step.choice, step.part};
                return enter(node, step.at, step.high, kNone16);
            default:
                break;
        }
    }
    const std::uint32_t end = settled.end;
    cursor_ = {derivation_.parts[settled.part].choices, derivation_.parts[settled.part].parts};
    work_.steps.resize(settled.firstStep);
    work_.settled.pop_back();
    const std::uint16_t behind = work_.scopes.back().behind;
    closeScope(end);
    return {behind, end};
}

/// Enters the part that comes next, which `call` calls.
template <class Tree>
typename TreeBuilder<Tree>::Place TreeBuilder<Tree>::enter(const NodeRow& call, std::uint32_t from,
                                                           std::uint32_t to, std::uint16_t behind) {
    const std::uint32_t part = cursor_.part++;
    openScope(call.mark, from);
    if (derivation_.parts[part].recovered) {
        work_.values.push_back(tree_.error(from, to));
        closeScope(from);
        return {behind, to};
    }
    Scope& scope = work_.scopes.back();
    scope.part = part;
    scope.end = to;
    scope.behind = behind;
    return {table_.rules[call.arg].entry, from};
}

template <class Tree>
inline void TreeBuilder<Tree>::closeScope(std::uint32_t at) {
    const Scope& scope = work_.scopes.back();
    if (scope.rooted || scope.mark != Mark::None) return closeShapedScope(at);
    if (valueCount() == scope.base + 1 && at > scope.start) tree_.bound(work_.values.back(), scope.start, at);
    work_.scopes.pop_back();
}

/// The same where the scope has a root or a mark.
template <class Tree>
void TreeBuilder<Tree>::closeShapedScope(std::uint32_t at) {
    const Scope scope = work_.scopes.back();
    work_.scopes.pop_back();
    const std::uint32_t end = valueCount();
    if (scope.rooted && scope.mark != Mark::Root && end > scope.base + 1) {
        adopt(scope.base, end);
        work_.values.resize(scope.base + 1);
    }
    const bool isOne = scope.rooted || end == scope.base + 1;
    if (isOne && at > scope.start) tree_.bound(work_.values[scope.base], scope.start, at);
    if (scope.mark == Mark::Drop) --dropped_;
    // The rule's tree becomes the root of what the scope around it has built so far.
    if (scope.mark == Mark::Root && end > scope.base) becomeRoot(scope.base);
}

/// Makes a value and those behind it the root of the innermost scope and its first children.
template <class Tree>
void TreeBuilder<Tree>::becomeRoot(std::uint32_t from) {
    Scope& scope = work_.scopes.back();
    std::vector<Node>& values = work_.values;
    const auto base = values.begin() + scope.base;
    if (scope.rooted && from > scope.base + 1) {
        adopt(scope.base, from);
        values.erase(base + 1, values.begin() + from);
        from = scope.base + 1;
    }
    std::rotate(base, values.begin() + from, values.end());
    scope.rooted = true;
}

}  // namespace zr::engine
