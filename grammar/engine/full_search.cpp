#include "grammar/engine/full_search.h"

#include <algorithm>
#include <bit>

namespace zr::engine {
namespace {

/// What Options::maxMemo reckons with for each thing that a search remembers.
constexpr std::size_t kMemoBytes = 32;

}  // namespace

std::size_t FullSearch::remembered() const {
    return (words_.size() * sizeof(std::uint64_t) + columns_.size() * sizeof(std::uint64_t) +
            byVertex_.size() * sizeof(SetId) + sets_.size() * sizeof(Set)) /
           kMemoBytes;
}

FullSearch::Outcome FullSearch::run(std::uint16_t rule, std::uint32_t position, std::uint32_t bound) {
    constexpr std::size_t kFirstLook = 4;
    if (Reach::bytesFor(table_, text_.count() - position) > kMemoBytes * options_.maxMemo)
        return Outcome::OverBudget;
    reach_.follow(rule, position);
    const std::vector<std::uint32_t> ends = reach_.ends();
    auto count = static_cast<std::size_t>(std::upper_bound(ends.begin(), ends.end(), bound) - ends.begin());
    // Reach mostly says where the reading ends, or a little too much: the last ends it names come first.
    for (std::size_t look = std::min(kFirstLook, count); count != 0; count -= look, look = count) {
        const std::uint32_t last = ends[count - 1];
        if (last < text_.count()) text_.cutAt(last);
        reach_.keep(ends[count - look], last);
        if (!findSets(position, last)) return Outcome::OverBudget;
        const SetId found = endsOf(rule, position);
        // The rule may stand inside itself too, and end elsewhere there.
        if (found == kEmpty || this->last(found) < ends[count - look]) continue;
        reached_ = this->last(found);
        return writeDown(rule, position);
    }
    return Outcome::NotFound;
}

// ---- sets of ends

bool FullSearch::findSets(std::uint32_t position, std::uint32_t end) {
    const std::uint64_t budget =
        steps_ + options_.fullBaseSteps + options_.fullStepsPerToken * (end - position + 1);
    const std::size_t rowWords = reach_.words();
    from_ = position;
    end_ = end;
    setWords_ = (end - position) / 64 + 1;
    sets_.assign(1, {0, 0, 0});
    words_.clear();
    byVertex_.clear();
    byVertex_.reserve(reach_.keptCount());
    vertexFrom_.assign(end - position + 1, 0);
    vertexBefore_.assign((end - position + 1) * rowWords, 0);
    joint_.assign(setWords_, 0);
    jointFrom_ = jointTo_ = 0;
    columnOf_.assign(table_.stops, kNone);
    std::uint32_t columns = 0;
    for (std::uint32_t i = 0; i < table_.callsFrom[table_.ruleCount]; ++i)
        if (std::uint32_t& column = columnOf_[table_.nodes[table_.calls[i]].run]; column == kNone)
            column = columns++;
    knownBehind_.assign(columns, {});
    columns_.assign(columns * 2 * setWords_, 0);
    for (std::uint32_t p = end + 1; p-- > position;) {
        const std::uint64_t* row = reach_.keptAt(p);
        const std::uint32_t here = p - position;
        vertexFrom_[here] = static_cast<std::uint32_t>(byVertex_.size());
        std::uint8_t* before = vertexBefore_.data() + here * rowWords;
        for (std::size_t w = 0; w < rowWords; ++w) {
            before[w] = static_cast<std::uint8_t>(byVertex_.size() - vertexFrom_[here]);
            // In their order each node stands behind those that its set is made of.
            for (std::uint64_t left = row[w]; left != 0; left &= left - 1) {
                const auto node =
                    static_cast<std::uint16_t>(w * 64 + static_cast<unsigned>(std::countr_zero(left)));
                const SetId set = setFor(node, p);
                byVertex_.push_back(set);
                if (set == kEmpty || columnOf_[node] == kNone) continue;
                const Behind column = behind(node);
                const std::uint64_t bit = std::uint64_t{1} << (here % 64);
                if (contains(set, p)) column.here[here / 64] |= bit;
                if (!isSingle(set, p)) column.elsewhere[here / 64] |= bit;
            }
        }
        steps_ += 1 + (byVertex_.size() - vertexFrom_[here]) / 8;
        if (steps_ > budget || remembered() > options_.maxMemo) return false;
    }
    return true;
}

FullSearch::Behind FullSearch::behind(std::uint16_t node) {
    std::uint64_t* column = columns_.data() + columnOf_[node] * 2 * setWords_;
    return {column, column + setWords_};
}

FullSearch::SetId FullSearch::setAt(std::uint16_t node, std::uint32_t position) const {
    if (!reach_.keeps(node, position)) return kEmpty;
    const std::size_t w = node / 64;
    const std::uint64_t below = reach_.keptAt(position)[w] & ((std::uint64_t{1} << (node % 64)) - 1);
    const std::uint32_t here = position - from_;
    return byVertex_[vertexFrom_[here] + vertexBefore_[here * reach_.words() + w] +
                     static_cast<std::uint32_t>(std::popcount(below))];
}

/// The ends that the rule of a node can come to from a position, when those of all nodes further on, and of
/// those at the same position that come without a token, are known.
FullSearch::SetId FullSearch::setFor(std::uint16_t at, std::uint32_t p) {
    const NodeRow& node = table_.nodes[at];
    switch (node.op) {
        case Op::Token:
        case Op::Set:
        case Op::Hard:
            return setAt(node.run, p + 1);
        case Op::Soft:
        case Op::SoftStar: {
            const SetId skipped = setAt(node.run, p);
            if (!text_.isCloser(p)) return skipped;
            join(skipped);
            const SetId taken = setAt(node.op == Op::Soft ? node.run : at, p + 1);
            join(taken);
            return joined(taken);
        }
        case Op::Choice: {
            SetId first = kEmpty;
            bool several = false;
            for (std::uint32_t mask = reach_.branches(node, p); mask != 0; mask &= mask - 1) {
                const SetId set =
                    setAt(branchTarget(table_, node, static_cast<std::uint32_t>(std::countr_zero(mask))), p);
                if (set == kEmpty || set == first) continue;
                if (first != kEmpty && !several) {
                    join(first);
                    several = true;
                }
                if (several) join(set);
                if (first == kEmpty || sets_[set].count > sets_[first].count) first = set;
            }
            return several ? joined(first) : first;
        }
        case Op::Call:
            return isSkipped(node, p) ? setAt(node.run, recovery_.to) : setBehind(node, p);
        case Op::End:
            return single(p);
        default:
            return setAt(node.run, p);
    }
}

/// Whether a call stands for tokens that can't be read: its rule reads none from there.
bool FullSearch::isSkipped(const NodeRow& call, std::uint32_t p) const {
    return reach_.mayRecover(call, p) && endsOf(call.arg, p) == kEmpty;
}

FullSearch::SetId FullSearch::setBehind(const NodeRow& call, std::uint32_t p) {
    const SetId ends = endsOf(call.arg, p);
    if (ends == kEmpty) return kEmpty;
    const Set set = sets_[ends];
    const Behind column = behind(call.run);
    // Rules inside each other mostly share the ends further on: only what is new is looked at.
    Known& known = knownBehind_[columnOf_[call.run]];
    const bool grows = containsAll(ends, known.ends);
    const Set seen = sets_[grows ? known.ends : kEmpty];
    if (grows) join(known.behind);
    SetId before = kEmpty;
    for (std::uint32_t i = 0; i < set.count; ++i) {
        const std::uint32_t word = set.firstWord + i;
        std::uint64_t bits = words_[set.offset + i];
        if (word >= seen.firstWord && word < seen.firstWord + seen.count)
            bits &= ~words_[seen.offset + word - seen.firstWord];
        if (bits == 0) continue;
        if ((call.flags & kNonEmpty) && word == (p - from_) / 64)
            bits &= ~(std::uint64_t{1} << ((p - from_) % 64));
        joinWord(word, bits & column.here[word]);
        for (std::uint64_t left = bits & column.elsewhere[word]; left != 0; left &= left - 1) {
            const SetId further =
                setAt(call.run, from_ + word * 64 + static_cast<std::uint32_t>(std::countr_zero(left)));
            if (further != before) join(further);
            before = further;
        }
    }
    steps_ += set.count / 8;
    const SetId made = joined(ends);
    // An end that takes no token counts for some calls and not for others.
    if (!contains(ends, p)) known = {ends, made};
    return made;
}

void FullSearch::widenTo(std::uint32_t from, std::uint32_t to) {
    jointFrom_ = jointTo_ == 0 ? from : std::min(jointFrom_, from);
    jointTo_ = std::max(jointTo_, to);
}

void FullSearch::joinWord(std::uint32_t word, std::uint64_t bits) {
    if (bits == 0) return;
    joint_[word] |= bits;
    widenTo(word, word + 1);
}

void FullSearch::join(SetId id) {
    const Set& set = sets_[id];
    if (set.count == 0) return;
    widenTo(set.firstWord, set.firstWord + set.count);
    // Nearly all of the time at great depth is spent here: a loop that compilers make vector code of.
    std::uint64_t* to = joint_.data() + set.firstWord;
    const std::uint64_t* from = words_.data() + set.offset;
    for (std::uint32_t i = 0; i < set.count; ++i) to[i] |= from[i];
    steps_ += set.count / 8;
}

/// The set made of all that was joined; `like` is taken where it is the same.
FullSearch::SetId FullSearch::joined(SetId like) {
    if (jointTo_ == 0) return kEmpty;
    const auto from = joint_.begin() + jointFrom_, to = joint_.begin() + jointTo_;
    const Set& known = sets_[like];
    SetId made = like;
    if (known.firstWord != jointFrom_ || known.count != jointTo_ - jointFrom_ ||
        !std::equal(from, to, words_.begin() + static_cast<std::ptrdiff_t>(known.offset))) {
        made = static_cast<SetId>(sets_.size());
        sets_.push_back({jointFrom_, jointTo_ - jointFrom_, words_.size()});
        words_.insert(words_.end(), from, to);
    }
    std::fill(from, to, 0);
    jointFrom_ = jointTo_ = 0;
    return made;
}

FullSearch::SetId FullSearch::single(std::uint32_t position) {
    const std::uint32_t here = position - from_;
    joinWord(here / 64, std::uint64_t{1} << (here % 64));
    // Rules often end one in the other: the last set made is likely to be this one.
    return joined(static_cast<SetId>(sets_.size()) - 1);
}

bool FullSearch::isSingle(SetId id, std::uint32_t position) const {
    const Set& set = sets_[id];
    const std::uint32_t here = position - from_;
    return set.count == 1 && set.firstWord == here / 64 &&
           words_[set.offset] == std::uint64_t{1} << (here % 64);
}

bool FullSearch::contains(SetId id, std::uint32_t position) const {
    const Set& set = sets_[id];
    const std::uint32_t here = position - from_, word = here / 64;
    return word >= set.firstWord && word < set.firstWord + set.count &&
           ((words_[set.offset + word - set.firstWord] >> (here % 64)) & 1) != 0;
}

bool FullSearch::containsAll(SetId whole, SetId part) const {
    const Set& w = sets_[whole];
    const Set& p = sets_[part];
    if (p.count == 0) return true;
    if (p.firstWord < w.firstWord || p.firstWord + p.count > w.firstWord + w.count) return false;
    std::uint64_t missing = 0;
    for (std::uint32_t i = 0; i < p.count; ++i)
        missing |= words_[p.offset + i] & ~words_[w.offset + p.firstWord - w.firstWord + i];
    return missing == 0;
}

bool FullSearch::meet(SetId one, SetId other) const {
    const Set& a = sets_[one];
    const Set& b = sets_[other];
    const std::uint32_t to = std::min(a.firstWord + a.count, b.firstWord + b.count);
    for (std::uint32_t w = std::max(a.firstWord, b.firstWord); w < to; ++w)
        if (words_[a.offset + w - a.firstWord] & words_[b.offset + w - b.firstWord]) return true;
    return false;
}

std::uint32_t FullSearch::last(SetId id) const {
    const Set& set = sets_[id];
    const std::uint32_t word = set.firstWord + set.count - 1;
    return from_ + word * 64 + 63 -
           static_cast<std::uint32_t>(std::countl_zero(words_[set.offset + set.count - 1]));
}

// ---- the walk down

FullSearch::Outcome FullSearch::writeDown(std::uint16_t rule, std::uint32_t position) {
    startWalk(rule, position, single(reached_));
    while (!walks_.empty()) {
        if (!walkOn(walks_.back())) {
            if (walks_.size() >= options_.maxDepth) return Outcome::TooDeep;
            continue;
        }
        const Walk ended = walks_.back();
        walks_.pop_back();
        if (walks_.empty()) {
            derivation_.endState = ended.state;
            break;
        }
        comeBack(walks_.back(), ended.part, ended.position, ended.state);
    }
    return Outcome::Found;
}

void FullSearch::startWalk(std::uint16_t rule, std::uint32_t position, SetId wanted) {
    const auto part = static_cast<std::uint32_t>(derivation_.parts.size());
    derivation_.parts.push_back({rule, position, false});
    const std::uint16_t first = table_.rules[rule].entry;
    const std::uint32_t state = addState(first, position, kNone, kNone, kNone);
    walks_.push_back({part, wanted, searchedFrom(table_, first), position, state});
}

/// The call that a walk stands at has read as far as `end`.
void FullSearch::comeBack(Walk& walk, std::uint32_t part, std::uint32_t end, std::uint32_t state) {
    const NodeRow& call = table_.nodes[walk.node];
    const auto made = static_cast<std::uint32_t>(derivation_.ends.size());
    derivation_.ends.push_back({end, end, state, 0, kNone});
    walk.state = addState(call.next, end, walk.state, part, made);
    walk.node = call.run;
    walk.position = end;
}

std::uint32_t FullSearch::addState(std::uint16_t node, std::uint32_t position, std::uint32_t before,
                                   std::uint32_t part, std::uint32_t end) {
    derivation_.states.push_back({position, position, before, part, end, node});
    return static_cast<std::uint32_t>(derivation_.states.size()) - 1;
}

/// Goes on until the path ends, which gives true, or needs the path of a call first.
bool FullSearch::walkOn(Walk& walk) {
    for (;;) {
        const NodeRow& node = table_.nodes[walk.node];
        ++steps_;
        switch (node.op) {
            case Op::End:
                return true;
            case Op::Choice: {
                const ChoiceRow& choice = table_.choices[node.arg];
                std::uint32_t mask = reach_.branches(node, walk.position);
                std::uint16_t target = 0;
                do {  // one of them leads on, or nobody had come here
                    target =
                        table_
                            .targets[choice.firstTarget + static_cast<std::uint32_t>(std::countr_zero(mask))];
                    mask &= mask - 1;
                } while (mask != 0 && !meet(setAt(searchedFrom(table_, target), walk.position), walk.wanted));
                walk.state = addState(target, walk.position, walk.state, kNone, kNone);
                walk.node = searchedFrom(table_, target);
                break;
            }
            case Op::Call: {
                if (isSkipped(node, walk.position)) {
                    const auto part = static_cast<std::uint32_t>(derivation_.parts.size());
                    derivation_.parts.push_back({node.arg, walk.position, true});
                    comeBack(walk, part, recovery_.to, kNone);
                    break;
                }
                const SetId wanted = wantedBy(walk, node);
                startWalk(node.arg, walk.position, wanted);
                return false;
            }
            case Op::Soft:
            case Op::SoftStar: {
                const std::uint16_t next = node.op == Op::Soft ? node.run : walk.node;
                if (text_.isCloser(walk.position) && meet(setAt(next, walk.position + 1), walk.wanted)) {
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

/// The ends of a call that its walk can go on from.
FullSearch::SetId FullSearch::wantedBy(const Walk& walk, const NodeRow& call) {
    const SetId ends = endsOf(call.arg, walk.position);
    const Set set = sets_[ends];
    const Set wanted = sets_[walk.wanted];
    const Behind column = behind(call.run);
    for (std::uint32_t i = 0; i < set.count; ++i) {
        const std::uint32_t word = set.firstWord + i;
        std::uint64_t bits = words_[set.offset + i];
        if ((call.flags & kNonEmpty) && word == (walk.position - from_) / 64)
            bits &= ~(std::uint64_t{1} << ((walk.position - from_) % 64));
        const bool among = word >= wanted.firstWord && word < wanted.firstWord + wanted.count;
        const std::uint64_t here =
            among ? bits & column.here[word] & words_[wanted.offset + word - wanted.firstWord] : 0;
        joinWord(word, here);
        for (std::uint64_t left = bits & column.elsewhere[word] & ~here; left != 0; left &= left - 1) {
            const std::uint64_t bit = left & (~left + 1);
            const auto position = from_ + word * 64 + static_cast<std::uint32_t>(std::countr_zero(left));
            if (meet(setAt(call.run, position), walk.wanted)) joinWord(word, bit);
        }
    }
    steps_ += set.count / 8;
    return joined(ends);
}

}  // namespace zr::engine
