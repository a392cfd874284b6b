#include "grammar/engine/full_search.h"

#include <algorithm>
#include <bit>

namespace zr::engine {
namespace {

constexpr std::size_t kFirstMemo = 1024;

/// Places that no more than two tail loops stopped at have a bit of their own each.
constexpr std::size_t kPlainStops = 4;

/// Of a mask that isn't empty.
bool isSingle(std::uint32_t mask) {
    return (mask & (mask - 1)) == 0;
}

}  // namespace

FullSearch::FullSearch(const ParserTable& table, TextIndex& text, const Options& options,
                       const Recovery& recovery)
    : table_(table), text_(text), options_(options), recovery_(recovery) {}

FullSearch::Outcome FullSearch::run(std::uint16_t rule, std::uint32_t position) {
    entriesAt_.assign(text_.count() + 1, kNone);
    const std::uint32_t root = entryFor(rule, position);
    const Outcome outcome = findEnds(root);
    if (outcome != Outcome::Found) return outcome;
    if (entries_[root].ends.count == 0) return Outcome::NotFound;
    writeDown(root);
    return Outcome::Found;
}

std::uint32_t FullSearch::entryAt(std::uint16_t rule, std::uint32_t position) const {
    for (std::uint32_t i = entriesAt_[position]; i != kNone; i = entries_[i].nextHere)
        if (entries_[i].rule == rule) return i;
    return kNone;
}

std::uint32_t FullSearch::entryFor(std::uint16_t rule, std::uint32_t position) {
    const std::uint32_t known = entryAt(rule, position);
    if (known != kNone) return known;
    Entry entry;
    entry.position = position;
    entry.rule = rule;
    entry.nextHere = entriesAt_[position];
    entriesAt_[position] = static_cast<std::uint32_t>(entries_.size());
    entries_.push_back(entry);
    return entriesAt_[position];
}

FullSearch::Memo& FullSearch::memo(std::uint32_t owner, const Item& item) {
    const auto hash = [](std::uint32_t by, const Item& of) {
        std::uint64_t h = (static_cast<std::uint64_t>(by) << 32 | of.place.low) * 0x9E3779B97F4A7C15u;
        h = (h ^ (h >> 31) ^ of.node ^ (static_cast<std::uint64_t>(of.place.high) << 16)) *
            0xBF58476D1CE4E5B9u;
        return static_cast<std::size_t>(h ^ (h >> 29) ^ of.place.stopped);
    };
    const auto slotOf = [&](std::uint32_t by, const Item& of) {
        for (std::size_t slot = hash(by, of) & (memo_.size() - 1);; slot = (slot + 1) & (memo_.size() - 1)) {
            const Memo& m = memo_[slot];
            if (m.owner == kNone || (m.owner == by && m.item.node == of.node && m.item.place == of.place))
                return slot;
        }
    };
    if (memoUsed_ * 2 >= memo_.size()) {
        const std::vector<Memo> old = std::move(memo_);
        memo_.assign(std::max(kFirstMemo, old.size() * 2), {kNone, {}, Memo::Unknown});
        for (const Memo& m : old)
            if (m.owner != kNone) memo_[slotOf(m.owner, m.item)] = m;
    }
    Memo& found = memo_[slotOf(owner, item)];
    if (found.owner == kNone) {
        ++memoUsed_;
        found = {owner, item, Memo::Unknown};
    }
    return found;
}

bool FullSearch::entersOnce(std::uint32_t entry, const Item& item) {
    Memo& known = memo(entry, item);
    if (known.value == Memo::Yes) return false;
    known.value = Memo::Yes;
    return true;
}

std::uint16_t FullSearch::target(const NodeRow& choice, std::uint32_t branch) const {
    return table_.targets[table_.choices[choice.arg].firstTarget + branch];
}

/// Moves the place past what a node takes that isn't a choice nor a call.
bool FullSearch::take(const NodeRow& node, Place& place) const {
    const std::uint32_t run = text_.runEnd(place.low);
    switch (node.op) {
        case Op::Token:
        case Op::Set:
            if (!text_.settle(place.low, place.high) || place.low >= text_.count()) return false;
            if (node.op == Op::Token ? text_.type(place.low) != node.arg
                                     : !text_.inSet(node.arg, text_.classAt(place.low)))
                return false;
            place.high = ++place.low;
            place.stopped = 0;
            return true;
        case Op::Hard:
            if (place.low == run) return false;
            ++place.low;
            place.high = std::min(place.high + 1, run);
            place.stopped = 0;
            return true;
        case Op::Soft:
            place.high = std::min(place.high + 1, run);
            return true;
        case Op::SoftStar:
            place.high = run;
            return true;
        default:
            return true;
    }
}

std::uint32_t FullSearch::branchMask(std::uint32_t entry, const Item& item) const {
    const NodeRow& node = table_.nodes[item.node];
    // The part that recovery replaces starts with none of its tokens: look at every way to it.
    std::uint32_t mask =
        isStart(entry) ? static_cast<std::uint32_t>((std::uint64_t{1} << table_.choices[node.arg].count) - 1)
                       : text_.viable(node, item.place.low, item.place.high);
    if ((node.flags & kLoop) && ((item.place.stopped >> node.context) & 1)) mask &= ~1u;
    return mask;
}

FullSearch::Item FullSearch::afterBranch(const Item& item, std::uint32_t branch) const {
    const NodeRow& node = table_.nodes[item.node];
    Item next{item.place, searchedFrom(table_, target(node, branch))};
    next.place.stopped =
        text_.stoppedAfter(node, branch, item.place.low, item.place.high, item.place.stopped);
    return next;
}

/// Whether the call is worth its entry; settles where it starts.
bool FullSearch::mayCall(std::uint32_t entry, Item& item) {
    const NodeRow& node = table_.nodes[item.node];
    Place& place = item.place;
    if (node.arg == table_.recoverRule && isStart(entry)) {
        // Parentheses that are left over are among what recovery skips.
        place.low = place.high;
        if (askedAt_ == kNone || place.low > askedAt_) askedAt_ = place.low;
        return true;
    }
    if (!text_.settle(place.low, place.high)) return false;
    const bool mayBeEmpty = table_.rules[node.arg].nullable && !(node.flags & kNonEmpty);
    if (!mayBeEmpty) {
        if (!text_.inSet(table_.firstSetBase + node.arg, text_.classAt(place.low))) return false;
        if (!recovery_.on && !text_.secondFits(node.arg, place.low)) return false;
    }
    return text_.guarded(node, place.low);
}

/// Whether what stands behind a call could take the next token. Where it couldn't, neither closers nor tail
/// loops do anything on the way to the rule's end, if there is one.
bool FullSearch::goesOn(std::uint32_t entry, const NodeRow& call, const Place& place) const {
    if (isStart(entry)) return true;
    const std::uint32_t any = table_.contextSets[call.context * (table_.loopCount + 1u) + table_.loopCount];
    if (place.low == place.high) return text_.inSet(any, text_.classAt(place.low));
    return text_.inSet(any, table_.classOf[table_.closer]) ||
           (place.high == text_.runEnd(place.low) && text_.inSet(any, text_.classAt(place.high)));
}

FullSearch::Rest FullSearch::restBehind(const NodeRow& call) {
    if (!(table_.contextFlags[call.context] & 1)) return Rest::Open;
    if (rests_.size() <= call.run) rests_.resize(call.run + 1u, Rest::Unknown);
    if (rests_[call.run] != Rest::Unknown) return rests_[call.run];
    std::vector<std::uint16_t> work{call.run}, seen;
    Rest rest = Rest::Plain;
    while (!work.empty()) {
        const std::uint16_t at = work.back();
        work.pop_back();
        if (std::find(seen.begin(), seen.end(), at) != seen.end()) continue;
        seen.push_back(at);
        const NodeRow& node = table_.nodes[at];
        if (node.op == Op::Soft || node.op == Op::SoftStar || node.op == Op::Call) rest = Rest::Other;
        if (node.op != Op::Choice) continue;
        if (node.context != kNone16) rest = Rest::Other;
        // A call is only in the way of an end when its rule may be empty.
        for (std::uint32_t i = 0; i < table_.choices[node.arg].count; ++i) {
            const std::uint16_t next = searchedFrom(table_, target(node, i));
            const NodeRow& row = table_.nodes[next];
            if (row.op != Op::Call || (table_.rules[row.arg].nullable && !(row.flags & kNonEmpty)))
                work.push_back(next);
        }
    }
    return rests_[call.run] = rest;
}

/// Where an entry goes on from an end of a call, if that end counts.
bool FullSearch::comesBack(const Item& call, const Entry& called, const Place& end, Item& next) const {
    const NodeRow& node = table_.nodes[call.node];
    next = {end, node.run};
    if (end.high != called.position) return true;
    next.place.stopped = call.place.stopped;
    return !(node.flags & kNonEmpty);
}

/// An end as those around the entry see it. How many closers were taken already only matters to those who
/// must take one, each for a parenthesis that it opened before the entry: while as many are left, ends are
/// alike.
FullSearch::Place FullSearch::endOf(std::uint32_t entry, Place place) {
    if (place.low == place.high) return place;
    const std::uint32_t run = text_.runEnd(place.low), needed = text_.closersOwedAt(entries_[entry].position);
    if (run - place.low > needed) place.low = std::min(place.high, run - needed);
    return place;
}

// ---- the sets of ends

FullSearch::Outcome FullSearch::findEnds(std::uint32_t root) {
    const std::uint64_t budget = options_.fullBaseSteps + options_.fullStepsPerToken * text_.count();
    const auto start = [&](std::uint32_t entry) {
        works_.push_back({entry, static_cast<std::uint32_t>(items_.size()),
                          static_cast<std::uint32_t>(ends_.size()),
                          static_cast<std::uint32_t>(slices_.size()),
                          static_cast<std::uint32_t>(arrivals_.size()), false});
        const std::uint32_t position = entries_[entry].position;
        items_.push_back(
            {{position, position, 0}, searchedFrom(table_, table_.rules[entries_[entry].rule].entry)});
    };
    start(root);
    while (!works_.empty()) {
        Work& work = works_.back();
        if (items_.size() == work.items) {
            finishEntry(work);
            works_.pop_back();
            continue;
        }
        const Item item = items_.back();
        items_.pop_back();
        std::uint32_t child = kNone;
        work.waiting = follow(work.entry, item, work.waiting, child);
        if (work.waiting) {
            if (works_.size() >= options_.maxDepth) return Outcome::TooDeep;
            start(child);
        }
        if (steps_ > budget || remembered() > options_.maxMemo) return Outcome::OverBudget;
    }
    return Outcome::Found;
}

/// Follows one path until it ends, fails, or comes to a call whose ends aren't known; such a call is put back
/// and named. `returned` says that the item is such a call and its ends are known now.
bool FullSearch::follow(std::uint32_t entry, Item item, bool returned, std::uint32_t& child) {
    ++steps_;
    for (;; returned = false) {
        const NodeRow& node = table_.nodes[item.node];
        switch (node.op) {
            case Op::Choice: {
                std::uint32_t mask = branchMask(entry, item);
                if (mask == 0) return false;
                if ((node.flags & kMerge) && !isSingle(mask) && !entersOnce(entry, item)) return false;
                const Item first = afterBranch(item, static_cast<std::uint32_t>(std::countr_zero(mask)));
                for (mask &= mask - 1; mask != 0; mask &= mask - 1)
                    items_.push_back(afterBranch(item, static_cast<std::uint32_t>(std::countr_zero(mask))));
                item = first;
                continue;
            }
            case Op::Call: {
                if (!mayCall(entry, item)) return false;
                if ((node.flags & kMerge) && !returned && !entersOnce(entry, item)) return false;
                const std::uint32_t called = entryFor(node.arg, item.place.low);
                if (!entries_[called].done) {
                    entries_[called].mayRecover =
                        node.arg == table_.recoverRule && isStart(entry) && item.place.low == recovery_.place;
                    items_.push_back(item);
                    child = called;
                    return true;
                }
                spread(entry, item, entries_[called]);
                return false;
            }
            case Op::End:
                ends_.push_back(endOf(entry, item.place));
                return false;
            default:
                if (!take(node, item.place)) return false;
                break;
        }
        item.node = node.run;
    }
}

/// Goes on from all ends of a call.
void FullSearch::spread(std::uint32_t entry, const Item& call, const Entry& called) {
    constexpr std::uint32_t kMany = 8;
    const NodeRow& node = table_.nodes[call.node];
    const Slice ends = called.ends;
    const Rest rest = restBehind(node);
    // Ends that are also ends of this entry go there all at once.
    const bool passOn = rest == Rest::Plain && ends.count != 0 && pool_[ends.first].high != called.position;
    if (passOn) slices_.push_back(ends);
    Arrivals* arrivals = ends.count >= kMany ? &arrivalsAt(node.run, entries_[entry].position) : nullptr;
    steps_ += ends.count / 32;
    Item next{};
    for (std::uint32_t i = ends.first; i < ends.first + ends.count; ++i) {
        if (!comesBack(call, called, pool_[i], next)) continue;
        const Place& place = next.place;
        if (arrivals && place.low == place.high && place.stopped < kPlainStops) {
            const std::size_t bit = (place.low - arrivals->from) * kPlainStops + place.stopped;
            std::uint64_t& word = arrivals->bits[bit / 64];
            if ((word >> (bit % 64)) & 1) continue;
            word |= std::uint64_t{1} << (bit % 64);
        }
        if (goesOn(entry, node, place))
            items_.push_back(next);
        else if (rest == Rest::Other || (rest == Rest::Plain && !passOn))
            ends_.push_back(endOf(entry, place));
    }
}

FullSearch::Arrivals& FullSearch::arrivalsAt(std::uint16_t node, std::uint32_t from) {
    for (std::size_t i = works_.back().arrivals; i < arrivals_.size(); ++i)
        if (arrivals_[i].node == node) return arrivals_[i];
    arrivals_.push_back({node, from, {}});
    arrivals_.back().bits.resize((text_.count() - from + 1) / 16 + 1);
    arrivalWords_ += arrivals_.back().bits.size();
    return arrivals_.back();
}

void FullSearch::finishEntry(const Work& work) {
    Entry& entry = entries_[work.entry];
    const auto sortFrom = [&](std::uint32_t base) {
        const auto from = ends_.begin() + base;
        std::sort(from, ends_.end());
        ends_.erase(std::unique(from, ends_.end()), ends_.end());
    };
    sortFrom(work.ends);
    const auto slices = slices_.begin() + work.slices;
    const auto in = [&](const Slice& s) { return pool_.begin() + s.first; };
    bool shared = slices != slices_.end();
    for (auto s = slices; shared && s != slices_.end(); ++s) shared = *s == *slices;
    shared =
        shared &&
        std::includes(in(*slices), in(*slices) + slices->count, ends_.begin() + work.ends, ends_.end()) &&
        std::all_of(in(*slices), in(*slices) + slices->count,
                    [&](const Place& p) { return endOf(work.entry, p) == p; });
    if (shared) {
        entry.ends = *slices;
    } else {
        gather(work);
        sortFrom(work.ends);
        entry.ends = {static_cast<std::uint32_t>(pool_.size()),
                      static_cast<std::uint32_t>(ends_.size()) - work.ends};
        pool_.insert(pool_.end(), ends_.begin() + work.ends, ends_.end());
    }
    ends_.resize(work.ends);
    slices_.resize(work.slices);
    for (; arrivals_.size() > work.arrivals; arrivals_.pop_back())
        arrivalWords_ -= arrivals_.back().bits.size();
    if (entry.mayRecover && entry.ends.count == 0) recover(entry);
    entry.done = true;
}

/// Puts the ends that an entry has from its calls with those that it has by itself. Calls at many places
/// share most of their ends, so plain ones are marked by position and not sorted.
void FullSearch::gather(const Work& work) {
    const std::uint32_t from = entries_[work.entry].position;
    marks_.assign((text_.count() - from + 1) / 16 + 1, 0);
    for (std::size_t s = work.slices; s < slices_.size(); ++s) {
        if (s != work.slices && slices_[s] == slices_[s - 1]) continue;
        steps_ += slices_[s].count / 32;
        for (std::uint32_t i = 0; i < slices_[s].count; ++i) {
            const Place place = endOf(work.entry, pool_[slices_[s].first + i]);
            if (place.low != place.high || place.stopped >= kPlainStops) {
                ends_.push_back(place);
                continue;
            }
            const std::size_t bit = (place.low - from) * kPlainStops + place.stopped;
            marks_[bit / 64] |= std::uint64_t{1} << (bit % 64);
        }
    }
    for (std::size_t word = 0; word < marks_.size(); ++word)
        for (std::uint64_t left = marks_[word]; left != 0; left &= left - 1) {
            const std::size_t bit = word * 64 + static_cast<std::size_t>(std::countr_zero(left));
            const auto position = static_cast<std::uint32_t>(from + bit / kPlainStops);
            ends_.push_back({position, position, static_cast<std::uint8_t>(bit % kPlainStops)});
        }
}

/// The recover rule had no derivation: it stands for the tokens up to the first that can follow it at the
/// same parenthesis depth.
void FullSearch::recover(Entry& entry) {
    const std::uint32_t at = skippedTo(table_, text_, entry.position);
    if (at > text_.count()) return;
    entry.recovered = true;
    entry.ends = {static_cast<std::uint32_t>(pool_.size()), 1};
    pool_.push_back({at, at, 0});
}

// ---- the walk down

void FullSearch::writeDown(std::uint32_t root) {
    memo_.clear();
    memoUsed_ = 0;
    const Slice ends = entries_[root].ends;
    reached_ = pool_[ends.first + ends.count - 1].high;
    for (std::uint32_t i = 0; i < ends.count; ++i)
        if (pool_[ends.first + i].high == reached_) wanted_.push_back(pool_[ends.first + i]);
    startWalk(root, {0, static_cast<std::uint32_t>(wanted_.size())});
    while (!walks_.empty()) {
        if (!walkOn(walks_.size() - 1)) continue;
        const Walk ended = walks_.back();
        walks_.pop_back();
        wanted_.resize(ended.wanted.first);
        if (walks_.empty())
            derivation_.endState = ended.state;
        else
            comeBack(walks_.back(), ended.part, endOf(ended.entry, ended.at.place), ended.state);
    }
}

void FullSearch::startWalk(std::uint32_t entry, Slice wanted) {
    const Entry& e = entries_[entry];
    const auto part = static_cast<std::uint32_t>(derivation_.parts.size());
    derivation_.parts.push_back({e.rule, e.position, false});
    const std::uint16_t first = table_.rules[e.rule].entry;
    const Place place{e.position, e.position, 0};
    const std::uint32_t state = addState(first, place, kNone, kNone, kNone);
    walks_.push_back({entry, part, wanted, {place, searchedFrom(table_, first)}, state, memos_++});
}

std::uint32_t FullSearch::addState(std::uint16_t node, const Place& place, std::uint32_t before,
                                   std::uint32_t part, std::uint32_t end) {
    derivation_.states.push_back({place.low, place.high, before, part, end, node});
    return static_cast<std::uint32_t>(derivation_.states.size()) - 1;
}

/// The call that a walk stands at has read as far as `end`.
void FullSearch::comeBack(Walk& walk, std::uint32_t part, const Place& end, std::uint32_t state) {
    const NodeRow& call = table_.nodes[walk.at.node];
    const auto made = static_cast<std::uint32_t>(derivation_.ends.size());
    derivation_.ends.push_back({end.low, end.high, state, end.stopped, kNone});
    walk.state = addState(call.next, end, walk.state, part, made);
    Item next{};
    comesBack(walk.at, entries_[entryAt(call.arg, walk.at.place.low)], end, next);
    walk.at = next;
}

/// Goes on until the path ends, which gives true, or needs the path of a call first.
bool FullSearch::walkOn(std::size_t index) {
    for (;;) {
        Walk& walk = walks_[index];
        const NodeRow& node = table_.nodes[walk.at.node];
        ++steps_;
        switch (node.op) {
            case Op::End:
                return true;
            case Op::Choice: {
                std::uint32_t mask = branchMask(walk.entry, walk.at);
                // One of them leads on, or nobody had come here.
                while (!isSingle(mask) && !leadsOn(walk, afterBranch(walk.at, static_cast<std::uint32_t>(
                                                                                  std::countr_zero(mask)))))
                    mask &= mask - 1;
                const auto taken = static_cast<std::uint32_t>(std::countr_zero(mask));
                walk.state = addState(target(node, taken), walk.at.place, walk.state, kNone, kNone);
                walk.at = afterBranch(walk.at, taken);
                break;
            }
            case Op::Call: {
                mayCall(walk.entry, walk.at);
                const std::uint32_t called = entryAt(node.arg, walk.at.place.low);
                const auto base = static_cast<std::uint32_t>(wanted_.size());
                Item next{};
                for (std::uint32_t i = 0; i < branchCount(walk.at); ++i)
                    if (branch(walk, walk.at, i, next) && leadsOn(walk, next))
                        wanted_.push_back(pool_[entries_[called].ends.first + i]);
                if (entries_[called].recovered) {
                    const auto part = static_cast<std::uint32_t>(derivation_.parts.size());
                    derivation_.parts.push_back({node.arg, walk.at.place.low, true});
                    const Place end = wanted_.back();
                    wanted_.resize(base);
                    comeBack(walk, part, end, kNone);
                    break;
                }
                startWalk(called, {base, static_cast<std::uint32_t>(wanted_.size()) - base});
                return false;
            }
            default:
                take(node, walk.at.place);
                walk.at.node = node.run;
                break;
        }
    }
}

bool FullSearch::isWanted(const Walk& walk, const Place& place) {
    const auto first = wanted_.begin() + walk.wanted.first;
    return std::binary_search(first, first + walk.wanted.count, endOf(walk.entry, place));
}

/// The number of ways on from an item that there is a choice at.
std::uint32_t FullSearch::branchCount(const Item& item) const {
    const NodeRow& node = table_.nodes[item.node];
    if (node.op == Op::Choice) return table_.choices[node.arg].count;
    const std::uint32_t called = entryAt(node.arg, item.place.low);
    // What the search for ends didn't call can't lead anywhere.
    return called == kNone || !entries_[called].done ? 0 : entries_[called].ends.count;
}

/// One of these ways, if there is anything in it.
bool FullSearch::branch(const Walk& walk, const Item& item, std::uint32_t index, Item& next) {
    const NodeRow& node = table_.nodes[item.node];
    if (node.op == Op::Choice) {
        next = afterBranch(item, index);
        return (branchMask(walk.entry, item) >> index) & 1;
    }
    const Entry& called = entries_[entryAt(node.arg, item.place.low)];
    const Place& end = pool_[called.ends.first + index];
    // Nothing leads back.
    if (end.low > wanted_[walk.wanted.first + walk.wanted.count - 1].high) return false;
    return comesBack(item, called, end, next) &&
           (goesOn(walk.entry, node, next.place) ||
            (restBehind(node) != Rest::Open && isWanted(walk, next.place)));
}

/// Whether any way from an item comes to a wanted end of the walk's entry.
bool FullSearch::leadsOn(const Walk& walk, const Item& item) {
    enum class Answer { No, Yes, Open };
    const auto ask = [&](Item from) {
        for (;;) {
            const NodeRow& node = table_.nodes[from.node];
            ++steps_;
            if (node.op == Op::End) return isWanted(walk, from.place) ? Answer::Yes : Answer::No;
            if (node.op == Op::Choice) {
                const std::uint32_t mask = branchMask(walk.entry, from);
                if (mask == 0) return Answer::No;
                if (!isSingle(mask)) break;
                from = afterBranch(from, static_cast<std::uint32_t>(std::countr_zero(mask)));
                continue;
            }
            if (node.op == Op::Call) {
                if (!mayCall(walk.entry, from)) return Answer::No;
                break;
            }
            if (!take(node, from.place)) return Answer::No;
            from.node = node.run;
        }
        const Memo& known = memo(walk.memo, from);
        if (known.value != Memo::Unknown) return known.value == Memo::Yes ? Answer::Yes : Answer::No;
        trials_.push_back({from, 0});
        return Answer::Open;
    };
    Answer answer = ask(item);
    while (!trials_.empty()) {
        Trial& trial = trials_.back();
        Item next{};
        if (answer == Answer::Yes || trial.branch == branchCount(trial.item)) {
            if (answer == Answer::Open) answer = Answer::No;
            memo(walk.memo, trial.item).value = answer == Answer::Yes ? Memo::Yes : Memo::No;
            trials_.pop_back();
        } else if (branch(walk, trial.item, trial.branch++, next)) {
            answer = ask(next);
        } else {
            answer = Answer::No;
        }
    }
    return answer == Answer::Yes;
}

}  // namespace zr::engine
