#include "tests/engine/reference_recogniser.h"

#include <iterator>
#include <utility>

#include "tests/grammar/json_string.h"

namespace zr::test {

using engine::Mark;
using engine::NodeRow;
using engine::Op;

namespace {

constexpr std::uint32_t kRecovered = 0xFFFFFFFF;

}  // namespace

ReferenceRecogniser::ReferenceRecogniser(const engine::GrammarTable& grammar,
                                         const std::vector<TokenText>& tokens, std::size_t maxItems)
    : grammar_(grammar), table_(*grammar.parser), tokens_(tokens), itemsLeft_(maxItems) {}

bool ReferenceRecogniser::is(std::uint32_t position, std::uint16_t type) const {
    return position < tokens_.size() && tokens_[position].type == type;
}

bool ReferenceRecogniser::inSet(std::uint32_t set, std::uint32_t position) const {
    if (position >= tokens_.size()) return false;
    const std::uint32_t cls = table_.classOf[tokens_[position].type];
    return (table_.classSets[set * 4 + cls / 64] >> (cls % 64)) & 1;
}

/// Goes over nodes that leave no choice, up to one that does or to the rule's end. False where a token
/// differs.
bool ReferenceRecogniser::stepOver(Place& place) const {
    for (;;) {
        const NodeRow& node = table_.nodes[place.node];
        switch (node.op) {
            case Op::Token:
                if (!is(place.position++, node.arg)) return false;
                break;
            case Op::Hard:
                if (!is(place.position++, table_.closer)) return false;
                break;
            case Op::Set:
                if (!inSet(node.arg, place.position++)) return false;
                break;
            case Op::Root:
            case Op::ScopeBegin:
            case Op::ScopeEnd:
                break;
            default:
                return true;
        }
        place.node = node.next;
    }
}

const ReferenceRecogniser::Items& ReferenceRecogniser::itemsFrom(Place place) {
    static const Items kNothing;
    return stepOver(place) ? itemsAt(place) : kNothing;
}

const ReferenceRecogniser::Items& ReferenceRecogniser::itemsAt(const Place& place) {
    const std::uint64_t key = (static_cast<std::uint64_t>(place.position) << 17) |
                              (static_cast<std::uint64_t>(place.node) << 1) | (place.ofFirstToken ? 1 : 0);
    if (const auto known = memo_.find(key); known != memo_.end()) return known->second;
    Items items = find(place);
    if (items.size() + 1 > itemsLeft_) throw TooMuchWork();
    itemsLeft_ -= items.size() + 1;
    return memo_.emplace(key, std::move(items)).first->second;
}

ReferenceRecogniser::Items ReferenceRecogniser::find(const Place& place) {
    const auto [at, position, ofFirst] = place;
    const NodeRow& node = table_.nodes[at];
    Items found;
    std::vector<bool> known(tokens_.size() + 1, false);
    const auto add = [&](std::uint32_t way, const Items& items) {
        for (std::uint32_t i = 0; i < items.size(); ++i) {
            if (known[items[i].end]) continue;
            known[items[i].end] = true;
            found.push_back({items[i].end, way, i});
        }
    };
    switch (node.op) {
        case Op::Choice: {
            const engine::ChoiceRow& choice = table_.choices[node.arg];
            for (std::uint32_t i = 0; i < choice.targets; ++i)
                add(i, itemsFrom({table_.targets[choice.firstTarget + i], position, ofFirst}));
            break;
        }
        case Op::Soft:
            if (is(position, table_.closer)) add(0, itemsFrom({node.next, position + 1, ofFirst}));
            add(1, itemsFrom({node.next, position, ofFirst}));
            break;
        case Op::SoftStar:
            if (is(position, table_.closer)) add(0, itemsAt({at, position + 1, ofFirst}));
            add(1, itemsFrom({node.next, position, ofFirst}));
            break;
        case Op::Call: {
            const Items& called =
                itemsFrom({table_.rules[node.arg].entry, position, recovering_ && position == 0});
            for (std::uint32_t i = 0; i < called.size(); ++i) {
                if (called[i].end == position && (node.flags & engine::kNonEmpty)) continue;
                add(i, itemsFrom({node.next, called[i].end, ofFirst}));
            }
            if (node.arg != table_.recoverRule || !ofFirst) break;
            askedAt_ = std::max<std::int64_t>(askedAt_, position);
            if (position == recoverAt_ && called.empty())
                add(kRecovered, itemsFrom({node.next, endOfRecovery(position), ofFirst}));
            break;
        }
        default:  // the rule's end
            found.push_back({position, 0, 0});
            break;
    }
    return found;
}

std::uint32_t ReferenceRecogniser::endOfRecovery(std::uint32_t position) const {
    int depth = 0;
    for (; position < tokens_.size(); ++position) {
        if (depth == 0 && inSet(table_.recoverFollowSet, position)) break;
        if (is(position, table_.leftParen)) ++depth;
        if (is(position, table_.rightParen) && depth > 0) --depth;
    }
    return position;
}

const ReferenceRecogniser::Item* ReferenceRecogniser::furthest(const Items& items) const {
    const Item* best = nullptr;
    for (const Item& item : items)
        if (best == nullptr || item.end > best->end) best = &item;
    return best;
}

ReferenceRecogniser::Reading ReferenceRecogniser::read() {
    Reading reading;
    Place start{table_.rules[table_.statementRule].entry, 0, false};
    const Items* items = &itemsFrom(start);
    if (items->empty() && table_.recoverRule != engine::kNone16) {
        // Once to learn the last place where the statement asks for the rule, once with tokens skipped there.
        recovering_ = reading.recovered = start.ofFirstToken = true;
        memo_.clear();
        itemsFrom(start);
        memo_.clear();
        recoverAt_ = askedAt_;
        items = &itemsFrom(start);
    }
    const Item* best = furthest(*items);
    if (best == nullptr) {
        reading.tree.add(0, "\"Tree Error Node\"", 0);
        return reading;
    }
    reading.found = true;
    reading.taken = best->end;
    std::vector<Scope> scopes{{Mark::None, {}, false}};
    build(scopes, start, static_cast<std::uint32_t>(best - items->data()));
    scopes[0].gather();
    if (scopes[0].list.size() == 1) {
        dump(scopes[0].list[0], 0, reading.tree);
    } else {
        dump({0, u"nil", std::move(scopes[0].list)}, 0, reading.tree);
    }
    return reading;
}

void ReferenceRecogniser::Scope::gather() {
    if (!rooted) return;
    Tree& root = list[0];
    std::move(list.begin() + 1, list.end(), std::back_inserter(root.children));
    list.resize(1);
}

void ReferenceRecogniser::Scope::becomeRoot(Tree root) {
    gather();
    std::move(list.begin(), list.end(), std::back_inserter(root.children));
    list.clear();
    list.push_back(std::move(root));
    rooted = true;
}

/// Ends the innermost rule: its trees go to the rule around it, by the mark of the call.
void ReferenceRecogniser::close(std::vector<Scope>& scopes) {
    Scope scope = std::move(scopes.back());
    scopes.pop_back();
    scope.gather();
    if (scope.mark == Mark::Drop || scope.list.empty()) return;
    if (scope.mark == Mark::Root) {
        scope.rooted = true;
        scope.gather();
        scopes.back().becomeRoot(std::move(scope.list[0]));
    } else {
        std::move(scope.list.begin(), scope.list.end(), std::back_inserter(scopes.back().list));
    }
}

void ReferenceRecogniser::build(std::vector<Scope>& scopes, Place place, std::uint32_t item) {
    for (;;) {
        const NodeRow& node = table_.nodes[place.node];
        switch (node.op) {
            case Op::End:
                return;
            case Op::Token:
            case Op::Set:
            case Op::Hard: {
                const TokenText& token = tokens_[place.position++];
                if (node.mark == Mark::Root)
                    scopes.back().becomeRoot({token.type, token.text, {}});
                else if (node.mark == Mark::None)
                    scopes.back().list.push_back({token.type, token.text, {}});
                break;
            }
            case Op::Root: {
                const std::string_view name = grammar_.tokenNames[node.arg];
                scopes.back().becomeRoot({node.arg, {name.begin(), name.end()}, {}});
                break;
            }
            case Op::ScopeBegin:
                scopes.push_back({node.mark, {}, false});
                break;
            case Op::ScopeEnd:
                close(scopes);
                break;
            case Op::Choice: {
                const Item& taken = itemsAt(place)[item];
                item = taken.rest;
                place.node = table_.targets[table_.choices[node.arg].firstTarget + taken.way];
                continue;
            }
            case Op::Soft:
            case Op::SoftStar: {
                const Item& taken = itemsAt(place)[item];
                item = taken.rest;
                if (taken.way != 0) break;
                const TokenText& token = tokens_[place.position++];
                if (node.mark == Mark::None) scopes.back().list.push_back({token.type, token.text, {}});
                if (node.op == Op::SoftStar) continue;
                break;
            }
            case Op::Call: {
                const Item& taken = itemsAt(place)[item];
                item = taken.rest;
                scopes.push_back({node.mark, {}, false});
                if (taken.way == kRecovered) {
                    scopes.back().list.push_back({0, u"Tree Error Node", {}});
                    close(scopes);
                    place.position = endOfRecovery(place.position);
                    break;
                }
                const Place called{table_.rules[node.arg].entry, place.position,
                                   recovering_ && place.position == 0};
                const std::uint32_t end = itemsFrom(called)[taken.way].end;
                build(scopes, called, taken.way);
                close(scopes);
                place.position = end;
                break;
            }
        }
        place.node = node.next;
    }
}

void ReferenceRecogniser::dump(const Tree& tree, std::size_t depth, SyntaxDump& to) {
    to.add(tree.type, quoteJson(tree.text), depth);
    for (const Tree& child : tree.children) dump(child, depth + 1, to);
}

}  // namespace zr::test
