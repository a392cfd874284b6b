#pragma once

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
    /// A part that is being walked. As long as every place in it is one position, it is followed as it
    /// stands; where places become intervals, the rest of it is settled first.
    struct Frame {
        std::uint16_t node;  ///< where it goes on; kNone16 once its steps are settled
        std::uint32_t at;    ///< position there
        std::uint32_t end;   ///< where the part ends
        std::uint32_t part;
        std::uint32_t nextStep, stepsBase;
    };

    struct Scope {
        Mark mark;
        bool rooted;          ///< the first value is a root: what comes behind it are its children
        std::uint32_t base;   ///< first value of this scope
        std::uint32_t start;  ///< first token
    };

    /// What grows with a text; a thread keeps that of its last tree for the next one.
    struct Work {
        std::vector<Frame> frames;
        std::vector<Step> steps;
        std::vector<Scope> scopes;
        std::vector<Node> values;

        std::size_t bytes() const {
            return frames.capacity() * sizeof(Frame) + steps.capacity() * sizeof(Step) +
                   scopes.capacity() * sizeof(Scope) + values.capacity() * sizeof(Node);
        }
        void clear() {
            frames.clear();
            steps.clear();
            scopes.clear();
            values.clear();
        }
        void swap(Work& other) {
            frames.swap(other.frames);
            steps.swap(other.steps);
            scopes.swap(other.scopes);
            values.swap(other.values);
        }
    };
    static Work& spare() {
        static thread_local Work mine;
        return mine;
    }

    void open(std::uint32_t part, std::uint16_t rule, std::uint32_t end);
    void walk();
    void walkSettled();
    void settle();
    void call(const NodeRow& node, std::uint32_t from, std::uint32_t to);
    bool isCloserAt(std::uint32_t position) const {
        return position < types_.size() && types_[position] == table_.closer;
    }

    void token(const NodeRow& node, std::uint32_t at);
    void root(const NodeRow& node) {
        if (dropped_ == 0) becomeRoot(work_.scopes.back(), valueCount(), tree_.imaginary(node.arg));
    }
    void openScope(Mark mark, std::uint32_t at);
    void closeScope(std::uint32_t at);
    void adoptAll(Node root, std::uint32_t base, std::uint32_t end);
    void becomeRoot(Scope& scope, std::uint32_t end, Node root);
    std::uint32_t valueCount() const { return static_cast<std::uint32_t>(work_.values.size()); }

    const ParserTable& table_;
    const Derivation& derivation_;
    const std::vector<std::uint16_t>& types_;
    Tree& tree_;
    CloserRun run_;
    Work work_;
    Cursor cursor_{0, 0};
    std::uint32_t dropped_ = 0;  ///< scopes at work whose tree is left out
};

template <class Tree>
std::vector<typename Tree::Node>& TreeBuilder<Tree>::build() {
    const Derivation::Part& whole = derivation_.parts[0];
    cursor_ = {0, 1};
    openScope(Mark::None, whole.position);
    open(0, derivation_.rule, whole.high);
    while (!work_.frames.empty()) {
        if (work_.frames.back().node == kNone16)
            walkSettled();
        else
            walk();
    }
    return work_.values;
}

template <class Tree>
void TreeBuilder<Tree>::open(std::uint32_t part, std::uint16_t rule, std::uint32_t end) {
    work_.frames.push_back({table_.rules[rule].entry, derivation_.parts[part].position, end, part, 0, 0});
}

/// Goes on with the part opened last until it has ended or opened another one.
template <class Tree>
void TreeBuilder<Tree>::walk() {
    Frame& frame = work_.frames.back();
    const NodeRow* const nodes = table_.nodes;
    std::uint16_t at = frame.node;
    std::uint32_t position = frame.at;
    BranchPath path;
    for (;;) {
        const NodeRow& node = nodes[at];
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
                if (!isCloserAt(position)) break;
                frame.node = at;
                frame.at = position;
                return settle();
            case Op::Call: {
                const Derivation::Part& part = derivation_.parts[cursor_.part];
                if (part.low != part.high) {
                    frame.node = at;
                    frame.at = position;
                    return settle();
                }
                frame.node = node.next;
                frame.at = part.high;
                return call(node, position, part.high);
            }
            case Op::End:
                work_.frames.pop_back();
                return closeScope(position);
        }
        at = node.next;
    }
}

template <class Tree>
void TreeBuilder<Tree>::settle() {
    Frame& frame = work_.frames.back();
    frame.stepsBase = frame.nextStep = static_cast<std::uint32_t>(work_.steps.size());
    settleSteps(table_, derivation_, run_, frame.node, frame.at, frame.end, cursor_, work_.steps);
    frame.node = kNone16;
}

/// The same as walk() along settled steps.
template <class Tree>
void TreeBuilder<Tree>::walkSettled() {
    Frame& frame = work_.frames.back();
    while (frame.nextStep < work_.steps.size()) {
        const Step& step = work_.steps[frame.nextStep++];
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
                return call(node, step.at, step.high);
            default:
                break;
        }
    }
    const std::uint32_t end = frame.end;
    cursor_ = {derivation_.parts[frame.part].choices, derivation_.parts[frame.part].parts};
    work_.steps.resize(frame.stepsBase);
    work_.frames.pop_back();
    closeScope(end);
}

/// Enters the part that comes next.
template <class Tree>
void TreeBuilder<Tree>::call(const NodeRow& node, std::uint32_t from, std::uint32_t to) {
    const std::uint32_t part = cursor_.part++;
    openScope(node.mark, from);
    if (!derivation_.parts[part].recovered) return open(part, node.arg, to);
    work_.values.push_back(tree_.error(from, to));
    closeScope(from);
}

template <class Tree>
void TreeBuilder<Tree>::token(const NodeRow& node, std::uint32_t at) {
    if (node.mark == Mark::Drop || dropped_ != 0) return;
    const Node made = tree_.token(at);
    if (node.mark == Mark::Root)
        becomeRoot(work_.scopes.back(), valueCount(), made);
    else
        work_.values.push_back(made);
}

template <class Tree>
void TreeBuilder<Tree>::openScope(Mark mark, std::uint32_t at) {
    if (mark == Mark::Drop) ++dropped_;
    work_.scopes.push_back({mark, false, valueCount(), at});
}

template <class Tree>
void TreeBuilder<Tree>::closeScope(std::uint32_t at) {
    const Scope scope = work_.scopes.back();
    work_.scopes.pop_back();
    std::vector<Node>& values = work_.values;
    std::uint32_t end = valueCount();
    if (scope.rooted && end > scope.base + 1) {
        adoptAll(values[scope.base], scope.base + 1, end);
        end = scope.base + 1;
        values.resize(end);
    }
    if (end == scope.base + 1 && at > scope.start) tree_.bound(values.back(), scope.start, at);
    if (scope.mark == Mark::None) return;
    if (scope.mark == Mark::Drop) {
        --dropped_;
    } else if (scope.mark == Mark::Root && end > scope.base) {
        // The rule's tree becomes the root of what the scope around it has built so far.
        const Node root = values[scope.base];
        adoptAll(root, scope.base + 1, end);
        values.resize(scope.base);
        becomeRoot(work_.scopes.back(), scope.base, root);
    }
}

template <class Tree>
void TreeBuilder<Tree>::adoptAll(Node root, std::uint32_t base, std::uint32_t end) {
    for (std::uint32_t i = base; i < end; ++i) tree_.adopt(root, work_.values[i]);
}

/// `root` becomes the root of the scope's values up to `end`; values behind `end` must be gone already.
template <class Tree>
void TreeBuilder<Tree>::becomeRoot(Scope& scope, std::uint32_t end, Node root) {
    std::vector<Node>& values = work_.values;
    if (scope.rooted) {
        adoptAll(values[scope.base], scope.base + 1, end);
        end = scope.base + 1;
    }
    adoptAll(root, scope.base, end);
    values.resize(scope.base);
    values.push_back(root);
    scope.rooted = true;
}

}  // namespace zr::engine
