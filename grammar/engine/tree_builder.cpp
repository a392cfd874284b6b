#include "grammar/engine/tree_builder.h"

#include <algorithm>

namespace zr::engine {

TreeBuilder::TreeBuilder(const GrammarTable& grammar, const Recogniser& recogniser,
                         const std::vector<pANTLR3_COMMON_TOKEN>& tokens, pANTLR3_BASE_TREE_ADAPTOR adaptor)
    : grammar_(grammar),
      table_(*grammar.parser),
      recogniser_(recogniser),
      tokens_(tokens),
      adaptor_(adaptor) {
    steps_.swap(spareSteps());
}

TreeBuilder::~TreeBuilder() {
    std::vector<Step>& spare = spareSteps();
    if (steps_.capacity() <= spare.capacity() || steps_.capacity() * sizeof(Step) > kSpareBytes) return;
    steps_.clear();
    steps_.swap(spare);
}

std::vector<TreeBuilder::Step>& TreeBuilder::spareSteps() {
    static thread_local std::vector<Step> mine;
    return mine;
}

std::uint32_t TreeBuilder::runEndOf(std::uint32_t position) const {
    while (position < tokens_.size() && tokens_[position]->type == table_.closer) ++position;
    return position;
}

/// Writes the path of one entry's end out as steps: the states tell the branches, what lies between two of
/// them is told by the nodes themselves.
void TreeBuilder::expand(std::uint32_t entry, std::uint32_t endState, std::uint32_t exact) {
    path_.clear();
    for (std::uint32_t s = endState; s != Recogniser::kNone; s = recogniser_.state(s).before)
        path_.push_back(s);
    const auto base = static_cast<std::uint32_t>(steps_.size());
    std::size_t next = path_.size() - 1;
    std::uint16_t at = recogniser_.state(path_[next]).node;
    std::uint32_t l = recogniser_.startOf(entry), h = l;
    for (;;) {
        const NodeRow& node = table_.nodes[at];
        Step step{at, l, h, 0, Recogniser::kNone, Recogniser::kNone};
        if (node.op == Op::End) break;
        if (node.op == Op::Choice) {
            at = recogniser_.state(path_[--next]).node;
            continue;
        }
        switch (node.op) {
            case Op::Token:
            case Op::Set:
                l = h = h + 1;
                break;
            case Op::Hard:
                ++l;
                h = std::min(h + 1, runEndOf(step.low));
                break;
            case Op::Soft:
                h = std::min(h + 1, runEndOf(l));
                break;
            case Op::SoftStar:
                h = runEndOf(l);
                break;
            case Op::Call: {
                const Recogniser::State& back = recogniser_.state(path_[--next]);
                step.child = back.child;
                step.childEnd = back.childEnd;
                l = back.low;
                h = back.high;
                break;
            }
            default:
                break;
        }
        steps_.push_back(step);
        at = node.next;
    }
    locate(base, exact);
    frames_.push_back({base, static_cast<std::uint32_t>(steps_.size()), base});
}

/// Settles, from the end backwards, where in a run of closers each step stands: the optional closers further
/// in take as many as they can, which is the first derivation in written order.
void TreeBuilder::locate(std::uint32_t from, std::uint32_t exact) {
    std::uint32_t after = exact;
    for (std::uint32_t i = static_cast<std::uint32_t>(steps_.size()); i-- > from;) {
        Step& step = steps_[i];
        switch (table_.nodes[step.node].op) {
            case Op::Token:
            case Op::Set:
            case Op::Hard:
                step.at = after - 1;
                break;
            case Op::Soft:
                step.at = step.high >= after ? after : after - 1;
                break;
            case Op::SoftStar:
                step.at = std::min(step.high, after);
                break;
            case Op::Call:
                step.at = recogniser_.startOf(step.child);
                break;
            default:
                step.at = after;
                break;
        }
        // Where a call or an optional closer ends is told by what comes behind it; the slot keeps that
        // position.
        if (step.child != Recogniser::kNone || table_.nodes[step.node].op == Op::Soft) step.high = after;
        after = step.at;
    }
}

void TreeBuilder::adoptAll(pANTLR3_BASE_TREE root, std::uint32_t base, std::uint32_t end) {
    for (std::uint32_t i = base; i < end; ++i) adaptor_->addChild(adaptor_, root, values_[i]);
}

/// `root` becomes the root of the scope's values up to `end`; values behind `end` must be gone already.
void TreeBuilder::becomeRoot(Scope& scope, std::uint32_t end, pANTLR3_BASE_TREE root) {
    if (scope.rooted) {
        adoptAll(values_[scope.base], scope.base + 1, end);
        end = scope.base + 1;
    }
    adoptAll(root, scope.base, end);
    values_.resize(scope.base);
    values_.push_back(root);
    scope.rooted = true;
}

void TreeBuilder::bound(pANTLR3_BASE_TREE node, std::uint32_t start, std::uint32_t stop) const {
    if (stop <= start) return;
    adaptor_->setTokenBoundaries(adaptor_, node, tokens_[start], tokens_[stop - 1]);
}

void TreeBuilder::token(const Step& step) {
    const Mark mark = table_.nodes[step.node].mark;
    if (mark == Mark::Drop || dropped_ != 0) return;
    const auto node = static_cast<pANTLR3_BASE_TREE>(adaptor_->create(adaptor_, tokens_[step.at]));
    if (mark == Mark::Root)
        becomeRoot(scopes_.back(), static_cast<std::uint32_t>(values_.size()), node);
    else
        values_.push_back(node);
}

void TreeBuilder::openScope(Mark mark, std::uint32_t at) {
    if (mark == Mark::Drop) ++dropped_;
    scopes_.push_back({mark, static_cast<std::uint32_t>(values_.size()), false, at});
}

void TreeBuilder::closeScope(std::uint32_t at) {
    const Scope scope = scopes_.back();
    scopes_.pop_back();
    auto end = static_cast<std::uint32_t>(values_.size());
    if (scope.rooted) {
        adoptAll(values_[scope.base], scope.base + 1, end);
        end = scope.base + 1;
        values_.resize(end);
    }
    if (end == scope.base + 1) bound(values_.back(), scope.start, at);
    if (scope.mark == Mark::Drop) {
        --dropped_;
    } else if (scope.mark == Mark::Root && end > scope.base) {
        // The rule's tree becomes the root of what the scope around it has built so far.
        const pANTLR3_BASE_TREE root = values_[scope.base];
        adoptAll(root, scope.base + 1, end);
        values_.resize(scope.base);
        becomeRoot(scopes_.back(), scope.base, root);
    }
}

const std::vector<pANTLR3_BASE_TREE>& TreeBuilder::build(const Recogniser::Result& result,
                                                         ErrorNodes& errors) {
    steps_.clear();
    openScope(Mark::None, recogniser_.startOf(result.entry));
    expand(result.entry, result.endState, result.high);
    std::vector<std::uint32_t> endsAt{result.high};
    while (!frames_.empty()) {
        Frame& frame = frames_.back();
        if (frame.nextStep == frame.stepsEnd) {
            steps_.resize(frame.stepsBase);
            frames_.pop_back();
            closeScope(endsAt.back());
            endsAt.pop_back();
            continue;
        }
        const Step step = steps_[frame.nextStep++];
        const NodeRow& node = table_.nodes[step.node];
        switch (node.op) {
            case Op::Token:
            case Op::Set:
            case Op::Hard:
                token(step);
                break;
            case Op::Soft:
                if (step.high > step.at) token(step);
                break;
            case Op::ScopeBegin:
                openScope(node.mark, step.at);
                break;
            case Op::ScopeEnd:
                closeScope(step.at);
                break;
            case Op::Root: {
                if (dropped_ != 0) break;
                const auto root = static_cast<pANTLR3_BASE_TREE>(adaptor_->createTypeText(
                    adaptor_, node.arg,
                    reinterpret_cast<pANTLR3_UINT8>(const_cast<char*>(grammar_.tokenNames[node.arg]))));
                becomeRoot(scopes_.back(), static_cast<std::uint32_t>(values_.size()), root);
                break;
            }
            case Op::Call: {
                const Recogniser::End& end = recogniser_.end(step.childEnd);
                openScope(node.mark, step.at);
                if (end.state == Recogniser::kNone) {
                    values_.push_back(errors.errorNode(step.at, step.high));
                    closeScope(step.at);
                    break;
                }
                endsAt.push_back(step.high);
                expand(step.child, end.state, step.high);
                break;
            }
            default:
                break;
        }
    }
    return values_;
}

}  // namespace zr::engine
