#include "grammar/engine/recogniser.h"

#include <algorithm>
#include <bit>

namespace zr::engine {
namespace {

/// Up to this many merge states an entry is searched through plainly; beyond, it moves to the shared table.
constexpr std::uint32_t kFewVisits = 6;

/// What a thread keeps at most between two searches.
constexpr std::size_t kSpareBytes = std::size_t{32} << 20;

std::uint64_t visitHash(std::uint32_t entry, std::uint16_t node, std::uint32_t low, std::uint32_t high) {
    std::uint64_t h = (static_cast<std::uint64_t>(entry) << 16) ^ node;
    h = h * 0x9E3779B97F4A7C15u ^ low;
    h = (h ^ (h >> 29)) * 0xBF58476D1CE4E5B9u ^ high;
    h = (h ^ (h >> 32)) * 0x94D049BB133111EBu;
    return h ^ (h >> 29);
}

bool isZeroWidth(Op op) {
    return op == Op::Root || op == Op::ScopeBegin || op == Op::ScopeEnd;
}

}  // namespace

Recogniser::Recogniser(const ParserTable& table, const std::vector<std::uint16_t>& types,
                       const Options& options)
    : table_(&table), options_(&options), types_(&types), count_(static_cast<std::uint32_t>(types.size())) {
    exchange(spare());
    index();
}

struct Recogniser::Spare {
    std::vector<Entry> entries;
    std::vector<End> ends;
    std::vector<State> states;
    std::vector<Frame> frames;
    std::vector<Visit> visits;
    std::vector<std::uint32_t> entriesAt;

    std::size_t bytes() const {
        return entries.capacity() * sizeof(Entry) + ends.capacity() * sizeof(End) +
               states.capacity() * sizeof(State) + frames.capacity() * sizeof(Frame) +
               visits.capacity() * sizeof(Visit) + entriesAt.capacity() * sizeof(std::uint32_t);
    }
};

Recogniser::Spare& Recogniser::spare() {
    static thread_local Spare mine;
    return mine;
}

void Recogniser::exchange(Spare& with) {
    entries_.swap(with.entries);
    ends_.swap(with.ends);
    states_.swap(with.states);
    frames_.swap(with.frames);
    visits_.swap(with.visits);
    entriesAt_.swap(with.entriesAt);
}

Recogniser::~Recogniser() {
    Spare& kept = spare();
    Spare mine;
    exchange(mine);
    if (mine.bytes() <= kept.bytes() || mine.bytes() > kSpareBytes) return;
    mine.entries.clear();
    mine.ends.clear();
    mine.states.clear();
    mine.frames.clear();
    mine.visits.clear();
    std::swap(kept, mine);
}

/// One pass over the tokens for everything that later questions need in constant time.
void Recogniser::index() {
    classes_.resize(count_ + 1);
    lastOf_.assign(table_->maxToken + 1, 0);
    bool closers = false;
    for (std::uint32_t i = 0; i < count_; ++i) {
        classes_[i] = table_->classOf[(*types_)[i]];
        lastOf_[(*types_)[i]] = i + 1;
        closers = closers || (table_->closer != 0 && (*types_)[i] == table_->closer);
    }
    classes_[count_] = table_->classOf[0];
    runEnd_.clear();
    if (closers) {
        runEnd_.resize(count_ + 1);
        runEnd_[count_] = count_;
        for (std::uint32_t i = count_; i-- > 0;)
            runEnd_[i] = (*types_)[i] == table_->closer ? runEnd_[i + 1] : i;
    }
    candidates_.assign(table_->guardCount, {});
    barriers_.assign(table_->guardCount, {});
    nextOpener_.clear();
    openedBefore_.clear();
    entriesAt_.assign(count_ + 1, kNone);
}

std::uint32_t Recogniser::addState(std::uint16_t node, std::uint32_t low, std::uint32_t high,
                                   std::uint32_t before, std::uint32_t child, std::uint32_t childEnd) {
    states_.push_back({low, high, before, child, childEnd, node});
    return static_cast<std::uint32_t>(states_.size()) - 1;
}

std::uint32_t Recogniser::entryFor(std::uint16_t rule, std::uint32_t position, std::uint16_t context) {
    for (std::uint32_t i = entriesAt_[position]; i != kNone; i = entries_[i].nextHere)
        if (entries_[i].rule == rule && entries_[i].context == context) return i;
    Entry entry;
    entry.position = position;
    entry.rule = rule;
    entry.context = context;
    entry.nextHere = entriesAt_[position];
    const auto made = static_cast<std::uint32_t>(entries_.size());
    entries_.push_back(entry);
    entriesAt_[position] = made;
    return made;
}

/// The context of what a call runs, from the context of the rule around it.
std::uint16_t Recogniser::contextOf(std::uint16_t call, std::uint16_t outer) {
    const std::size_t slot = static_cast<std::size_t>(outer) * table_->contextCount + call;
    if (slot < contextCache_.size() && contextCache_[slot] != kNone16) return contextCache_[slot];
    Context context;
    const Context& around = contexts_[outer];
    const bool inherits = table_->contextFlags[call] & 1;
    const std::uint16_t* sets = table_->contextSets + call * (table_->loopCount + 1);
    const auto join = [&](std::uint16_t set, const ClassSet& inherited) {
        ClassSet joined;
        for (std::size_t w = 0; w < joined.size(); ++w)
            joined[w] = table_->classSets[set * 4u + w] | (inherits ? inherited[w] : 0);
        return joined;
    };
    for (std::uint32_t l = 0; l < table_->loopCount; ++l) context.other[l] = join(sets[l], around.other[l]);
    context.any = join(sets[table_->loopCount], around.any);
    context.closing = (table_->contextFlags[call] & 2) || (inherits && around.closing);
    context.mayEnd = inherits && around.mayEnd;
    const auto found = std::find(contexts_.begin(), contexts_.end(), context);
    const auto id = static_cast<std::uint16_t>(found - contexts_.begin());
    if (found == contexts_.end()) {
        contexts_.push_back(context);
        contextCache_.resize(contexts_.size() * table_->contextCount, kNone16);
    }
    contextCache_[slot] = id;
    return id;
}

void Recogniser::pushFrame(Entry& entry, Frame frame) {
    frame.below = entry.frames;
    if (freeFrame_ != kNone) {
        entry.frames = freeFrame_;
        freeFrame_ = frames_[freeFrame_].below;
        frames_[entry.frames] = frame;
        return;
    }
    entry.frames = static_cast<std::uint32_t>(frames_.size());
    frames_.push_back(frame);
}

void Recogniser::popFrame(Entry& entry) {
    const std::uint32_t top = entry.frames;
    entry.frames = frames_[top].below;
    frames_[top].below = freeFrame_;
    freeFrame_ = top;
}

bool Recogniser::enterOnce(std::uint32_t entryIndex, std::uint16_t node, std::uint32_t low,
                           std::uint32_t high, std::uint8_t stopped) {
    Entry& entry = entries_[entryIndex];
    // A state is also done when an earlier one at the same node leaves at least as much open.
    for (std::uint32_t at = entry.visited; at != kNone; at = visits_[at].next) {
        const Visit& v = visits_[at];
        if (v.node == node && v.low <= low && v.high >= high && (v.stopped & ~stopped) == 0) return false;
    }
    if (entry.visitedCount >= kFewVisits) return enterInTable(entryIndex, node, low, high, stopped);
    ++entry.visitedCount;
    visits_.push_back({entry.visited, low, high, node, stopped});
    entry.visited = static_cast<std::uint32_t>(visits_.size()) - 1;
    return true;
}

bool Recogniser::enterInTable(std::uint32_t entry, std::uint16_t node, std::uint32_t low, std::uint32_t high,
                              std::uint8_t stopped) {
    if (visitTableUsed_ * 2 >= visitTable_.size()) growVisitTable();
    const std::size_t mask = visitTable_.size() - 1;
    for (std::size_t slot = visitHash(entry, node, low, high) & mask;; slot = (slot + 1) & mask) {
        const std::uint32_t at = visitTable_[slot];
        if (at == kNone) {
            visits_.push_back({entry, low, high, node, stopped});
            visitTable_[slot] = static_cast<std::uint32_t>(visits_.size()) - 1;
            ++visitTableUsed_;
            return true;
        }
        const Visit& v = visits_[at];
        if (v.next == entry && v.node == node && v.low == low && v.high == high &&
            (v.stopped & ~stopped) == 0)
            return false;
    }
}

void Recogniser::growVisitTable() {
    const std::vector<std::uint32_t> old = std::move(visitTable_);
    visitTable_.assign(std::max<std::size_t>(256, old.size() * 2), kNone);
    const std::size_t mask = visitTable_.size() - 1;
    for (const std::uint32_t at : old) {
        if (at == kNone) continue;
        const Visit& v = visits_[at];
        std::size_t slot = visitHash(v.next, v.node, v.low, v.high) & mask;
        while (visitTable_[slot] != kNone) slot = (slot + 1) & mask;
        visitTable_[slot] = at;
    }
}

/// Whether somebody around the entry could go on from an end of it, or the target is reached. The place of an
/// end where nobody needs a token more is noted: a reading gets that far.
bool Recogniser::isOpenEnd(const Entry& entry, std::uint32_t low, std::uint32_t high, std::uint8_t stopped) {
    // Whether an empty end counts is for those around to say; a search with few ends keeps what it has.
    if (high == entry.position || endsEach_ != 0) return true;
    // The recover rule may take what nothing else could.
    if (recovering_ && (recoverPlace_ == kNone || high <= recoverPlace_)) return true;
    const Context& context = contexts_[entry.context];
    const auto contains = [](const ClassSet& set, std::uint32_t cls) {
        return ((set[cls / 64] >> (cls % 64)) & 1) != 0;
    };
    if (context.mayEnd) {
        furthest_ = std::max(furthest_, high);
        if (high == count_) return true;
    }
    const std::uint32_t cls = classes_[high];
    const bool takesCloser = low != high && contains(context.any, table_->classOf[table_->closer]);
    if (!takesCloser && !contains(context.any, cls)) return false;
    if (stopped == 0 || (low != high && context.closing)) return true;
    // Where a tail loop stopped early, only something else than that loop may take the next token.
    for (std::uint32_t l = 0; l < table_->loopCount; ++l)
        if (((stopped >> l) & 1) && !contains(context.other[l], cls)) return false;
    return true;
}

/// Whether an earlier end of the entry serves for all that this one could. How many closers were taken already
/// only matters to those around who must take one, each for a parenthesis that it opened before the entry: while
/// as many are left in the run, only how far the optional ones can reach counts.
bool Recogniser::isCovered(const Entry& entry, std::uint32_t low, std::uint32_t high, std::uint8_t stopped) {
    constexpr int kLooked = 8;  // nearly always the first
    if (entry.firstEnd == kNone || runEnd_.empty()) return false;
    std::uint32_t at = entry.firstEnd;
    for (int i = 0; i < kLooked && at != kNone; ++i, at = ends_[at].next) {
        const End& end = ends_[at];
        if (end.high == high && (end.stopped & ~stopped) == 0 && runEnd_[low] == runEnd_[end.low] &&
            runEnd_[low] - end.low >= openedBefore(entry.position))
            return true;
    }
    return false;
}

std::uint32_t Recogniser::openedBefore(std::uint32_t position) {
    if (openedBefore_.empty()) {
        openedBefore_.resize(count_ + 1);
        for (std::uint32_t i = 0; i < count_; ++i)
            openedBefore_[i + 1] = openedBefore_[i] + ((*types_)[i] == table_->leftParen ? 1 : 0);
    }
    return openedBefore_[position];
}

/// Adds an end, unless nobody could go on from it.
bool Recogniser::addEnd(std::uint32_t entryIndex, std::uint32_t low, std::uint32_t high, std::uint32_t state,
                        std::uint8_t stopped) {
    Entry& entry = entries_[entryIndex];
    if (!isOpenEnd(entry, low, high, stopped) || isCovered(entry, low, high, stopped)) return false;
    const auto made = static_cast<std::uint32_t>(ends_.size());
    ends_.push_back({low, high, state, stopped, kNone});
    if (entry.firstEnd == kNone)
        entry.firstEnd = made;
    else
        ends_[entry.lastEnd].next = made;
    entry.lastEnd = made;
    if (entry.endCount < 0xFF) ++entry.endCount;
    return true;
}

/// A token that isn't the closer can only be taken where the run of closers is over, so an undecided position
/// becomes that one, if it is among the possible ones.
bool Recogniser::settle(std::uint32_t& low, std::uint32_t& high) const {
    if (low == high) return true;
    if (high != runEnd(low)) return false;
    low = high;
    return true;
}

std::uint32_t Recogniser::viable(const NodeRow& node, std::uint32_t low, std::uint32_t high) const {
    const std::uint32_t* masks = table_->choiceMask + static_cast<std::size_t>(node.arg) * table_->classes;
    if (low == high) return masks[classes_[low]];
    std::uint32_t mask = masks[table_->classOf[table_->closer]];
    if (high == runEnd(low)) mask |= masks[classes_[high]];
    return mask;
}

/// Whether the text still holds what the call and the part behind it can't do without. A cheap "no" here
/// saves the search of an alternative that was never going to work, such as an alias behind every column.
bool Recogniser::guarded(const NodeRow& node, std::uint32_t position) {
    if (node.required != 0 && lastOf_[node.required] <= position) return false;
    if (node.guard == kNone16 || position >= count_) return true;
    const GuardRow& guard = table_->guards[node.guard];
    std::vector<std::uint32_t>& candidates = candidates_[node.guard];
    std::vector<std::uint32_t>& barriers = barriers_[node.guard];
    if (candidates.empty()) {
        candidates.resize(count_ + 1);
        barriers.resize(count_ + 1);
        candidates[count_] = kNone;
        barriers[count_] = count_;
        for (std::uint32_t i = count_; i-- > 0;) {
            const bool here = i > 0 && inSet(guard.follow, classes_[i]) && inSet(guard.last, classes_[i - 1]);
            candidates[i] = here ? i : candidates[i + 1];
            barriers[i] = inSet(guard.outside, classes_[i]) ? barriers[i + 1] : i;
        }
    }
    const std::uint32_t candidate = candidates[position + 1];
    if (candidate == kNone) return false;
    if (nextOpener_.empty()) {
        nextOpener_.resize(count_ + 1);
        nextOpener_[count_] = count_ + 2;
        for (std::uint32_t i = count_; i-- > 0;)
            nextOpener_[i] = inSet(table_->openerSet, classes_[i]) ? i : nextOpener_[i + 1];
    }
    const std::uint32_t barrier = barriers[position];
    return candidate <= barrier || nextOpener_[position] <= barrier + 1;
}

/// What a branch does to the record of tail loops that stopped: leaving one although a round could start is
/// noted.
std::uint8_t Recogniser::afterBranch(const NodeRow& node, std::uint32_t branch, std::uint32_t low,
                                     std::uint32_t high, std::uint8_t stopped) const {
    if (node.context == kNone16 || branch == 0 || high != runEnd(low)) return stopped;
    if (!inSet(node.guard, classes_[high])) return stopped;
    return static_cast<std::uint8_t>(stopped | (1u << node.context));
}

/// Follows one path until it ends, fails, or comes to a call: the call is left as a frame for resume().
bool Recogniser::forward(std::uint32_t entryIndex, std::uint16_t at, std::uint32_t low, std::uint32_t high,
                         std::uint32_t state, std::uint8_t stopped) {
    ++steps_;
    for (;;) {
        const NodeRow& node = table_->nodes[at];
        if ((node.flags & kMerge) && !enterOnce(entryIndex, at, low, high, stopped)) return false;
        switch (node.op) {
            case Op::Token:
                if (!settle(low, high) || low >= count_ || (*types_)[low] != node.arg) return false;
                high = ++low;
                stopped = 0;
                break;
            case Op::Set:
                if (!settle(low, high) || low >= count_ || !inSet(node.arg, classes_[low])) return false;
                high = ++low;
                stopped = 0;
                break;
            case Op::Hard: {
                const std::uint32_t run = runEnd(low);
                if (low == run) return false;
                ++low;
                high = std::min(high + 1, run);
                stopped = 0;
                break;
            }
            case Op::Soft:
                high = std::min(high + 1, runEnd(low));
                break;
            case Op::SoftStar:
                high = runEnd(low);
                break;
            case Op::Choice: {
                const ChoiceRow& choice = table_->choices[node.arg];
                std::uint32_t mask = viable(node, low, high);
                // The part that recovery replaces starts with none of its tokens: look at every way to it.
                if (recoversIn(entryIndex))
                    mask = static_cast<std::uint32_t>((std::uint64_t{1} << choice.count) - 1);
                if ((node.flags & kLoop) && ((stopped >> node.context) & 1)) mask &= ~1u;
                if (mask == 0) return false;
                const auto branch = static_cast<std::uint32_t>(std::countr_zero(mask));
                const std::uint16_t target = table_->targets[choice.firstTarget + branch];
                mask &= mask - 1;
                if (mask != 0)
                    pushFrame(entries_[entryIndex],
                              {kNone, low, high, state, kNone, kNone, mask, at, stopped});
                state = addState(target, low, high, state, kNone, kNone);
                stopped = afterBranch(node, branch, low, high, stopped);
                at = isZeroWidth(table_->nodes[target].op) ? table_->nodes[target].run : target;
                continue;
            }
            case Op::Call: {
                const RuleRow& rule = table_->rules[node.arg];
                const bool recoverable = node.arg == table_->recoverRule && recoversIn(entryIndex);
                if (!settle(low, high)) {
                    if (!recoverable) return false;
                    // The parentheses that are left over are among what recovery skips.
                    low = high;
                }
                if (!recoverable && !inSet(table_->firstSetBase + node.arg, classes_[low]) &&
                    (!rule.nullable || (node.flags & kNonEmpty)))
                    return false;
                if (!recovering_ && !(rule.nullable && !(node.flags & kNonEmpty)) &&
                    !secondFits(node.arg, low))
                    return false;
                if (!recoverable && !guarded(node, low)) return false;
                const std::uint32_t child =
                    entryFor(node.arg, low, contextOf(node.context, entries_[entryIndex].context));
                if (recoverable) {
                    if (recoverAskedAt_ == kNone || low > recoverAskedAt_) recoverAskedAt_ = low;
                    entries_[child].mayRecover = low == recoverPlace_;
                }
                pushFrame(entries_[entryIndex], {kNone, low, high, state, child, kNone, 0, at, stopped});
                return false;
            }
            case Op::End:
                return addEnd(entryIndex, low, high, state, stopped);
            case Op::Root:
            case Op::ScopeBegin:
            case Op::ScopeEnd:
                break;
        }
        at = node.run;
    }
}

/// Goes on with an entry's search until it has one end more, has none left, or needs an end of another entry.
Recogniser::Outcome Recogniser::resume(std::uint32_t entryIndex, std::uint32_t& child) {
    if (!entries_[entryIndex].started) {
        Entry& entry = entries_[entryIndex];
        entry.started = true;
        const std::uint16_t first = table_->rules[entry.rule].entry;
        const std::uint32_t position = entry.position;
        const std::uint32_t state = addState(first, position, position, kNone, kNone, kNone);
        const NodeRow& node = table_->nodes[first];
        if (forward(entryIndex, isZeroWidth(node.op) ? node.run : first, position, position, state, 0))
            return Outcome::Yielded;
    }
    for (;;) {
        Entry& entry = entries_[entryIndex];
        while (endsEach_ != 0 && entry.endCount >= endsEach_ && entry.frames != kNone) popFrame(entry);
        if (entry.frames == kNone) {
            if (entry.done) return Outcome::Exhausted;
            entry.done = true;
            return recover(entryIndex) ? Outcome::Yielded : Outcome::Exhausted;
        }
        Frame& frame = frames_[entry.frames];
        const NodeRow& node = table_->nodes[frame.node];
        if (frame.child == kNone) {
            const auto branch = static_cast<std::uint32_t>(std::countr_zero(frame.mask));
            const std::uint16_t target = table_->targets[table_->choices[node.arg].firstTarget + branch];
            frame.mask &= frame.mask - 1;
            const Frame taken = frame;
            if (taken.mask == 0) popFrame(entry);
            const std::uint32_t state = addState(target, taken.low, taken.high, taken.state, kNone, kNone);
            const NodeRow& next = table_->nodes[target];
            if (forward(entryIndex, isZeroWidth(next.op) ? next.run : target, taken.low, taken.high, state,
                        afterBranch(node, branch, taken.low, taken.high, taken.stopped)))
                return Outcome::Yielded;
            continue;
        }
        const Entry& asked = entries_[frame.child];
        const std::uint32_t end = frame.lastEnd == kNone ? asked.firstEnd : ends_[frame.lastEnd].next;
        if (end == kNone) {
            if (!asked.done) {
                child = frame.child;
                return Outcome::NeedsChild;
            }
            popFrame(entry);
            continue;
        }
        frame.lastEnd = end;
        const End found = ends_[end];
        const std::uint32_t before = frame.state, from = frame.child;
        const bool empty = found.high == asked.position;
        if (empty && (node.flags & kNonEmpty)) continue;
        const std::uint8_t stopped = empty ? frame.stopped : found.stopped;
        if (asked.done && found.next == kNone) popFrame(entry);
        const std::uint32_t state = addState(node.next, found.low, found.high, before, from, end);
        if (forward(entryIndex, node.run, found.low, found.high, state, stopped)) return Outcome::Yielded;
    }
}

/// The recover rule had no derivation: it stands for the tokens up to the first that can follow it at the
/// same parenthesis depth.
bool Recogniser::recover(std::uint32_t entryIndex) {
    Entry& entry = entries_[entryIndex];
    if (!entry.mayRecover || entry.firstEnd != kNone) return false;
    std::uint32_t at = entry.position, depth = 0;
    for (; at < types_->size(); ++at) {
        if (depth == 0 && inSet(table_->recoverFollowSet, table_->classOf[(*types_)[at]])) break;
        if ((*types_)[at] == table_->leftParen) ++depth;
        if ((*types_)[at] == table_->rightParen && depth > 0) --depth;
    }
    if (at > count_) return false;
    entry.recovered = true;
    return addEnd(entryIndex, at, at, kNone, 0);
}

void Recogniser::reset() {
    entriesAt_.assign(count_ + 1, kNone);
    entries_.clear();
    ends_.clear();
    states_.clear();
    frames_.clear();
    freeFrame_ = kNone;
    visits_.clear();
    visitTable_.clear();
    visitTableUsed_ = 0;
    steps_ = 0;
    furthest_ = 0;
}

Recogniser::Result Recogniser::recover(std::uint16_t rule, std::uint32_t position) {
    recovering_ = true;
    recoverStart_ = position;
    search(rule, position);
    reset();
    recoverPlace_ = recoverAskedAt_;
    return run(rule, position);
}

/// A first search looks for a reading of the whole text, which leaves much out, and notes how far readings get.
/// Where there is none, the text is taken to end at the furthest of these places.
Recogniser::Result Recogniser::run(std::uint16_t rule, std::uint32_t position) {
    Result result = search(rule, position);
    if (result.overLimit || (result.found && result.high == count_)) return result;
    const bool cut = result.overBudget;
    if (cut) {
        result = narrowSearch(rule, position);
        if (result.found && result.high == count_) return result;
    }
    if (furthest_ <= position) return result;
    const std::uint64_t spent = steps_;
    count_ = furthest_;
    index();
    reset();
    result = search(rule, position);
    if (result.overBudget) result = narrowSearch(rule, position);
    result.overBudget = result.overBudget || cut;
    steps_ += spent;
    return result;
}

/// Past the budget a search with few ends for each entry, which is linear, may still come further.
Recogniser::Result Recogniser::narrowSearch(std::uint16_t rule, std::uint32_t position) {
    constexpr std::uint8_t kFewEnds = 4;
    const std::uint32_t furthest = furthest_;
    const std::uint64_t spent = steps_;
    reset();
    endsEach_ = kFewEnds;
    Result result = search(rule, position);
    endsEach_ = 0;
    result.overBudget = true;
    steps_ += spent;
    furthest_ = std::max(furthest, result.found ? result.high : 0);
    return result;
}

Recogniser::Result Recogniser::search(std::uint16_t rule, std::uint32_t position) {
    Result result;
    contexts_.assign(1, Context{});
    contexts_[0].mayEnd = true;
    contextCache_.assign(table_->contextCount, kNone16);
    result.entry = entryFor(rule, position, 0);
    chain_.assign(1, result.entry);
    const std::uint64_t budget = options_->baseSteps + options_->stepsPerToken * count_;
    while (!chain_.empty()) {
        std::uint32_t child = kNone;
        const Outcome outcome = resume(chain_.back(), child);
        if (outcome == Outcome::NeedsChild) {
            if (chain_.size() >= options_->maxDepth) {
                result.overLimit = true;
                result.found = false;
                return result;
            }
            chain_.push_back(child);
            continue;
        }
        if (chain_.size() > 1) {
            chain_.pop_back();
        } else if (outcome == Outcome::Exhausted) {
            break;
        } else {
            const End& end = ends_[entries_[result.entry].lastEnd];
            if (!result.found || end.high > result.high) {
                result.found = true;
                result.endState = end.state;
                result.low = end.low;
                result.high = end.high;
            }
            if (result.high == count_) break;
        }
        if (steps_ > budget) {
            result.overBudget = true;
            break;
        }
    }
    return result;
}

}  // namespace zr::engine
