#include "grammar/engine/quick_search.h"

#include <algorithm>

#include "grammar/engine/grow.h"
#include "grammar/engine/outline.h"

namespace zr::engine {

std::size_t QuickSearch::Work::capacity() const {
    return points.capacity() * sizeof(OpenChoice) + (remembering ? remembering->capacity() : 0);
}

QuickSearch::Outcome QuickSearch::run(std::uint16_t rule, std::uint32_t position) {
    if (options_.quickSteps == 0) return Outcome::OverBudget;
    end_.goal = text_.count();
    isOutlined_ = rule != table_.statementRule || position != 0;
    std::uint32_t furthest = 0;
    std::uint64_t bound = 0;
    const auto begin = [&] {
        start(rule, position);
        furthest = position;
        bound = steps_ + options_.quickSteps;
    };
    begin();
    while (!findsEnd()) {
        if (tooDeep_) return Outcome::TooDeep;
        if (end_.hasFurthest && !isOutlined_) {
            // The first reading of a whole statement ends ahead of the text: often no other gets further.
            outline();
            if (place_.high == end_.goal) break;
        }
        // A way that fails is followed by one that gets further, or there is more wrong.
        if (place_.low > furthest) {
            furthest = place_.low;
            bound = steps_ + options_.quickSteps;
        }
        if (remembered() > options_.maxMemo) return Outcome::OverBudget;
        if (!turnBack()) {
            // No reading gets to the goal, so that is now where one got to that got furthest.
            if (!end_.hasFurthest) return Outcome::NotFound;
            end_.goal = end_.furthest;
            begin();
        } else if (++steps_ > bound) {
            if (!outline()) return Outcome::NotFound;
            if (end_.goal == text_.count()) return remember();
            // What can't belong to the statement leads nobody astray once it is cut off.
            text_.cutAt(end_.goal);
            begin();
        }
    }
    return remembered() > options_.maxMemo ? Outcome::OverBudget : writeEnd();
}

void QuickSearch::start(std::uint16_t rule, std::uint32_t position) {
    made_.start(rule, position);
    work_.points.clear();
    // A short text takes memory once; a long one may need little of what its length tells.
    constexpr std::uint32_t kShortText = 256;
    work_.points.reserve(std::min(text_.count() - position, kShortText) + std::size_t{8});
    place_ = {position, position, 0, 1, searchedFrom(table_, table_.rules[rule].entry)};
}

/// Looks where the statement can end at most; false where nothing can be one.
bool QuickSearch::outline() {
    if (isOutlined_) return true;
    isOutlined_ = true;
    const std::uint32_t end = furthestEndByOutline(table_, text_);
    if (end == TextIndex::kNone) return false;
    end_.goal = end;
    return true;
}

bool QuickSearch::findsEnd() {
    return follow(*this, place_) && end_.isGoal(place_.high);
}

/// Back to the last choice that has a branch left, and on to that.
bool QuickSearch::turnBack() {
    if (work_.points.empty()) return false;
    OpenChoice& point = work_.points.back();
    place_ = point.backIn(made_);
    const NodeRow& node = table_.nodes[place_.node];
    place_.node = take(node, takeFirst(point.branches));
    if (point.branches == 0) work_.points.pop_back();
    return true;
}

/// A search that remembers takes over.
QuickSearch::Outcome QuickSearch::remember() {
    if (!work_.remembering) work_.remembering = std::make_unique<RememberingSearch::Work>();
    RememberingSearch further(table_, text_, options_, made_, *work_.remembering);
    const Outcome outcome = further.run(place_, work_.points, end_);
    steps_ += further.steps();
    rememberedFurther_ = further.remembered();
    giveBack(work_.points);
    return outcome;
}

/// What was found is written down to its end.
QuickSearch::Outcome QuickSearch::writeEnd() {
    made_.end(0, place_.low, place_.high);
    giveBack(work_.points);
    return Outcome::Found;
}

// ---- along a reading

inline bool QuickSearch::choose(Place& place, const NodeRow& node, std::uint32_t branches) {
    const std::uint32_t branch = takeFirst(branches);
    if (branches != 0) {
        growSlowly(work_.points);
        work_.points.push_back({place, branches, static_cast<std::uint32_t>(made_.choices.size()),
                                static_cast<std::uint32_t>(made_.parts.size())});
    }
    place.node = take(node, branch);
    return true;
}

inline std::uint16_t QuickSearch::take(const NodeRow& choice, std::uint32_t branch) {
    const std::uint16_t taken = branchOf(table_, choice, branch);
    made_.choices.push_back(taken);
    return table_.branches[taken].stop;
}

inline bool QuickSearch::call(Place& place, const NodeRow& node) {
    tooDeep_ = ++place.depth >= options_.maxDepth;
    if (tooDeep_) return false;
    ++steps_;
    const auto part = static_cast<std::uint32_t>(made_.parts.size());
    growSlowly(made_.parts);
    made_.parts.push_back({place.part, place.low, 0, 0, 0, 0, place.node, false});
    place.part = part;
    place.node = searchedFrom(table_, table_.rules[node.arg].entry);
    return true;
}

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
