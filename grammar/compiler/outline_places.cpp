#include "grammar/compiler/outline_places.h"

namespace zr::gc {

OutlinePlaces::OutlinePlaces(const Program& program, const ParserGrammar& grammar)
    : p_(program), grammar_(grammar) {
    findRules();
    findDepths();
    findRecursions();
    findPlaces();
}

void OutlinePlaces::findRules() {
    ruleOf_.assign(p_.nodes.size(), -1);
    callsIn_.resize(p_.entry.size());
    for (std::size_t rule = 0; rule < p_.entry.size(); ++rule) {
        std::vector<int> open{p_.entry[rule]};
        while (!open.empty()) {
            const int at = open.back();
            open.pop_back();
            if (at < 0 || ruleOf_[index(at)] >= 0) continue;
            ruleOf_[index(at)] = static_cast<int>(rule);
            const Node& n = p_.nodes[index(at)];
            if (n.op == Op::Call) callsIn_[rule].push_back(at);
            open.insert(open.end(), n.targets.begin(), n.targets.end());
            if (n.op != Op::End) open.push_back(n.next);
        }
    }
}

void OutlinePlaces::findDepths() {
    depthOf_.assign(p_.entry.size(), static_cast<int>(p_.entry.size()));
    depthOf_[index(grammar_.statement)] = 0;
    std::vector<int> rules{grammar_.statement};
    for (std::size_t i = 0; i < rules.size(); ++i) {
        for (int call : callsIn_[index(rules[i])]) {
            const int rule = p_.nodes[index(call)].arg;
            const int depth = depthOf_[index(rules[i])] + 1;
            if (depthOf_[index(rule)] <= depth) continue;
            depthOf_[index(rule)] = depth;
            rules.push_back(rule);
        }
    }
}

/// Whether a call leads from inside a statement to a whole one: back to the island or to what is ahead of it.
/// Without an island to what the statement itself calls.
bool OutlinePlaces::isNested(int from, int to) const {
    const int depth = grammar_.islandRule < 0 ? 1 : depthOf_[index(grammar_.islandRule)];
    return depthOf_[index(to)] <= depth && depthOf_[index(from)] >= depth;
}

std::set<int> OutlinePlaces::callsOf(int rule) const {
    std::set<int> found;
    for (int call : callsIn_[index(rule)])
        if (const int called = p_.nodes[index(call)].arg; !isNested(rule, called)) found.insert(called);
    return found;
}

void OutlinePlaces::findRecursions() {
    const std::size_t rules = p_.entry.size();
    leadsTo_.assign(rules, std::vector<bool>(rules, false));
    std::vector<std::set<int>> calls;
    for (std::size_t rule = 0; rule < rules; ++rule) calls.push_back(callsOf(static_cast<int>(rule)));
    for (std::size_t rule = 0; rule < rules; ++rule) {
        std::vector<int> open(calls[rule].begin(), calls[rule].end());
        while (!open.empty()) {
            const int to = open.back();
            open.pop_back();
            if (leadsTo_[rule][index(to)]) continue;
            leadsTo_[rule][index(to)] = true;
            open.insert(open.end(), calls[index(to)].begin(), calls[index(to)].end());
        }
    }
}

/// What is remembered inside a call that is made in `from`.
int OutlinePlaces::around(const Node& call, int from, int outer) {
    if (isNested(from, call.arg)) return kNested;
    if (leadsTo_[index(call.arg)][index(from)]) return outer;
    if (leadsTo_[index(call.arg)][index(call.arg)]) return arounds_[index(outer)].level;
    const auto [found, fresh] =
        aroundOf_.emplace(std::pair(call.next, outer), static_cast<int>(arounds_.size()));
    if (fresh) arounds_.push_back({call.next, outer, arounds_[index(outer)].level});
    return found->second;
}

int OutlinePlaces::place(int node, int around) {
    const std::pair made(p_.skip(node), around);
    const auto [found, fresh] = placeOf_.emplace(made, static_cast<int>(places_.size()));
    if (fresh) {
        places_.push_back(made);
        beside_.emplace_back();
        behind_.push_back(-1);
        isEnd_.push_back(false);
    }
    return found->second;
}

void OutlinePlaces::findPlaces() {
    place(p_.entry[index(grammar_.statement)], kStatement);
    for (std::size_t i = 0; i < places_.size() && !areTooMany(); ++i) passPlace(static_cast<int>(i));
    for (std::size_t i = 0; i < places_.size(); ++i) {
        const auto [at, around] = places_[i];
        const Node& n = p_.nodes[index(at)];
        if (n.op != Op::End) continue;
        isEnd_[i] = n.arg == grammar_.statement && around == kStatement;
        const std::set<int>& behind = behindCalls_[{n.arg, around}];
        beside_[i].assign(behind.begin(), behind.end());
    }
}

void OutlinePlaces::passPlace(int from) {
    const auto [at, outer] = places_[index(from)];
    const Node& n = p_.nodes[index(at)];
    const auto goOn = [&](int to) { beside_[index(from)].push_back(to); };
    switch (n.op) {
        case Op::Token:
        case Op::Set:
        case Op::Soft: {
            const int next = place(n.next, outer);
            behind_[index(from)] = next;
            if (n.op == Op::Soft) goOn(next);
            break;
        }
        case Op::SoftStar:
            behind_[index(from)] = from;
            goOn(place(n.next, outer));
            break;
        case Op::Choice:
            for (int target : n.targets) goOn(place(target, outer));
            break;
        case Op::Call: {
            const int inside = around(n, ruleOf_[index(at)], outer);
            goOn(place(p_.entry[index(n.arg)], inside));
            behindCalls_[{n.arg, inside}].insert(place(n.next, outer));
            break;
        }
        default:
            break;
    }
}

}  // namespace zr::gc
