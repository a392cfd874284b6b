#include "grammar/engine/derivation_steps.h"

#include <algorithm>

namespace zr::engine {

DerivationSteps::DerivationSteps(const ParserTable& table, const Recogniser& recogniser,
                                 const std::vector<std::uint16_t>& types)
    : table_(table), recogniser_(recogniser), types_(types) {
    steps_.swap(spareSteps());
}

DerivationSteps::~DerivationSteps() {
    std::vector<Step>& spare = spareSteps();
    if (steps_.capacity() <= spare.capacity() || steps_.capacity() * sizeof(Step) > kSpareBytes) return;
    steps_.clear();
    steps_.swap(spare);
}

std::vector<Step>& DerivationSteps::spareSteps() {
    static thread_local std::vector<Step> mine;
    return mine;
}

std::uint32_t DerivationSteps::runEndOf(std::uint32_t position) const {
    while (position < types_.size() && types_[position] == table_.closer) ++position;
    return position;
}

/// Writes the path of one entry's end out as steps: the states tell the branches, what lies between two of
/// them is told by the nodes themselves.
void DerivationSteps::open(std::uint32_t entry, std::uint32_t endState, std::uint32_t exact) {
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
    frames_.push_back({base, static_cast<std::uint32_t>(steps_.size()), base, exact});
}

/// Settles, from the end backwards, where in a run of closers each step stands: the optional closers further
/// in take as many as they can, which is the first derivation in written order.
void DerivationSteps::locate(std::uint32_t from, std::uint32_t exact) {
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

std::uint32_t DerivationSteps::close() {
    const Frame frame = frames_.back();
    frames_.pop_back();
    steps_.resize(frame.stepsBase);
    return frame.exactEnd;
}

}  // namespace zr::engine
