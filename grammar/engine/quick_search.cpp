#include "grammar/engine/quick_search.h"

#include <algorithm>
#include <bit>

#include "grammar/engine/grow.h"

namespace zr::engine {

std::size_t QuickSearch::Work::capacity() const {
    return points.capacity() * sizeof(Point) + (known ? known->capacity() : 0) +
           callsAt.capacity() * sizeof(std::uint32_t);
}

QuickSearch::Outcome QuickSearch::run(std::uint16_t rule, std::uint32_t position) {
    if (options_.quickSteps == 0) return Outcome::OverBudget;
    rule_ = rule;
    from_ = position;
    goal_ = text_.count();
    start();
    std::uint32_t furthest = position;
    std::uint64_t bound = options_.quickSteps;
    while (!follow<false>() || !isWhole()) {
        if (tooDeep_) return Outcome::TooDeep;
        // A way that fails is followed by one that gets further, or there is more wrong.
        if (place_.low > furthest) {
            furthest = place_.low;
            bound = steps_ + options_.quickSteps;
        }
        if (remembered() > options_.maxMemo) return Outcome::OverBudget;
        if (!turnBack()) return readAgain();
        if (++steps_ > bound) return runRemembering();
    }
    return remembered() > options_.maxMemo ? Outcome::OverBudget : writeEnd();
}

void QuickSearch::start() {
    made_.start(rule_, from_);
    work_.points.clear();
    // A short text takes memory once; a long one may need little of what its length tells.
    constexpr std::uint32_t kShortText = 256;
    work_.points.reserve(std::min(text_.count() - from_, kShortText) + std::size_t{8});
    place_ = {from_, from_, 0, 1, searchedFrom(table_, table_.rules[rule_].entry)};
}

/// Whether a reading gets to its goal; notes where it ends instead.
bool QuickSearch::isWhole() {
    if (place_.high != goal_) {
        end_ = hasEnd_ ? std::max(end_, place_.high) : place_.high;
        hasEnd_ = true;
    }
    return place_.high == goal_;
}

/// Goes on from where the search stands.
QuickSearch::Outcome QuickSearch::runRemembering() {
    const std::uint64_t bound = steps_ + options_.rememberingSteps * (std::uint64_t{text_.count()} + 16);
    if (bound == steps_) return Outcome::OverBudget;
    if (!work_.known) work_.known = std::make_unique<KnownReadings>();
    KnownReadings& known = *work_.known;
    known_ = &known;
    known.start(std::size_t{text_.count()} + 1, made_.parts.size());
    work_.callsAt.assign(work_.points.size(), 0);
    while (!follow<true>() || !isWhole()) {
        if (tooDeep_) return Outcome::TooDeep;
        if (gaveUp_ || known.isManifold() || ++steps_ + known.steps() > bound ||
            remembered() > options_.maxMemo)
            return Outcome::OverBudget;
        if (!turnBackRemembering()) return readAgain();
    }
    return writeEnd();
}

/// No reading gets to the goal, so that is now where one got to that got furthest. What was known of the text
/// still is.
QuickSearch::Outcome QuickSearch::readAgain() {
    if (!hasEnd_) return Outcome::NotFound;
    goal_ = end_;
    start();
    work_.callsAt.clear();
    if (known_ != nullptr) known_->startAgain();
    const bool remembers = known_ != nullptr;
    while (!(remembers ? follow<true>() : follow<false>()) || !isWhole())
        if (gaveUp_ || !(remembers ? turnBackRemembering() : turnBack())) return Outcome::OverBudget;
    return writeEnd();
}

/// What was found is written down to its end.
QuickSearch::Outcome QuickSearch::writeEnd() {
    made_.end(0, place_.low, place_.high);
    giveBack(work_.points);
    if (known_ != nullptr) known_->fillIn(made_);
    return Outcome::Found;
}

/// Goes on until the whole rule is over, which gives true, or a way fails.
template <bool kRemembers>
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
                    goesOn = !kRemembers || visit(here);
                    if (!goesOn) break;
                    addPoint<kRemembers>(here, mask);
                }
                here.node = take(node, branch);
                continue;
            }
            case Op::Call:
                goesOn = call<kRemembers>(here);
                break;
            case Op::End:
                if (here.part == 0) {
                    place_ = here;
                    return true;
                }
                goesOn = comeBack<kRemembers>(here);
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

template <bool kRemembers>
inline void QuickSearch::addPoint(const Place& place, std::uint32_t left) {
    growSlowly(work_.points);
    work_.points.push_back({place, left, static_cast<std::uint32_t>(made_.choices.size()),
                            static_cast<std::uint32_t>(made_.parts.size())});
    if constexpr (kRemembers) work_.callsAt.push_back(known_->calledCount());
}

inline std::uint16_t QuickSearch::take(const NodeRow& choice, std::uint32_t branch) {
    const std::uint16_t taken = branchOf(table_, choice, branch);
    made_.choices.push_back(taken);
    return table_.branches[taken].stop;
}

/// Back to the last choice that has a branch left.
bool QuickSearch::turnBack() {
    if (work_.points.empty()) return false;
    takeAgain(work_.points.back());
    return true;
}

/// Goes back to a choice and takes its next branch.
void QuickSearch::takeAgain(Point& point) {
    goBackTo(point);
    const auto branch = static_cast<std::uint32_t>(std::countr_zero(point.mask));
    point.mask &= point.mask - 1;
    if (point.mask == 0) work_.points.pop_back();
    place_.node = take(table_.nodes[place_.node], branch);
}

void QuickSearch::goBackTo(const Point& point) {
    made_.choices.resize(point.choices);
    made_.parts.resize(point.parts);
    place_ = point.place;
}

template <bool kRemembers>
inline bool QuickSearch::call(Place& place) {
    const NodeRow& node = table_.nodes[place.node];
    if (!text_.settle(place.low, place.high)) return false;
    const RuleRow& rule = table_.rules[node.arg];
    if (!rule.nullable || (node.flags & kNonEmpty)) {
        if (!text_.inSet(table_.firstSetBase + node.arg, text_.classAt(place.low))) return false;
    }
    if (!text_.guarded(node, place.low)) return false;
    if constexpr (kRemembers) {
        const std::uint32_t known = known_->find(node.arg, place.low);
        if (known != KnownReadings::kNone) return useKnown(place, known);
    }
    tooDeep_ = ++place.depth >= options_.maxDepth;
    if (tooDeep_) return false;
    ++steps_;
    const auto part = static_cast<std::uint32_t>(made_.parts.size());
    growSlowly(made_.parts);
    made_.parts.push_back({place.part, place.low, 0, 0, 0, 0, place.node, false});
    if constexpr (kRemembers) {
        known_->add(made_, node.arg, place.depth);
        deepest_ = std::max(deepest_, place.depth);
    }
    place.part = part;
    place.node = searchedFrom(table_, rule.entry);
    return true;
}

/// The rule at work is over: its caller goes on.
template <bool kRemembers>
inline bool QuickSearch::comeBack(Place& place) {
    if constexpr (kRemembers) {
        // Each of many levels can have many ends.
        ++steps_;
        // What its caller does with an end is the same the second time.
        if (!known_->addEnd(made_, place.part, place.low, place.high)) return false;
    }
    const Derivation::Part& part = made_.parts[place.part];
    const NodeRow& node = table_.nodes[part.node];
    if (place.high == part.position && (node.flags & kNonEmpty)) return false;
    made_.end(place.part, place.low, place.high);
    place.node = node.run;
    place.part = part.outer;
    --place.depth;
    return true;
}

// ---- remembering

/// Whether the search stands at a place for the first time; each other time it comes to what it came to then.
bool QuickSearch::visit(const Place& place) {
    constexpr std::uint32_t kOpenBefore = 0x80000000;  // parts from before it began to remember
    const std::uint32_t call = known_->callOf(place.part);
    const std::uint32_t inside = call == KnownReadings::kNone ? kOpenBefore | place.part : call;
    return known_->visit(inside, place.node, place.low, place.high);
}

/// Goes on behind a call whose ends are known, at the first of them.
bool QuickSearch::useKnown(Place& place, std::uint32_t call) {
    const KnownReadings::Called& known = known_->called(call);
    if (known.firstEnd == KnownReadings::kNone) return false;
    // Nobody knows how deep it was in there.
    gaveUp_ = place.depth > known.depth && place.depth - known.depth + deepest_ >= options_.maxDepth;
    if (gaveUp_) return false;
    const std::uint32_t next = known_->end(known.firstEnd).next;
    if (next != KnownReadings::kNone) {
        if (!visit(place)) return false;
        addPoint<true>(place, next);
    }
    return comeBackWith(place, known.firstEnd);
}

/// The same at one of the ends.
bool QuickSearch::comeBackWith(Place& place, std::uint32_t number) {
    const NodeRow& node = table_.nodes[place.node];
    const KnownReadings::End& end = known_->end(number);
    ++steps_;
    if (end.high == place.low && (node.flags & kNonEmpty)) return false;
    known_->use(number, made_, place.part, place.node, place.low);
    place.low = end.low;
    place.high = end.high;
    place.node = node.run;
    return true;
}

bool QuickSearch::turnBackRemembering() {
    while (!work_.points.empty()) {
        Point& point = work_.points.back();
        const std::size_t at = work_.points.size() - 1;
        known_->complete(work_.callsAt[at]);
        if (table_.nodes[point.place.node].op == Op::Choice) {
            takeAgain(point);
            work_.callsAt.resize(work_.points.size());
            return true;
        }
        goBackTo(point);
        const std::uint32_t end = point.mask;
        point.mask = known_->end(end).next;
        if (point.mask == KnownReadings::kNone) work_.points.pop_back();
        work_.callsAt.resize(work_.points.size());
        if (comeBackWith(place_, end)) return true;
    }
    return false;
}

}  // namespace zr::engine
