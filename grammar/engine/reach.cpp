#include "grammar/engine/reach.h"

#include <algorithm>
#include <bit>

namespace zr::engine {

void Reach::start(const ParserTable& table, TextIndex& text, const Recovery& recovery) {
    table_ = &table;
    text_ = &text;
    recovery_ = recovery;
}

std::size_t Reach::bytes() const {
    return kept_.size() * sizeof(std::uint16_t) + (ways_.size() + steps_.size()) * sizeof(Way);
}

std::size_t Reach::capacity() const {
    return kept_.capacity() * sizeof(std::uint16_t) + keptFrom_.capacity() * sizeof(std::uint32_t) +
           (ways_.capacity() + steps_.capacity() + skips_.capacity()) * sizeof(Way) +
           (waysFrom_.capacity() + stepsFrom_.capacity() + ends_.capacity()) * sizeof(std::uint32_t);
}

template <typename Visit>
void Reach::forEachCallMet(std::uint16_t rule, Visit visit) const {
    for (std::uint16_t call = called_[rule]; call != kNone16; call = callBefore_[call]) visit(call);
}

bool Reach::mayBeEmpty(const NodeRow& call) const {
    return table_->rules[call.arg].nullable && !(call.flags & kNonEmpty);
}

bool Reach::mayCall(const NodeRow& call, std::uint32_t position) {
    if (!mayBeEmpty(call) && !text_->inSet(table_->firstSetBase + call.arg, text_->classAt(position)))
        return false;
    return text_->guarded(call, position);
}

/// Whether an end at a position can be that of a call that was met.
bool Reach::comesBack(std::uint16_t call, std::uint32_t position) const {
    return metAt_[call] < position || (metAt_[call] == position && mayBeEmpty(table_->nodes[call]));
}

// ---- forward

bool Reach::follow(std::uint16_t rule, std::uint32_t position, std::size_t most) {
    rule_ = rule;
    from_ = position;
    end_ = text_->count();
    const std::uint16_t entry = searchedFrom(*table_, table_->rules[rule].entry);
    nodes_ = entry < table_->statementStops ? table_->statementStops : table_->stops;
    words_ = (nodes_ + 63) / 64;
    met_.assign(words_, 0);
    open_.clear();  // a search that memory ran out for leaves some
    metAt_.assign(nodes_, kNone);
    callBefore_.assign(nodes_, kNone16);
    called_.assign(table_->ruleCount, kNone16);
    endedAt_.assign(table_->ruleCount, kNone);
    endOf_.assign(table_->ruleCount, kNone16);
    ways_.clear();
    steps_.clear();
    waysFrom_.clear();
    stepsFrom_.clear();
    kept_.clear();
    skips_.clear();
    ends_.clear();
    meet(entry);
    for (std::uint32_t p = position; p <= end_; ++p) {
        const std::size_t ahead = stepsFrom_.empty() ? 0 : stepsFrom_.back();
        beginPosition();
        for (std::size_t i = ahead; i < stepsFrom_.back(); ++i) meet(steps_[i].to);
        if (p == recovery_.to)
            for (const Way& skip : skips_) meet(skip.to);
        while (!open_.empty()) {
            const std::uint16_t at = open_.back();
            open_.pop_back();
            pass(at, p);
        }
        std::fill(met_.begin(), met_.end(), 0);
        const bool skips = !skips_.empty() && p < recovery_.to;
        if (bytes() > most) return false;
        if (steps_.size() == stepsFrom_.back() && !skips) break;
    }
    beginPosition();
    return true;
}

void Reach::beginPosition() {
    waysFrom_.push_back(static_cast<std::uint32_t>(ways_.size()));
    stepsFrom_.push_back(static_cast<std::uint32_t>(steps_.size()));
}

void Reach::pass(std::uint16_t at, std::uint32_t p) {
    const NodeRow& node = table_->nodes[at];
    switch (node.op) {
        case Op::Token:
            if (p < end_ && text_->type(p) == node.arg) steps_.push_back({at, node.run});
            break;
        case Op::Set:
            if (p < end_ && text_->inSet(node.arg, text_->classAt(p))) steps_.push_back({at, node.run});
            break;
        case Op::Hard:
            if (text_->isCloser(p)) steps_.push_back({at, node.run});
            break;
        case Op::Soft:
        case Op::SoftStar:
            if (text_->isCloser(p)) steps_.push_back({at, node.op == Op::Soft ? node.run : at});
            lead(at, node.run);
            break;
        case Op::Choice:
            for (std::uint32_t mask = branches(node, p); mask != 0; mask &= mask - 1)
                lead(at, branchStop(*table_, node, static_cast<std::uint32_t>(std::countr_zero(mask))));
            break;
        case Op::Call:
            passCall(at, p);
            break;
        case Op::End:
            endedAt_[node.arg] = p;
            endOf_[node.arg] = at;
            if (node.arg == rule_) ends_.push_back(p);
            forEachCallMet(node.arg, [&](std::uint16_t call) {
                if (comesBack(call, p)) lead(at, table_->nodes[call].run);
            });
            break;
        case Op::Root:
        case Op::ScopeBegin:
        case Op::ScopeEnd:
            break;  // nobody stops there
    }
}

void Reach::passCall(std::uint16_t at, std::uint32_t p) {
    const NodeRow& call = table_->nodes[at];
    if (mayRecover(call, p)) {
        skips_.push_back({at, call.run});
        if (recovery_.to == p) meet(call.run);
    }
    if (!mayCall(call, p)) return;
    // Behind it everything goes on that its rule ends with from here on.
    if (metAt_[at] == kNone) {
        metAt_[at] = p;
        callBefore_[at] = called_[call.arg];
        called_[call.arg] = at;
    }
    if (endedAt_[call.arg] == p && comesBack(at, p)) lead(endOf_[call.arg], call.run);
    // Whether a call leads on that need not take a token depends on what is behind it at the same position,
    // too.
    if (mayBeEmpty(call)) ways_.push_back({at, call.run});
    lead(at, searchedFrom(*table_, table_->rules[call.arg].entry));
}

// ---- back

/// Whether a node is kept for something that is kept behind it at the same position.
bool Reach::leadsOn(std::uint16_t at) const {
    const NodeRow& node = table_->nodes[at];
    if (node.op != Op::Call) return true;
    return has(here_.data(), searchedFrom(*table_, table_->rules[node.arg].entry)) &&
           (returns_[at] || (mayBeEmpty(node) && has(here_.data(), node.run)));
}

void Reach::keepNode(std::uint16_t node) {
    if (has(here_.data(), node)) return;
    set(here_.data(), node);
    open_.push_back(node);
}

void Reach::keep(std::uint32_t first, std::uint32_t last) {
    end_ = last;
    kept_.clear();
    keptFrom_.assign(last - from_ + 2, 0);
    here_.assign(words_, 0);
    next_.assign(words_, 0);
    returns_.assign(nodes_, 0);
    wayTo_.assign(nodes_, kNone);
    for (std::uint32_t p = last + 1; p-- > from_;) {
        const std::uint32_t here = p - from_;
        for (std::uint32_t i = stepsFrom_[here]; p < last && i < stepsFrom_[here + 1]; ++i)
            if (has(next_.data(), steps_[i].to)) keepNode(steps_[i].from);
        if (p >= first && std::binary_search(ends_.begin(), ends_.end(), p)) keepNode(endOf_[rule_]);
        for (const Way& skip : skips_)
            if (p == recovery_.place && p < recovery_.to && keptPlace(skip.to, recovery_.to) != kNone)
                keepNode(skip.from);
        if (!open_.empty()) keepAt(p);
        noteKept(here);
        const bool skipped = p > recovery_.place && p < recovery_.to;
        if (keptFrom_[here] == keptFrom_[here + 1] && p < first && !skipped) {
            std::fill_n(keptFrom_.begin(), here, keptFrom_[here]);
            return;  // nothing gets past here
        }
    }
}

/// Writes down what was kept at the position at hand, and goes on to the one before it.
void Reach::noteKept(std::uint32_t here) {
    keptFrom_[here + 1] = static_cast<std::uint32_t>(kept_.size());
    for (std::size_t w = 0; w < words_; ++w)
        for (std::uint64_t left = here_[w]; left != 0; left &= left - 1) {
            growSlowly(kept_);
            kept_.push_back(
                static_cast<std::uint16_t>(w * 64 + static_cast<unsigned>(std::countr_zero(left))));
        }
    keptFrom_[here] = static_cast<std::uint32_t>(kept_.size());
    here_.swap(next_);
    std::fill(here_.begin(), here_.end(), 0);
}

/// Goes back along the ways at a position.
void Reach::keepAt(std::uint32_t p) {
    const Way* ways = ways_.data() + waysFrom_[p - from_];
    const std::uint32_t count = waysFrom_[p - from_ + 1] - waysFrom_[p - from_];
    ended_.clear();
    wayBefore_.resize(count);
    for (std::uint32_t i = 0; i < count; ++i) {
        wayBefore_[i] = wayTo_[ways[i].to];
        wayTo_[ways[i].to] = i;
    }
    while (!open_.empty()) {
        const std::uint16_t node = open_.back();
        open_.pop_back();
        if (table_->nodes[node].op == Op::End) ended_.push_back(table_->nodes[node].arg);
        for (std::uint32_t way = wayTo_[node]; way != kNone; way = wayBefore_[way])
            if (leadsOn(ways[way].from)) keepNode(ways[way].from);
        if (p == recovery_.place && p == recovery_.to)
            for (const Way& skip : skips_)
                if (skip.to == node) keepNode(skip.from);
    }
    for (std::uint32_t i = 0; i < count; ++i) wayTo_[ways[i].to] = kNone;
    for (const std::uint16_t rule : ended_)
        forEachCallMet(rule, [&](std::uint16_t call) {
            if (has(here_.data(), table_->nodes[call].run)) returns_[call] = 1;
        });
}

}  // namespace zr::engine
