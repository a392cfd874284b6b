#include "grammar/engine/recogniser.h"

#include <algorithm>
#include <bit>

#include "grammar/engine/full_search.h"

namespace zr::engine {
namespace {

/// Up to this many merge states an entry is searched through plainly; beyond, it moves to the shared table.
constexpr std::uint32_t kFewVisits = 6;

std::uint64_t visitHash(std::uint32_t entry, std::uint16_t node, std::uint32_t low, std::uint32_t high) {
    std::uint64_t h = (static_cast<std::uint64_t>(entry) << 16) ^ node;
    h = h * 0x9E3779B97F4A7C15u ^ low;
    h = (h ^ (h >> 29)) * 0xBF58476D1CE4E5B9u ^ high;
    h = (h ^ (h >> 32)) * 0x94D049BB133111EBu;
    return h ^ (h >> 29);
}

}  // namespace

Recogniser::Recogniser(const ParserTable& table, const std::vector<std::uint16_t>& types,
                       const Options& options)
    : table_(&table), options_(&options), text_(table, types) {
    exchange(spare());
}

struct Recogniser::Spare {
    std::vector<Entry> entries;
    std::vector<End> ends;
    std::vector<State> states;
    std::vector<Frame> frames;
    std::vector<Visit> visits;
    std::vector<std::uint32_t> entriesAt;
    Derivation derivation;
    QuickSearch::Work quick;
    const ParserTable* contextsOf = nullptr;
    std::vector<Context> contexts;
    std::vector<std::uint16_t> contextCache;

    std::size_t bytes() const {
        return entries.capacity() * sizeof(Entry) + ends.capacity() * sizeof(End) +
               states.capacity() * sizeof(State) + frames.capacity() * sizeof(Frame) +
               visits.capacity() * sizeof(Visit) + entriesAt.capacity() * sizeof(std::uint32_t) +
               derivation.parts.capacity() * sizeof(Derivation::Part) +
               derivation.ends.capacity() * sizeof(End) + derivation.states.capacity() * sizeof(State) +
               quick.calls.capacity() * sizeof(QuickSearch::Call) +
               quick.points.capacity() * sizeof(QuickSearch::Point) + contexts.capacity() * sizeof(Context) +
               contextCache.capacity() * sizeof(std::uint16_t);
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
    std::swap(derivation_, with.derivation);
    std::swap(quick_, with.quick);
    std::swap(contextsOf_, with.contextsOf);
    contexts_.swap(with.contexts);
    contextCache_.swap(with.contextCache);
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

/// Contexts follow from the grammar alone: those of a thread's last text serve for the next one.
void Recogniser::prepareContexts() {
    if (contextsOf_ == table_) return;
    contextsOf_ = nullptr;  // until all of them stand, whatever memory there is
    contexts_.assign(1, Context{});
    contexts_[0].mayEnd = true;
    contextCache_.assign(table_->contextCount, kNone16);
    contextsOf_ = table_;
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
        contextCache_.resize((contexts_.size() + 1) * table_->contextCount, kNone16);
        contexts_.push_back(context);
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
    if (recovering_) return true;
    const Context& context = contexts_[entry.context];
    const auto contains = [](const ClassSet& set, std::uint32_t cls) {
        return ((set[cls / 64] >> (cls % 64)) & 1) != 0;
    };
    if (context.mayEnd) {
        furthest_ = std::max(furthest_, high);
        if (high == text_.count()) return true;
    }
    const std::uint32_t cls = text_.classAt(high);
    const bool takesCloser = low != high && contains(context.any, table_->classOf[table_->closer]);
    if (!takesCloser && !contains(context.any, cls)) return false;
    if (stopped == 0 || (low != high && context.closing)) return true;
    // Where a tail loop stopped early, only something else than that loop may take the next token.
    for (std::uint32_t l = 0; l < table_->loopCount; ++l)
        if (((stopped >> l) & 1) && !contains(context.other[l], cls)) return false;
    return true;
}

/// Whether an earlier end of the entry serves for all that this one could. How many closers were taken
/// already only matters to those around who must take one, each for a parenthesis that it opened before the
/// entry: while as many are left in the run, only how far the optional ones can reach counts.
bool Recogniser::isCovered(const Entry& entry, std::uint32_t low, std::uint32_t high, std::uint8_t stopped) {
    constexpr int kLooked = 8;  // nearly always the first
    if (entry.firstEnd == kNone) return false;
    std::uint32_t at = entry.firstEnd;
    for (int i = 0; i < kLooked && at != kNone; ++i, at = ends_[at].next) {
        const End& end = ends_[at];
        if (end.high == high && (end.stopped & ~stopped) == 0 && text_.runEnd(low) == text_.runEnd(end.low) &&
            text_.runEnd(low) - end.low >= text_.closersOwedAt(entry.position))
            return true;
    }
    return false;
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

/// Follows one path until it ends, fails, or comes to a call: the call is left as a frame for resume().
bool Recogniser::forward(std::uint32_t entryIndex, std::uint16_t at, std::uint32_t low, std::uint32_t high,
                         std::uint32_t state, std::uint8_t stopped) {
    ++steps_;
    for (;;) {
        const NodeRow& node = table_->nodes[at];
        if ((node.flags & kMerge) && !enterOnce(entryIndex, at, low, high, stopped)) return false;
        switch (node.op) {
            case Op::Choice: {
                const ChoiceRow& choice = table_->choices[node.arg];
                std::uint32_t mask = text_.viable(node, low, high);
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
                stopped = text_.stoppedAfter(node, branch, low, high, stopped);
                at = searchedFrom(*table_, target);
                continue;
            }
            case Op::Call: {
                const RuleRow& rule = table_->rules[node.arg];
                const bool recoverable = node.arg == table_->recoverRule && recoversIn(entryIndex);
                if (!text_.settle(low, high)) {
                    if (!recoverable) return false;
                    // The parentheses that are left over are among what recovery skips.
                    low = high;
                }
                if (recoverable) {
                    if (recoverAskedAt_ == kNone || low > recoverAskedAt_) recoverAskedAt_ = low;
                    // Where the place is only looked for, nobody needs to know what comes behind it.
                    if (recoverPlace_ == kNone) return false;
                }
                if (!recoverable && !text_.inSet(table_->firstSetBase + node.arg, text_.classAt(low)) &&
                    (!rule.nullable || (node.flags & kNonEmpty)))
                    return false;
                if (!recovering_ && !(rule.nullable && !(node.flags & kNonEmpty)) &&
                    !text_.secondFits(node.arg, low))
                    return false;
                if (!recoverable && !text_.guarded(node, low)) return false;
                const std::uint32_t child =
                    entryFor(node.arg, low, contextOf(node.context, entries_[entryIndex].context));
                if (recoverable) entries_[child].mayRecover = low == recoverPlace_;
                pushFrame(entries_[entryIndex], {kNone, low, high, state, child, kNone, 0, at, stopped});
                return false;
            }
            case Op::End:
                return addEnd(entryIndex, low, high, state, stopped);
            default:
                if (!text_.take(node, low, high, stopped)) return false;
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
        if (forward(entryIndex, searchedFrom(*table_, first), position, position, state, 0))
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
            if (forward(entryIndex, searchedFrom(*table_, target), taken.low, taken.high, state,
                        text_.stoppedAfter(node, branch, taken.low, taken.high, taken.stopped)))
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
    const std::uint32_t at = skippedTo(*table_, text_, entry.position);
    if (at > text_.count()) return false;
    entry.recovered = true;
    return addEnd(entryIndex, at, at, kNone, 0);
}

void Recogniser::reset() {
    entriesAt_.assign(text_.count() + 1, kNone);
    entries_.clear();
    ends_.clear();
    states_.clear();
    frames_.clear();
    freeFrame_ = kNone;
    visits_.clear();
    visitTable_.clear();
    visitTableUsed_ = 0;
    derivation_.parts.clear();
    derivation_.ends.clear();
    derivation_.states.clear();
    hasDerivation_ = false;
    quick_.calls.clear();
    quick_.points.clear();
    steps_ = 0;
    furthest_ = 0;
}

Recogniser::Result Recogniser::recover(std::uint16_t rule, std::uint32_t position) {
    recovering_ = true;
    recoverStart_ = position;
    reset();
    search(rule, position);
    if (recoverAskedAt_ == kNone) return {};
    reset();
    recoverPlace_ = recoverAskedAt_;
    return run(rule, position);
}

/// Most text is read by the quick search; the lazy one takes over where that turns back too often.
Recogniser::Result Recogniser::run(std::uint16_t rule, std::uint32_t position) {
    if (recovering_ || options_->quickSteps == 0) return lazySearch(rule, position);
    QuickSearch quick(*table_, text_, *options_, derivation_, quick_);
    hasDerivation_ = quick.run(rule, position);
    steps_ = quick.steps();
    if (!hasDerivation_) return lazySearch(rule, position);
    Result result;
    result.found = true;
    result.entry = 0;
    result.endState = derivation_.endState;
    result.low = quick.low();
    result.high = text_.count();
    return result;
}

/// A first search looks for a reading of the whole text, which leaves much out, and notes how far readings
/// get. Where there is none, the text is taken to end at the furthest of these places. Where that asks for
/// too many steps, the search that never turns back takes over.
Recogniser::Result Recogniser::lazySearch(std::uint16_t rule, std::uint32_t position) {
    const std::uint64_t quickly = steps_;
    reset();
    Result result = search(rule, position);
    steps_ += quickly;
    if (result.overLimit || (result.found && result.high == text_.count())) return result;
    std::uint32_t bound = text_.count();
    if (!result.overBudget) {
        if (furthest_ <= position) return result;
        const std::uint64_t spent = steps_;
        bound = furthest_;
        text_.cutAt(furthest_);
        reset();
        result = search(rule, position);
        steps_ += spent;
    }
    if (!result.overBudget) return result;
    return fullSearch(rule, position, bound);
}

Recogniser::Result Recogniser::fullSearch(std::uint16_t rule, std::uint32_t position, std::uint32_t bound) {
    Reach::Recovery recovery;
    if (recovering_ && recoverPlace_ != kNone) {
        // Where the rule reads anything by itself, it stands for that and nothing is skipped.
        FullSearch itself(*table_, text_, *options_, {});
        if (itself.run(table_->recoverRule, recoverPlace_, text_.count()) == FullSearch::Outcome::Found)
            return {};
        text_.cutAt(text_.fullCount());
        recovery = {recoverPlace_, skippedTo(*table_, text_, recoverPlace_)};
    }
    FullSearch full(*table_, text_, *options_, recovery);
    const FullSearch::Outcome outcome = full.run(rule, position, bound);
    steps_ += full.steps();
    if (outcome == FullSearch::Outcome::OverBudget) return narrowSearch(rule, position);
    Result result;
    result.overLimit = outcome == FullSearch::Outcome::TooDeep;
    if (outcome != FullSearch::Outcome::Found) return result;
    const std::uint64_t spent = steps_;
    reset();
    steps_ = spent;
    derivation_ = std::move(full.derivation());
    hasDerivation_ = true;
    result.found = true;
    result.entry = 0;
    result.endState = derivation_.endState;
    result.low = result.high = full.reached();
    return result;
}

/// Past all budgets a search with few ends for each entry, which is linear, may still come somewhere.
Recogniser::Result Recogniser::narrowSearch(std::uint16_t rule, std::uint32_t position) {
    constexpr std::uint8_t kFewEnds = 4;
    const std::uint64_t spent = steps_;
    reset();
    endsEach_ = kFewEnds;
    Result result = search(rule, position);
    endsEach_ = 0;
    result.overBudget = true;
    steps_ += spent;
    return result;
}

Recogniser::Result Recogniser::search(std::uint16_t rule, std::uint32_t position) {
    Result result;
    prepareContexts();
    result.entry = entryFor(rule, position, 0);
    chain_.assign(1, result.entry);
    const bool seeksPlace = recovering_ && recoverPlace_ == kNone;
    const std::uint64_t budget = endsEach_ != 0 || seeksPlace
                                     ? options_->fullBaseSteps + options_->fullStepsPerToken * text_.count()
                                     : options_->baseSteps + options_->stepsPerToken * text_.count();
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
            if (result.high == text_.count()) break;
        }
        if (steps_ > budget || remembered() > options_->maxMemo) {
            result.overBudget = true;
            break;
        }
    }
    return result;
}

}  // namespace zr::engine
