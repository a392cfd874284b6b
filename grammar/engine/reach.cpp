#include "grammar/engine/reach.h"

#include <algorithm>
#include <bit>

namespace zr::engine {

Reach::Reach(const ParserTable& table, TextIndex& text, const Recovery& recovery)
    : table_(table), text_(text), recovery_(recovery), words_((table.stops + 63) / 64) {}

template <typename Visit>
void Reach::forEachCall(std::uint16_t rule, Visit visit) const {
    for (std::uint32_t i = table_.callsFrom[rule]; i < table_.callsFrom[rule + 1u]; ++i)
        visit(table_.calls[i]);
}

bool Reach::mayBeEmpty(const NodeRow& call) const {
    return table_.rules[call.arg].nullable && !(call.flags & kNonEmpty);
}

bool Reach::mayCall(const NodeRow& call, std::uint32_t position) {
    const bool recovers = recovery_.place != kNone;
    if (!mayBeEmpty(call) && (!text_.inSet(table_.firstSetBase + call.arg, text_.classAt(position)) ||
                              (!recovers && !text_.secondFits(call.arg, position))))
        return false;
    return text_.guarded(call, position);
}

std::uint32_t Reach::branches(const NodeRow& choice, std::uint32_t position) const {
    // The part that recovery replaces starts with none of its tokens: look at every way to it.
    if (position == recovery_.place)
        return static_cast<std::uint32_t>((std::uint64_t{1} << table_.choices[choice.arg].count) - 1);
    return text_.viable(choice, position, position);
}

/// Whether an end at a position can be that of a call that was met.
bool Reach::comesBack(std::uint16_t call, std::uint32_t position) const {
    return metAt_[call] < position || (metAt_[call] == position && mayBeEmpty(table_.nodes[call]));
}

// ---- forward

void Reach::follow(std::uint16_t rule, std::uint32_t position) {
    rule_ = rule;
    from_ = position;
    end_ = text_.count();
    met_.assign((end_ - from_ + 1) * words_, 0);
    metAt_.assign(table_.stops, kNone);
    endedAt_.assign(table_.ruleCount, kNone);
    order_.clear();
    orderFrom_.clear();
    ends_.clear();
    meet(searchedFrom(table_, table_.rules[rule].entry), position);
    for (std::uint32_t p = position; p <= end_; ++p) {
        orderFrom_.push_back(static_cast<std::uint32_t>(order_.size()));
        for (const std::uint16_t node : ahead_) meet(node, p);
        ahead_.clear();
        if (p == recovery_.to)
            for (const std::uint16_t node : skipped_) meet(node, p);
        while (!open_.empty()) {
            const std::uint16_t node = open_.back();
            open_.pop_back();
            order_.push_back(node);
            pass(node, p);
        }
    }
    orderFrom_.push_back(static_cast<std::uint32_t>(order_.size()));
}

void Reach::meet(std::uint16_t node, std::uint32_t position) {
    if (has(met_, node, position)) return;
    set(met_, node, position);
    open_.push_back(node);
}

void Reach::pass(std::uint16_t at, std::uint32_t p) {
    const NodeRow& node = table_.nodes[at];
    switch (node.op) {
        case Op::Token:
            if (p < end_ && text_.type(p) == node.arg) ahead_.push_back(node.run);
            break;
        case Op::Set:
            if (p < end_ && text_.inSet(node.arg, text_.classAt(p))) ahead_.push_back(node.run);
            break;
        case Op::Hard:
            if (text_.isCloser(p)) ahead_.push_back(node.run);
            break;
        case Op::Soft:
        case Op::SoftStar:
            if (text_.isCloser(p)) ahead_.push_back(node.op == Op::Soft ? node.run : at);
            meet(node.run, p);
            break;
        case Op::Choice:
            for (std::uint32_t mask = branches(node, p); mask != 0; mask &= mask - 1)
                meet(branchTarget(table_, node, static_cast<std::uint32_t>(std::countr_zero(mask))), p);
            break;
        case Op::Call:
            if (mayRecover(node, p)) {
                if (recovery_.to == p)
                    meet(node.run, p);
                else
                    skipped_.push_back(node.run);
            }
            if (!mayCall(node, p)) break;
            if (metAt_[at] == kNone) metAt_[at] = p;
            meet(searchedFrom(table_, table_.rules[node.arg].entry), p);
            if (endedAt_[node.arg] == p && comesBack(at, p)) meet(node.run, p);
            break;
        case Op::End:
            endedAt_[node.arg] = p;
            if (node.arg == rule_) ends_.push_back(p);
            forEachCall(node.arg, [&](std::uint16_t call) {
                if (comesBack(call, p)) meet(table_.nodes[call].run, p);
            });
            break;
        case Op::Root:
        case Op::ScopeBegin:
        case Op::ScopeEnd:
            break;  // nobody stops there
    }
}

// ---- back

void Reach::keep(std::uint32_t first, std::uint32_t last) {
    firstEnd_ = first;
    end_ = last;
    kept_.assign((last - from_ + 1) * words_, 0);
    keptCount_ = 0;
    returns_.assign(table_.stops, 0);
    for (std::uint32_t p = last + 1; p-- > from_;) {
        const std::uint16_t* begin = order_.data() + orderFrom_[p - from_];
        const std::uint16_t* end = order_.data() + orderFrom_[p - from_ + 1];
        std::size_t before;
        const std::size_t ahead = keptCount_;
        do {
            before = keptCount_;
            for (const std::uint16_t* node = end; node-- != begin;) {
                if (has(kept_, *node, p) || !leadsOn(*node, p)) continue;
                set(kept_, *node, p);
                ++keptCount_;
            }
        } while (keptCount_ != before);
        const bool skipped = p > recovery_.place && p < recovery_.to;
        if (keptCount_ == ahead && p < firstEnd_ && !skipped) return;  // nothing gets past here
        for (const std::uint16_t* node = begin; node != end; ++node)
            if (table_.nodes[*node].op == Op::End && has(kept_, *node, p)) noteReturns(*node, p);
    }
}

void Reach::noteReturns(std::uint16_t end, std::uint32_t position) {
    forEachCall(table_.nodes[end].arg, [&](std::uint16_t call) {
        if (has(kept_, table_.nodes[call].run, position)) returns_[call] = 1;
    });
}

bool Reach::leadsOn(std::uint16_t at, std::uint32_t p) {
    const NodeRow& node = table_.nodes[at];
    switch (node.op) {
        case Op::Token:
            return p < end_ && text_.type(p) == node.arg && has(kept_, node.run, p + 1);
        case Op::Set:
            return p < end_ && text_.inSet(node.arg, text_.classAt(p)) && has(kept_, node.run, p + 1);
        case Op::Hard:
            return p < end_ && text_.isCloser(p) && has(kept_, node.run, p + 1);
        case Op::Soft:
        case Op::SoftStar:
            return has(kept_, node.run, p) ||
                   (p < end_ && text_.isCloser(p) && has(kept_, node.op == Op::Soft ? node.run : at, p + 1));
        case Op::Choice:
            for (std::uint32_t mask = branches(node, p); mask != 0; mask &= mask - 1)
                if (has(kept_, branchTarget(table_, node, static_cast<std::uint32_t>(std::countr_zero(mask))),
                        p))
                    return true;
            return false;
        case Op::Call:
            if (mayRecover(node, p) && recovery_.to <= end_ && has(kept_, node.run, recovery_.to))
                return true;
            return (returns_[at] || (mayBeEmpty(node) && has(kept_, node.run, p))) &&
                   has(kept_, searchedFrom(table_, table_.rules[node.arg].entry), p) && mayCall(node, p);
        case Op::End: {
            if (node.arg == rule_ && p >= firstEnd_) return true;
            bool goesOn = false;
            forEachCall(node.arg, [&](std::uint16_t call) {
                goesOn = goesOn || (comesBack(call, p) && has(kept_, table_.nodes[call].run, p));
            });
            return goesOn;
        }
        case Op::Root:
        case Op::ScopeBegin:
        case Op::ScopeEnd:
            break;
    }
    return false;
}

}  // namespace zr::engine
