#include "grammar/engine/quick_search.h"

#include <algorithm>
#include <bit>

#include "grammar/engine/grow.h"

namespace zr::engine {

QuickSearch::Outcome QuickSearch::run(std::uint16_t rule, std::uint32_t position) {
    if (options_.quickSteps == 0) return Outcome::GaveUp;
    made_.start(rule, position);
    points_.clear();
    place_ = {position, position, 0, 1, searchedFrom(table_, table_.rules[rule].entry)};
    std::uint32_t furthest = position;
    std::uint64_t bound = options_.quickSteps;
    while (!follow()) {
        if (tooDeep_) return Outcome::TooDeep;
        // A way that fails is followed by one that gets further, or there is more wrong.
        if (place_.low > furthest) {
            furthest = place_.low;
            bound = steps_ + options_.quickSteps;
        }
        if (++steps_ > bound || remembered() > options_.maxMemo || !turnBack()) return giveUp();
    }
    if (remembered() > options_.maxMemo) return Outcome::GaveUp;
    made_.end(0, place_.low, place_.high);
    return Outcome::Found;
}

QuickSearch::Outcome QuickSearch::giveUp() {
    // The outermost call that starts behind a good part of the text, such as that of a whole condition.
    constexpr std::uint32_t kGoodPart = 4;
    std::uint32_t astray = 0;
    for (std::uint32_t part = place_.part; part != 0; part = made_.parts[part].outer)
        if (made_.parts[part].position >= text_.count() / kGoodPart) astray = part;
    // Up to its first choice there was only one way. In a run of closers a place isn't one position.
    const auto point = std::find_if(points_.begin(), points_.end(), [astray](const Point& each) {
        return each.parts > astray && each.place.low == each.place.high;
    });
    rests_ = astray != 0 && point != points_.end();
    if (rests_) {
        place_ = point->place;
        made_.choices.resize(point->choices);
        made_.parts.resize(point->parts);
    }
    return Outcome::GaveUp;
}

/// Goes on until the whole is read, which gives true, or a way fails.
bool QuickSearch::follow() {
    Place here = place_;
    bool goesOn = true;
    for (;;) {
        const NodeRow& node = table_.nodes[here.node];
        switch (node.op) {
            case Op::Choice: {
                std::uint32_t mask = text_.viable(node, here.low, here.high);
                const auto branch = static_cast<std::uint32_t>(std::countr_zero(mask));
                goesOn = mask != 0;
                if (!goesOn) break;
                mask &= mask - 1;
                if (mask != 0) {
                    growSlowly(points_);
                    points_.push_back({here, mask, static_cast<std::uint32_t>(made_.choices.size()),
                                       static_cast<std::uint32_t>(made_.parts.size())});
                }
                here.node = take(node, branch);
                continue;
            }
            case Op::Call:
                goesOn = call(here);
                break;
            case Op::End:
                if (here.part == 0) {
                    place_ = here;
                    return here.high == text_.count();
                }
                goesOn = comeBack(here);
                break;
            default:
                goesOn = text_.take(node, here.low, here.high);
                here.node = node.run;
                break;
        }
        if (!goesOn) break;
    }
    place_ = here;
    return false;
}

inline std::uint16_t QuickSearch::take(const NodeRow& choice, std::uint32_t branch) {
    const std::uint16_t taken = branchOf(table_, choice, branch);
    made_.choices.push_back(taken);
    return table_.branches[taken].stop;
}

/// Back to the last choice that has a branch left.
bool QuickSearch::turnBack() {
    if (points_.empty()) return false;
    Point& point = points_.back();
    made_.choices.resize(point.choices);
    made_.parts.resize(point.parts);
    place_ = point.place;
    const auto branch = static_cast<std::uint32_t>(std::countr_zero(point.mask));
    point.mask &= point.mask - 1;
    if (point.mask == 0) points_.pop_back();
    place_.node = take(table_.nodes[place_.node], branch);
    return true;
}

inline bool QuickSearch::call(Place& place) {
    const NodeRow& node = table_.nodes[place.node];
    if (!text_.settle(place.low, place.high)) return false;
    const RuleRow& rule = table_.rules[node.arg];
    if (!rule.nullable || (node.flags & kNonEmpty)) {
        if (!text_.inSet(table_.firstSetBase + node.arg, text_.classAt(place.low))) return false;
    }
    if (!text_.guarded(node, place.low)) return false;
    tooDeep_ = ++place.depth >= options_.maxDepth;
    if (tooDeep_) return false;
    ++steps_;
    const auto part = static_cast<std::uint32_t>(made_.parts.size());
    growSlowly(made_.parts);
    made_.parts.push_back({place.part, place.low, 0, 0, 0, 0, place.node, false});
    place.part = part;
    place.node = searchedFrom(table_, rule.entry);
    return true;
}

/// The rule at work is over: its caller goes on.
inline bool QuickSearch::comeBack(Place& place) {
    const Derivation::Part& part = made_.parts[place.part];
    const NodeRow& node = table_.nodes[part.node];
    if (place.high == part.position && (node.flags & kNonEmpty)) return false;
    made_.end(place.part, place.low, place.high);
    place.node = node.run;
    place.part = part.outer;
    --place.depth;
    return true;
}

}  // namespace zr::engine
