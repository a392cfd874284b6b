#include "grammar/engine/quick_search.h"

#include <algorithm>
#include <bit>

namespace zr::engine {

QuickSearch::Outcome QuickSearch::run(std::uint16_t rule, std::uint32_t position) {
    if (options_.quickSteps == 0) return Outcome::GaveUp;
    made_.start(rule, position);
    points_.clear();
    low_ = high_ = position;
    at_ = searchedFrom(table_, table_.rules[rule].entry);
    std::uint32_t furthest = position;
    std::uint64_t bound = options_.quickSteps;
    while (!follow()) {
        if (tooDeep_) return Outcome::TooDeep;
        // A way that fails is followed by one that gets further, or there is more wrong.
        if (low_ > furthest) {
            furthest = low_;
            bound = steps_ + options_.quickSteps;
        }
        if (++steps_ > bound || remembered() > options_.maxMemo || !turnBack()) return Outcome::GaveUp;
    }
    if (remembered() > options_.maxMemo) return Outcome::GaveUp;
    made_.end(0, low_, high_);
    return Outcome::Found;
}

/// Goes on until the whole is read, which gives true, or a way fails.
bool QuickSearch::follow() {
    for (;;) {
        const NodeRow& node = table_.nodes[at_];
        switch (node.op) {
            case Op::Choice: {
                std::uint32_t mask = text_.viable(node, low_, high_);
                if (mask == 0) return false;
                const auto branch = static_cast<std::uint32_t>(std::countr_zero(mask));
                mask &= mask - 1;
                if (mask != 0)
                    points_.push_back({low_, high_, mask, part_, depth_,
                                       static_cast<std::uint32_t>(made_.choices.size()),
                                       static_cast<std::uint32_t>(made_.parts.size()), at_});
                take(branch);
                continue;
            }
            case Op::Call:
                if (!call(node)) return false;
                continue;
            case Op::End:
                if (part_ == 0) return high_ == text_.count();
                if (!comeBack()) return false;
                continue;
            default:
                if (!text_.take(node, low_, high_)) return false;
                break;
        }
        at_ = node.run;
    }
}

void QuickSearch::take(std::uint32_t branch) {
    const NodeRow& choice = table_.nodes[at_];
    const std::uint16_t target = table_.targets[table_.choices[choice.arg].firstTarget + branch];
    made_.choices.push_back(target);
    at_ = searchedFrom(table_, target);
}

/// Back to the last choice that has a branch left.
bool QuickSearch::turnBack() {
    if (points_.empty()) return false;
    Point& point = points_.back();
    made_.choices.resize(point.choices);
    made_.parts.resize(point.parts);
    low_ = point.low;
    high_ = point.high;
    part_ = point.part;
    depth_ = point.depth;
    at_ = point.node;
    const auto branch = static_cast<std::uint32_t>(std::countr_zero(point.mask));
    point.mask &= point.mask - 1;
    if (point.mask == 0) points_.pop_back();
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
    tooDeep_ = ++depth_ >= options_.maxDepth;
    if (tooDeep_) return false;
    ++steps_;
    made_.parts.push_back({part_, low_, 0, 0, 0, 0, at_, false});
    part_ = static_cast<std::uint32_t>(made_.parts.size()) - 1;
    at_ = searchedFrom(table_, rule.entry);
    return true;
}

/// The rule at work is over: its caller goes on.
bool QuickSearch::comeBack() {
    const Derivation::Part& part = made_.parts[part_];
    const NodeRow& node = table_.nodes[part.node];
    if (high_ == part.position && (node.flags & kNonEmpty)) return false;
    made_.end(part_, low_, high_);
    at_ = node.run;
    part_ = part.outer;
    --depth_;
    return true;
}

}  // namespace zr::engine
