#include "grammar/engine/closer_steps.h"

#include <algorithm>

namespace zr::engine {
namespace {

/// Settles, from the end backwards, where in a run of closers each step stands: the optional closers further
/// in take as many as they can, which is the first derivation in written order.
void locate(const ParserTable& table, const Derivation& derivation, std::vector<Step>& steps,
            std::size_t from, std::uint32_t exact) {
    std::uint32_t after = exact;
    for (std::size_t i = steps.size(); i-- > from;) {
        Step& step = steps[i];
        const Op op = table.nodes[step.node].op;
        switch (op) {
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
                step.at = derivation.parts[step.part].position;
                break;
            default:
                step.at = after;
                break;
        }
        // Where a call or an optional closer ends is told by what comes behind it; the slot keeps that
        // position.
        if (op == Op::Call || op == Op::Soft) step.high = after;
        after = step.at;
    }
}

}  // namespace

std::uint32_t CloserRun::endFrom(std::uint32_t position) {
    if (position >= from_ && position < to_) return to_;
    std::uint32_t end = position;
    while (end < types_.size() && types_[end] == closer_ && (end != from_ || to_ == from_)) ++end;
    if (end == from_ && end < to_) end = to_;
    if (end == position) return end;
    from_ = position;
    to_ = end;
    return end;
}

void settleSteps(const ParserTable& table, const Derivation& derivation, CloserRun& run, std::uint16_t node,
                 std::uint32_t position, std::uint32_t exact, Cursor cursor, std::vector<Step>& steps) {
    const std::size_t base = steps.size();
    std::uint32_t low = position, high = position;
    BranchPath path;
    for (;;) {
        const NodeRow& row = table.nodes[node];
        if (row.op == Op::End) break;
        if (row.op == Op::Choice) {
            node = path.next(table, derivation, cursor.choice);
            continue;
        }
        Step step{node, low, high, 0, 0, 0};
        switch (row.op) {
            case Op::Token:
            case Op::Set:
                low = high = high + 1;
                break;
            case Op::Hard:
                ++low;
                high = std::min(high + 1, run.endFrom(step.low));
                break;
            case Op::Soft:
                high = std::min(high + 1, run.endFrom(low));
                break;
            case Op::SoftStar:
                high = run.endFrom(low);
                break;
            case Op::Call: {
                const Derivation::Part& part = derivation.parts[cursor.part];
                step.part = cursor.part;
                step.choice = cursor.choice;
                low = part.low;
                high = part.high;
                cursor = {part.choices, part.parts};
                break;
            }
            default:
                break;
        }
        steps.push_back(step);
        node = row.next;
    }
    locate(table, derivation, steps, base, exact);
}

}  // namespace zr::engine
