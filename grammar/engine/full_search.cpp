#include "grammar/engine/full_search.h"

#include <algorithm>
#include <bit>

namespace zr::engine {
namespace {

/// So many of 64 positions are many.
constexpr std::uint32_t kManyEnds = 2;
/// Ends over fewer words than this are looked at one by one.
constexpr std::uint32_t kFarWords = 4;

}  // namespace

std::size_t FullSearch::bytes() const {
    return reach_.bytes() + sets_.bytes() + behind_.bytes() + byVertex_.size() * sizeof(SetId);
}

std::size_t FullSearch::capacity() const {
    return reach_.capacity() + sets_.capacity() + behind_.capacity() + starts_.capacity() +
           byVertex_.capacity() * sizeof(SetId) + walks_.capacity() * sizeof(Walk);
}

void FullSearch::start(const ParserTable& table, TextIndex& text, const Options& options,
                       const Reach::Recovery& recovery) {
    table_ = &table;
    text_ = &text;
    options_ = &options;
    recovery_ = recovery;
    steps_ = 0;
    joinedBefore_ = sets_.wordsJoined();
    reach_.start(table, text, recovery);
}

bool FullSearch::look(const ParserTable& table, TextIndex& text, const Options& options,
                      const Reach::Recovery& recovery, std::uint16_t rule, std::uint32_t position) {
    start(table, text, options, recovery);
    return reach_.follow(rule, position, kMemoBytes * options.maxMemo);
}

FullSearch::Outcome FullSearch::read(std::uint16_t rule, std::uint32_t position, Derivation& derivation) {
    constexpr std::size_t kFirstLook = 4;
    made_ = &derivation;
    const std::vector<std::uint32_t>& ends = reach_.ends();
    // Reach mostly says where the reading ends, or a little too much: the last ends it names come first.
    std::size_t count = ends.size();
    for (std::size_t look = std::min(kFirstLook, count); count != 0; count -= look, look = count) {
        const std::uint32_t last = ends[count - 1];
        if (last < text_->count()) text_->cutAt(last);
        reach_.keep(ends[count - look], last);
        if (!findSets(position, last)) return Outcome::OverBudget;
        const SetId found = endsOf(rule, position);
        // The rule may stand inside itself too, and end elsewhere there.
        if (found == kEmpty || sets_.last(found) < ends[count - look]) continue;
        reached_ = sets_.last(found);
        return writeDown(rule, position);
    }
    return Outcome::NotFound;
}

std::vector<std::uint32_t> FullSearch::allEnds(const ParserTable& table, TextIndex& text,
                                               const Options& options, std::uint16_t rule,
                                               std::uint32_t position) {
    std::vector<std::uint32_t> found;
    start(table, text, options, {});
    if (!reach_.follow(rule, position, kMemoBytes * options.maxMemo) || reach_.ends().empty()) return found;
    reach_.keep(reach_.ends().front(), reach_.ends().back());
    if (!findSets(position, reach_.ends().back())) return found;
    const SetId ends = endsOf(rule, position);
    for (const std::uint32_t end : reach_.ends())
        if (sets_.contains(ends, end)) found.push_back(end);
    return found;
}

// ---- sets of ends

bool FullSearch::findSets(std::uint32_t position, std::uint32_t end) {
    const std::uint64_t budget =
        steps() + options_->baseSteps + options_->stepsPerToken * (end - position + 1);
    sets_.start(position, end);
    byVertex_.clear();
    byVertex_.reserve(reach_.keptCount());
    behind_.start(sets_, reach_.nodes());
    starts_.start();
    here_.assign(reach_.nodes(), kEmpty);
    ahead_.assign(reach_.nodes(), kEmpty);
    for (std::uint32_t p = end + 1; p-- > position;) {
        const std::span<const std::uint16_t> kept = reach_.keptAt(p);
        // In their order each node stands behind those that its set is made of.
        for (const std::uint16_t node : kept) {
            const SetId set = setFor(node, p);
            byVertex_.push_back(set);
            here_[node] = set;
            if (set != kEmpty && (table_->nodes[node].flags & kBehindCall)) behind_.note(node, p, set);
        }
        if (p < end)
            for (const std::uint16_t node : reach_.keptAt(p + 1)) ahead_[node] = kEmpty;
        here_.swap(ahead_);
        steps_ += 1 + kept.size() / 8;
        if (steps() > budget || remembered() > options_->maxMemo) return false;
    }
    return true;
}

SetId FullSearch::setAt(std::uint16_t node, std::uint32_t position) const {
    const std::uint32_t place = reach_.keptPlace(node, position);
    return place == Reach::kNone ? kEmpty : byVertex_[place];
}

/// The ends that the rule of a node can come to from a position, when those of all nodes further on, and of
/// those at the same position that come without a token, are known.
SetId FullSearch::setFor(std::uint16_t at, std::uint32_t p) {
    const NodeRow& node = table_->nodes[at];
    switch (node.op) {
        case Op::Token:
        case Op::Set:
        case Op::Hard:
            return ahead_[node.run];
        case Op::Soft:
        case Op::SoftStar: {
            const SetId skipped = here_[node.run];
            if (!text_->isCloser(p)) return skipped;
            sets_.join(skipped);
            const SetId taken = ahead_[node.op == Op::Soft ? node.run : at];
            sets_.join(taken);
            return sets_.joined(taken);
        }
        case Op::Choice: {
            SetId first = kEmpty;
            bool several = false;
            for (std::uint32_t mask = reach_.branches(node, p); mask != 0; mask &= mask - 1) {
                const SetId set =
                    here_[branchStop(*table_, node, static_cast<std::uint32_t>(std::countr_zero(mask)))];
                if (set == kEmpty || set == first) continue;
                if (first != kEmpty && !several) {
                    sets_.join(first);
                    several = true;
                }
                if (several) sets_.join(set);
                if (first == kEmpty || sets_.size(set) > sets_.size(first)) first = set;
            }
            return several ? sets_.joined(first) : first;
        }
        case Op::Call:
            return isSkipped(node, p) ? setAt(node.run, recovery_.to) : setBehind(node, p);
        case Op::End:
            return sets_.single(p);
        default:
            return here_[node.run];
    }
}

/// Whether a call stands for tokens that can't be read: its rule reads none from there.
bool FullSearch::isSkipped(const NodeRow& call, std::uint32_t p) const {
    return reach_.mayRecover(call, p) && endsOf(call.arg, p) == kEmpty;
}

SetId FullSearch::setBehind(const NodeRow& call, std::uint32_t p) {
    const SetId all = here_[searchedFrom(*table_, table_->rules[call.arg].entry)];
    const EndsBehind::Word* behind = behind_.words(call.run);
    if (all == kEmpty || behind == nullptr) return kEmpty;
    // One end is what plain text has.
    if (sets_.size(all) == 1) {
        const std::uint32_t end = sets_.last(all);
        return end == p && (call.flags & kNonEmpty) ? kEmpty : setAt(call.run, end);
    }
    // An end that takes no token counts for some calls and not for others.
    const bool mayBeEmpty = sets_.contains(all, p);
    const SetId ends = mayBeEmpty ? sets_.without(all, p) : all;
    // Rules inside each other mostly share the ends further on: only what is new is looked at.
    EndsBehind::Known& known = behind_.known(call.run);
    auto* last = &known.last[sets_.size(known.last[0].ends) > sets_.size(known.last[1].ends) ? 0 : 1];
    bool grows = sets_.grows(ends, last->ends, gained_);
    if (!grows) {
        last = &known.last[last == &known.last[0] ? 1 : 0];
        grows = sets_.grows(ends, last->ends, gained_);
    }
    if (grows) sets_.join(last->behind);
    for (const auto& [word, bits] : gained_) joinBehind(call.run, behind[word], word, bits);
    steps_ += gained_.size() / kWordsAStep;
    SetId made = sets_.joined(ends);
    *last = {ends, made};
    if (mayBeEmpty && !(call.flags & kNonEmpty)) {
        sets_.join(made);
        joinBehind(call.run, behind[sets_.wordOf(p)], sets_.wordOf(p), sets_.bitOf(p));
        made = sets_.joined(made);
    }
    return made;
}

/// Joins the ends that a node comes to from the positions `from` of a word.
void FullSearch::joinBehind(std::uint16_t node, const EndsBehind::Word& behind, std::uint32_t word,
                            std::uint64_t from) {
    sets_.joinWord(word, from & behind.here);
    SetId before = kEmpty;
    for (std::uint64_t left = from & behind.elsewhere; left != 0; left &= left - 1) {
        const SetId further = setAt(node, sets_.positionOf(word, left));
        if (further != before) sets_.join(further);
        before = further;
    }
}

/// Those ends in a word that count for a call: some calls want one that takes a token.
std::uint64_t FullSearch::counted(const NodeRow& call, std::uint32_t p, std::uint32_t word,
                                  std::uint64_t bits) const {
    return (call.flags & kNonEmpty) && word == sets_.wordOf(p) ? bits & ~sets_.bitOf(p) : bits;
}

// ---- the walk down

FullSearch::Outcome FullSearch::writeDown(std::uint16_t rule, std::uint32_t position) {
    Wanted whole;
    whole.few[whole.count++] = reached_;
    made_->start(rule, position);
    walks_.assign(1, {0, whole, searchedFrom(*table_, table_->rules[rule].entry), position});
    for (;;) {
        if (!walkOn(walks_.back())) {
            if (walks_.size() >= options_->maxDepth) return Outcome::TooDeep;
            continue;
        }
        const Walk ended = walks_.back();
        walks_.pop_back();
        if (walks_.empty()) break;
        comeBack(walks_.back(), ended.part, ended.position);
    }
    made_->end(0, reached_, reached_);
    return Outcome::Found;
}

/// The call that a walk stands at has read as far as `end`.
void FullSearch::comeBack(Walk& walk, std::uint32_t part, std::uint32_t end) {
    made_->end(part, end, end);
    walk.node = table_->nodes[walk.node].run;
    walk.position = end;
}

/// Writes down that a walk comes to a call.
std::uint32_t FullSearch::addPart(const Walk& walk, bool recovered) {
    made_->parts.push_back({walk.part, walk.position, 0, 0, 0, 0, walk.node, recovered});
    return static_cast<std::uint32_t>(made_->parts.size()) - 1;
}

/// Goes on until the path ends, which gives true, or needs the path of a call first.
bool FullSearch::walkOn(Walk& walk) {
    for (;;) {
        const NodeRow& node = table_->nodes[walk.node];
        ++steps_;
        switch (node.op) {
            case Op::End:
                return true;
            case Op::Choice: {
                std::uint16_t branch = 0, stop = 0;
                std::uint32_t mask = reach_.branches(node, walk.position);
                do {  // one of them leads on, or nobody had come here
                    branch = branchOf(*table_, node, static_cast<std::uint32_t>(std::countr_zero(mask)));
                    stop = table_->branches[branch].stop;
                    mask &= mask - 1;
                } while (mask != 0 && !leadsTo(setAt(stop, walk.position), walk.wanted));
                made_->choices.push_back(branch);
                walk.node = stop;
                break;
            }
            case Op::Call: {
                const bool skipped = isSkipped(node, walk.position);
                const std::uint32_t part = addPart(walk, skipped);
                if (skipped) {
                    comeBack(walk, part, recovery_.to);
                    break;
                }
                walks_.push_back({part, wantedBy(walk, node),
                                  searchedFrom(*table_, table_->rules[node.arg].entry), walk.position});
                return false;
            }
            case Op::Soft:
            case Op::SoftStar: {
                const std::uint16_t next = node.op == Op::Soft ? node.run : walk.node;
                if (text_->isCloser(walk.position) && leadsTo(setAt(next, walk.position + 1), walk.wanted)) {
                    ++walk.position;
                    walk.node = next;
                } else {
                    walk.node = node.run;
                }
                break;
            }
            case Op::Token:
            case Op::Set:
            case Op::Hard:
                ++walk.position;
                walk.node = node.run;
                break;
            default:
                walk.node = node.run;
                break;
        }
    }
}

bool FullSearch::leadsTo(SetId set, const Wanted& wanted) const {
    if (wanted.count > Wanted::kFew) return sets_.meet(set, wanted.many);
    for (std::uint32_t i = 0; i < wanted.count; ++i)
        if (sets_.contains(set, wanted.few[i])) return true;
    return false;
}

/// The ends of a call that its walk can go on from.
FullSearch::Wanted FullSearch::wantedBy(const Walk& walk, const NodeRow& call) {
    const Wanted& wanted = walk.wanted;
    const SetId ends = endsOf(call.arg, walk.position);
    if (sets_.size(ends) == 1) return {{sets_.last(ends)}, 1, kEmpty};
    const PositionSets::Range range = sets_.range(ends);
    const EndsBehind::Word* behind = behind_.words(call.run);
    const auto endsIn = [&](std::uint32_t word) {
        return counted(call, walk.position, word, sets_.word(ends, word));
    };
    // Of many ends mostly one or two lead on to what is wanted: it takes less to look from there.
    const bool isFew = wanted.count <= Wanted::kFew;
    const std::uint32_t many = kManyEnds * (range.to - range.from);
    const std::uint32_t elsewhere = behind_.known(call.run).elsewhere;
    const bool backwards =
        isFew && range.to - range.from >= kFarWords && sets_.size(ends) >= many && elsewhere >= many;
    const bool forwards = !backwards && !(isFew && elsewhere == 0);
    for (std::uint32_t i = 0; isFew && i < wanted.count; ++i) {
        const std::uint32_t end = wanted.few[i], wordOfEnd = sets_.wordOf(end);
        sets_.joinWord(wordOfEnd, endsIn(wordOfEnd) & behind[wordOfEnd].here & sets_.bitOf(end));
        if (!backwards) continue;
        const StartsBefore::Starts starts = starts_.of(sets_, call.run, behind, range, end,
                                                       [&](std::uint32_t at) { return setAt(call.run, at); });
        const std::uint32_t to = std::min(range.to, starts.words.to);
        for (std::uint32_t word = std::max(range.from, starts.words.from); word < to; ++word)
            sets_.joinWord(word, endsIn(word) & starts.in(word));
    }
    for (std::uint32_t word = range.from; forwards && word < range.to; ++word) {
        if (!isFew) sets_.joinWord(word, endsIn(word) & behind[word].here & sets_.word(wanted.many, word));
        for (std::uint64_t left = endsIn(word) & behind[word].elsewhere; left != 0; left &= left - 1)
            if (leadsTo(setAt(call.run, sets_.positionOf(word, left)), wanted))
                sets_.joinWord(word, left & (~left + 1));
    }
    steps_ += (range.to - range.from) / kWordsAStep;
    Wanted found;
    found.count = sets_.takeFew(found.few.data(), Wanted::kFew);
    if (found.count > Wanted::kFew) found.many = sets_.joined(ends);
    return found;
}

}  // namespace zr::engine
