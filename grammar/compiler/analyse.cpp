#include <algorithm>
#include <bitset>
#include <map>

#include "grammar/compiler/error.h"
#include "grammar/compiler/passes.h"

namespace zr::gc {
namespace {

constexpr std::size_t kMaxTokens = 1024;
using TokenBits = std::bitset<kMaxTokens>;

/// A guard costs a backward scan of the text once, so it is only made where few tokens can follow.
constexpr std::size_t kSelective = 90;

void firstSets(Program& p, const Facts& facts) {
    for (bool changed = true; changed;) {
        changed = false;
        for (std::size_t i = p.nodes.size(); i-- > 0;) {
            Node& n = p.nodes[i];
            std::set<int> first = n.first;
            bool canEnd = n.canEnd;
            const auto join = [&](int next) {
                first.insert(p.nodes[index(next)].first.begin(), p.nodes[index(next)].first.end());
                canEnd = canEnd || p.nodes[index(next)].canEnd;
            };
            switch (n.op) {
                case Op::Token:
                    first.insert(n.arg);
                    break;
                case Op::Set:
                    first.insert(p.sets[index(n.arg)].begin(), p.sets[index(n.arg)].end());
                    break;
                case Op::Call:
                    first.insert(facts.first[index(n.arg)].begin(), facts.first[index(n.arg)].end());
                    if (facts.nullable[index(n.arg)] && !n.nonEmpty) join(n.next);
                    break;
                case Op::Choice:
                    for (int t : n.targets) join(t);
                    break;
                case Op::Soft:
                case Op::SoftStar:
                    first.insert(n.arg);
                    join(n.next);
                    break;
                case Op::End:
                    canEnd = true;
                    break;
                default:
                    join(n.next);
            }
            if (first.size() != n.first.size() || canEnd != n.canEnd) {
                n.first = std::move(first);
                n.canEnd = canEnd;
                changed = true;
            }
        }
    }
}

void runLinks(Program& p) {
    for (Node& n : p.nodes) {
        if (n.next >= 0) n.run = p.skip(n.next);
        if (n.op == Op::Call) p.nodes[index(n.run)].behindCall = true;
    }
}

/// Tokens that every way from a node to the end of its rule takes.
std::vector<TokenBits> requiredTokens(const Program& p) {
    TokenBits all;
    all.set();
    std::vector<TokenBits> must(p.nodes.size(), all);
    for (bool changed = true; changed;) {
        changed = false;
        for (std::size_t i = p.nodes.size(); i-- > 0;) {
            const Node& n = p.nodes[i];
            TokenBits now;
            switch (n.op) {
                case Op::End:
                    break;
                case Op::Choice:
                    now.set();
                    for (int t : n.targets) now &= must[index(t)];
                    break;
                case Op::Token:
                    now = must[index(n.next)];
                    now.set(index(n.arg));
                    break;
                case Op::Call:
                    now = must[index(n.next)] | must[index(p.entry[index(n.arg)])];
                    break;
                default:
                    now = must[index(n.next)];
            }
            if (now != must[i]) {
                must[i] = now;
                changed = true;
            }
        }
    }
    return must;
}

/// Whether what must follow a call is worth asking for: it must follow, and few tokens are it.
bool isGuarded(const Program& p, const Facts& facts, const Node& call) {
    const Node& after = p.nodes[index(call.run)];
    return !after.canEnd && !facts.nullable[index(call.arg)] && after.first.size() <= kSelective;
}

void guardCalls(Program& p, const Facts& facts) {
    const std::vector<TokenBits> must = requiredTokens(p);
    std::map<int, int> uses;  // how often the program takes a token: rare ones make the better question
    for (const Node& n : p.nodes) {
        if (n.op == Op::Token) ++uses[n.arg];
        if (n.op == Op::Set)
            for (int t : p.sets[index(n.arg)]) ++uses[t];
    }
    for (Node& n : p.nodes) {
        if (n.op != Op::Call) continue;
        const TokenBits needed = must[index(n.next)] | must[index(p.entry[index(n.arg)])];
        int best = -1;
        for (std::size_t t = 0; t < kMaxTokens; ++t)
            if (needed[t] && uses.count(static_cast<int>(t)) &&
                (best < 0 || uses[static_cast<int>(t)] < uses[best]))
                best = static_cast<int>(t);
        n.required = best;
        if (!isGuarded(p, facts, n)) continue;
        Guard guard{
            p.nodes[index(n.run)].first, facts.last[index(n.arg)], facts.outside[index(n.arg)], n.arg, {}};
        const auto found = std::find(p.guards.begin(), p.guards.end(), guard);
        n.guard = static_cast<int>(found - p.guards.begin());
        if (found == p.guards.end()) p.guards.push_back(std::move(guard));
    }
}

/// Tokens that no set tells apart share a class; the tables are indexed by class.
void tokenClasses(Program& p, const Facts& facts, int maxToken) {
    std::vector<const std::set<int>*> sets;
    for (const auto& s : p.sets) sets.push_back(&s);
    for (const auto& s : facts.first) sets.push_back(&s);
    for (const auto& g : p.guards) {
        sets.push_back(&g.follow);
        sets.push_back(&g.last);
        sets.push_back(&g.outside);
    }
    sets.push_back(&facts.openers);
    for (const Node& n : p.nodes)
        if (n.op == Op::Choice)
            for (int t : n.targets) sets.push_back(&p.nodes[index(t)].first);
    sets.push_back(&p.recoverFollow);
    std::set<std::set<int>> required;  // each on its own: a token of its class mustn't stand for it
    for (const Node& n : p.nodes)
        if (n.required >= 0) required.insert({n.required});
    for (const auto& each : required) sets.push_back(&each);
    const std::set<int> closer{p.closer};
    sets.push_back(&closer);

    std::map<std::vector<bool>, int> classes;
    p.classOf.assign(index(maxToken) + 1, 0);
    for (int token = 0; token <= maxToken; ++token) {
        std::vector<bool> signature;
        signature.reserve(sets.size() + 1);
        for (const auto* s : sets) signature.push_back(s->count(token) != 0);
        signature.push_back(token == kEof);
        const auto [found, fresh] = classes.emplace(std::move(signature), static_cast<int>(classes.size()));
        p.classOf[index(token)] = found->second;
    }
    p.classes = static_cast<int>(classes.size());
}

/// The island token must be the island rule's own, with one token before it at most: the barrier of a guard
/// counts on that.
void checkIsland(const ParserGrammar& grammar, const Facts& facts) {
    if (grammar.islandRule < 0) return;
    const Rule& rule = grammar.rules[index(grammar.islandRule)];
    const auto& elements = rule.alternatives[0].elements;
    const auto isToken = [&](std::size_t i) {
        return i < elements.size() && elements[i].single && elements[i].repeat == Repeat::Once &&
               elements[i].tokens.count(grammar.islandToken) != 0;
    };
    const Element* before = &elements[0];
    while (before->kind == Element::Kind::Group && before->alternatives.size() == 1 &&
           before->alternatives[0].elements.size() == 1)
        before = &before->alternatives[0].elements[0];
    bool ok = rule.alternatives.size() == 1 && (isToken(0) || (isToken(1) && before->single));
    for (std::size_t r = 0; r < facts.outside.size(); ++r)
        ok = ok && (facts.outside[r].count(grammar.islandToken) == 0 ||
                    static_cast<int>(r) == grammar.islandRule || static_cast<int>(r) == grammar.start);
    if (!ok)
        throw GrammarError(rule.file, rule.line,
                           "island rule " + rule.name + " doesn't start with its token");
}

}  // namespace

std::vector<bool> guardedCalls(Program program, const Facts& facts) {
    firstSets(program, facts);
    runLinks(program);
    std::vector<bool> guarded;
    for (const Node& n : program.nodes) guarded.push_back(n.op == Op::Call && isGuarded(program, facts, n));
    return guarded;
}

void analyse(Program& program, const ParserGrammar& grammar, const Facts& facts, int maxToken) {
    if (index(maxToken) >= kMaxTokens)
        throw GrammarError(grammar.name, 0, "more token numbers than the compiler holds");
    firstSets(program, facts);
    runLinks(program);
    guardCalls(program, facts);
    checkIsland(grammar, facts);
    if (grammar.recoverRule >= 0)
        for (const Node& n : program.nodes)
            if (n.op == Op::Call && n.arg == grammar.recoverRule) {
                // The rule sits in its own wrapper; what can follow is told by the statement around it.
                const auto& first = program.nodes[index(n.run)].first;
                program.recoverFollow.insert(first.begin(), first.end());
            }
    tokenClasses(program, facts, maxToken);
    lastPairs(program, facts);
}

}  // namespace zr::gc
