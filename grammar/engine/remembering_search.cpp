#include "grammar/engine/remembering_search.h"

#include <algorithm>

#include "grammar/engine/grow.h"

namespace zr::engine {

SearchOutcome RememberingSearch::run(const OpenChoice::Place& place, std::vector<OpenChoice>& older,
                                     ReadingEnd& end) {
    if (options_.rememberingSteps == 0) return SearchOutcome::OverBudget;
    known_.start(std::size_t{text_.count()} + 1);
    points_.clear();
    goOnAt(place);
    const SearchOutcome outcome = find(older, end);
    remembered_ = remembers(older);
    giveBack(points_);
    if (outcome == SearchOutcome::Found) {
        known_.write(place_.last, olderPart_, made_);
        made_.end(0, place_.low, place_.high);
    }
    return outcome;
}

/// Stands where a search that remembers nothing stood.
void RememberingSearch::goOnAt(const OpenChoice::Place& place) {
    olderPart_ = place.part;
    place_ = {place.low, place.high, kOlder | place.part, KnownReadings::kNone, place.depth, place.node};
}

SearchOutcome RememberingSearch::find(std::vector<OpenChoice>& older, ReadingEnd& end) {
    // To add up what it remembers costs as much as a turn.
    constexpr std::uint32_t kTurnsACheck = 32;
    const std::uint64_t bound = options_.rememberingSteps * (std::uint64_t{text_.count()} + 16);
    for (std::uint32_t turn = 0; !follow(*this, place_) || !end.isGoal(place_.high); ++turn) {
        if (tooDeep_) return SearchOutcome::TooDeep;
        if (gaveUp_ || known_.isManifold() || ++steps_ + known_.steps() > bound ||
            (turn % kTurnsACheck == 0 && remembers(older) > options_.maxMemo))
            return SearchOutcome::OverBudget;
        if (!turnBack(older) && !readAgain(end)) return SearchOutcome::NotFound;
    }
    return SearchOutcome::Found;
}

std::size_t RememberingSearch::remembers(const std::vector<OpenChoice>& older) const {
    return made_.parts.size() + made_.choices.size() / 16 + older.size() + points_.size() +
           known_.bytes() / kMemoBytes;
}

/// No reading gets to the goal, so that is now where one got to that got furthest. What was known of the text
/// still is.
bool RememberingSearch::readAgain(ReadingEnd& end) {
    if (!end.hasFurthest) return false;
    end.goal = end.furthest;
    const std::uint32_t from = made_.parts[0].position;
    made_.start(made_.rule, from);
    known_.startAgain();
    goOnAt({from, from, 0, 1, searchedFrom(table_, table_.rules[made_.rule].entry)});
    return true;
}

/// Back to the last choice that has something left, and on to that.
bool RememberingSearch::turnBack(std::vector<OpenChoice>& older) {
    while (!points_.empty()) {
        Point& point = points_.back();
        known_.complete(point.calls);
        place_ = point.place;
        const NodeRow& node = table_.nodes[place_.node];
        if (node.op != Op::Choice) {
            if (takeNextEnd()) return true;
            continue;
        }
        takeBranch(place_, node, takeFirst(point.left));
        if (point.left == 0) points_.pop_back();
        return true;
    }
    known_.complete(0);
    if (older.empty()) return false;
    OpenChoice& point = older.back();
    goOnAt(point.backIn(made_));
    takeBranch(place_, table_.nodes[place_.node], takeFirst(point.branches));
    if (point.branches == 0) older.pop_back();
    return true;
}

/// On to the next end of a call that is known.
bool RememberingSearch::takeNextEnd() {
    Point& point = points_.back();
    const std::uint32_t end = point.left;
    point.left = known_.end(end).next;
    if (point.left == KnownReadings::kNone) points_.pop_back();
    return comeBackWith(place_, end);
}

inline void RememberingSearch::takeBranch(Place& place, const NodeRow& choice, std::uint32_t branch) {
    const std::uint16_t taken = branchOf(table_, choice, branch);
    place.last = known_.addChoice(place.last, taken);
    place.node = table_.branches[taken].stop;
}

// ---- along a reading

inline bool RememberingSearch::choose(Place& place, const NodeRow& node, std::uint32_t branches) {
    const std::uint32_t branch = takeFirst(branches);
    if (branches != 0) {
        // Each other time it comes to what it came to the first time.
        if (!known_.visit(place.atWork, place.node, place.low, place.high)) return false;
        points_.push_back({place, branches, known_.calledCount()});
    }
    takeBranch(place, node, branch);
    return true;
}

inline bool RememberingSearch::call(Place& place, const NodeRow& node) {
    const std::uint32_t known = known_.find(node.arg, place.low);
    if (known != KnownReadings::kNone) return useKnown(place, known);
    tooDeep_ = ++place.depth >= options_.maxDepth;
    if (tooDeep_) return false;
    ++steps_;
    deepest_ = std::max(deepest_, place.depth);
    place.atWork = known_.add(node.arg, place.low, {place.atWork, place.last, place.node}, place.depth);
    place.last = KnownReadings::kNone;
    place.node = searchedFrom(table_, table_.rules[node.arg].entry);
    return true;
}

/// The rule at work is over: its caller goes on. What that does with an end is the same the second time.
inline bool RememberingSearch::comeBack(Place& place) {
    // Each of many levels can have many ends.
    ++steps_;
    const bool isOlder = (place.atWork & kOlder) != 0;
    if (isOlder) {
        if (!known_.visit(place.atWork, place.node, place.low, place.high)) return false;
        const Derivation::Part& part = made_.parts[place.atWork & ~kOlder];
        const NodeRow& node = table_.nodes[part.node];
        if (place.high == part.position && (node.flags & kNonEmpty)) return false;
        place.last = known_.addEndOfOlder(place.last, place.low, place.high);
        place.atWork = kOlder | part.outer;
        place.node = node.run;
    } else {
        const std::uint32_t end = known_.addEnd(place.atWork, place.low, place.high, place.last);
        if (end == KnownReadings::kNone) return false;
        const KnownReadings::Called& called = known_.called(place.atWork);
        const NodeRow& node = table_.nodes[called.caller.node];
        if (place.high == called.position && (node.flags & kNonEmpty)) return false;
        place.last = known_.addCall(called.caller.last, end, called.caller.node);
        place.atWork = called.caller.atWork;
        place.node = node.run;
    }
    --place.depth;
    return true;
}

/// Goes on behind a call whose ends are known, at the first of them.
bool RememberingSearch::useKnown(Place& place, std::uint32_t call) {
    const KnownReadings::Called& known = known_.called(call);
    if (known.firstEnd == KnownReadings::kNone) return false;
    // Nobody knows how deep it was in there.
    gaveUp_ = place.depth > known.depth && place.depth - known.depth + deepest_ >= options_.maxDepth;
    if (gaveUp_) return false;
    const std::uint32_t next = known_.end(known.firstEnd).next;
    if (next != KnownReadings::kNone) {
        if (!known_.visit(place.atWork, place.node, place.low, place.high)) return false;
        points_.push_back({place, next, known_.calledCount()});
    }
    return comeBackWith(place, known.firstEnd);
}

/// The same at one of the ends.
bool RememberingSearch::comeBackWith(Place& place, std::uint32_t number) {
    const NodeRow& node = table_.nodes[place.node];
    const KnownReadings::End& end = known_.end(number);
    ++steps_;
    if (end.high == place.low && (node.flags & kNonEmpty)) return false;
    place.last = known_.addCall(place.last, number, place.node);
    place.low = end.low;
    place.high = end.high;
    place.node = node.run;
    return true;
}

}  // namespace zr::engine
