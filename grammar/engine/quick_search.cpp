#include "grammar/engine/quick_search.h"

#include <algorithm>
#include <bit>

namespace zr::engine {

QuickSearch::Outcome QuickSearch::run(std::uint16_t rule, std::uint32_t position) {
    if (options_.quickSteps == 0) return Outcome::GaveUp;
    made_.parts.assign(1, {rule, position, false});
    made_.ends.clear();
    made_.states.clear();
    work_.calls.clear();
    work_.points.clear();
    const std::uint16_t first = table_.rules[rule].entry;
    low_ = high_ = position;
    state_ = addState(first, kNone, kNone, kNone);
    at_ = searchedFrom(table_, first);
    std::uint32_t furthest = position;
    std::uint64_t bound = options_.quickSteps;
    while (!follow()) {
        // A way that fails is followed by one that gets further, or there is more wrong.
        if (low_ > furthest) {
            furthest = low_;
            bound = steps_ + options_.quickSteps;
        }
        if (tooDeep_) return Outcome::TooDeep;
        if (++steps_ > bound || remembered() > options_.maxMemo || !turnBack()) return Outcome::GaveUp;
    }
    if (remembered() > options_.maxMemo) return Outcome::GaveUp;
    made_.endState = state_;
    return Outcome::Found;
}

std::uint32_t QuickSearch::addState(std::uint16_t node, std::uint32_t before, std::uint32_t child,
                                    std::uint32_t end) {
    made_.states.push_back({low_, high_, before, child, end, node});
    return static_cast<std::uint32_t>(made_.states.size()) - 1;
}

/// Goes on until the whole is read, which gives true, or a way fails.
bool QuickSearch::follow() {
    for (;;) {
        const NodeRow& node = table_.nodes[at_];
        switch (node.op) {
            case Op::Choice: {
                std::uint32_t mask = text_.viable(node, low_, high_);
                if ((node.flags & kLoop) && ((stopped_ >> node.context) & 1)) mask &= ~1u;
                if (mask == 0) return false;
                const auto branch = static_cast<std::uint32_t>(std::countr_zero(mask));
                mask &= mask - 1;
                if (mask != 0)
                    work_.points.push_back({low_, high_, state_, mask, call_,
                                            static_cast<std::uint32_t>(made_.states.size()),
                                            static_cast<std::uint32_t>(made_.ends.size()),
                                            static_cast<std::uint32_t>(made_.parts.size()),
                                            static_cast<std::uint32_t>(work_.calls.size()), at_, stopped_});
                take(branch);
                continue;
            }
            case Op::Call:
                if (!call(node)) return false;
                continue;
            case Op::End:
                if (call_ == kNone) return high_ == text_.count();
                if (!comeBack()) return false;
                continue;
            default:
                if (!text_.take(node, low_, high_, stopped_)) return false;
                break;
        }
        at_ = node.run;
    }
}

void QuickSearch::take(std::uint32_t branch) {
    const NodeRow& choice = table_.nodes[at_];
    const std::uint16_t target = table_.targets[table_.choices[choice.arg].firstTarget + branch];
    state_ = addState(target, state_, kNone, kNone);
    stopped_ = text_.stoppedAfter(choice, branch, low_, high_, stopped_);
    at_ = searchedFrom(table_, target);
}

/// Back to the last choice that has a branch left.
bool QuickSearch::turnBack() {
    if (work_.points.empty()) return false;
    Point& point = work_.points.back();
    made_.states.resize(point.states);
    made_.ends.resize(point.ends);
    made_.parts.resize(point.parts);
    work_.calls.resize(point.calls);
    low_ = point.low;
    high_ = point.high;
    state_ = point.state;
    call_ = point.call;
    at_ = point.node;
    stopped_ = point.stopped;
    const auto branch = static_cast<std::uint32_t>(std::countr_zero(point.mask));
    point.mask &= point.mask - 1;
    if (point.mask == 0) work_.points.pop_back();
    take(branch);
    return true;
}

bool QuickSearch::call(const NodeRow& node) {
    if (!text_.settle(low_, high_)) return false;
    const RuleRow& rule = table_.rules[node.arg];
    if (!rule.nullable || (node.flags & kNonEmpty)) {
        if (!text_.inSet(table_.firstSetBase + node.arg, text_.classAt(low_)) ||
            !text_.secondFits(node.arg, low_))
            return false;
    }
    if (!text_.guarded(node, low_)) return false;
    const std::uint32_t depth = call_ == kNone ? 1 : work_.calls[call_].depth + 1;
    tooDeep_ = depth >= options_.maxDepth;
    if (tooDeep_) return false;
    ++steps_;
    const auto part = static_cast<std::uint32_t>(made_.parts.size());
    made_.parts.push_back({node.arg, low_, false});
    work_.calls.push_back({call_, state_, part, low_, depth, at_, stopped_});
    call_ = static_cast<std::uint32_t>(work_.calls.size()) - 1;
    state_ = addState(rule.entry, kNone, kNone, kNone);
    at_ = searchedFrom(table_, rule.entry);
    stopped_ = 0;
    return true;
}

/// The rule at work is over: its caller goes on.
bool QuickSearch::comeBack() {
    const Call& call = work_.calls[call_];
    const NodeRow& node = table_.nodes[call.node];
    if (high_ == call.position) {
        if (node.flags & kNonEmpty) return false;
        stopped_ = call.stopped;
    }
    const auto end = static_cast<std::uint32_t>(made_.ends.size());
    made_.ends.push_back({low_, high_, state_, stopped_, kNone});
    state_ = addState(node.next, call.state, call.part, end);
    at_ = node.run;
    call_ = call.outer;
    return true;
}

}  // namespace zr::engine
