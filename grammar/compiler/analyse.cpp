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

std::size_t index(int i) {
    return static_cast<std::size_t>(i);
}

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

/// The tokens that can stand second, for every token that a node can start with.
void secondTokens(Program& p, const Facts& facts) {
    using Pairs = std::map<int, TokenBits>;
    std::vector<Pairs> pairs(p.nodes.size());
    const auto behind = [&](int node) {
        TokenBits bits;
        for (int t : p.nodes[index(node)].first) bits.set(index(t));
        if (p.nodes[index(node)].canEnd) bits.set(kEof);
        return bits;
    };
    for (bool changed = true; changed;) {
        changed = false;
        for (std::size_t i = p.nodes.size(); i-- > 0;) {
            const Node& n = p.nodes[i];
            const auto add = [&](int token, const TokenBits& seconds) {
                TokenBits& known = pairs[i][token];
                const TokenBits now = known | seconds;
                changed = changed || now != known;
                known = now;
            };
            const auto join = [&](int next) {
                for (const auto& [token, seconds] : pairs[index(next)]) add(token, seconds);
            };
            switch (n.op) {
                case Op::Token:
                    add(n.arg, behind(n.next));
                    break;
                case Op::Set:
                    for (int t : p.sets[index(n.arg)]) add(t, behind(n.next));
                    break;
                case Op::Call:
                    for (auto [token, seconds] : Pairs(pairs[index(p.entry[index(n.arg)])])) {
                        if (seconds[kEof]) seconds = seconds.reset(kEof) | behind(n.next);
                        add(token, seconds);
                    }
                    if (facts.nullable[index(n.arg)] && !n.nonEmpty) join(n.next);
                    break;
                case Op::Choice:
                    for (int t : n.targets) join(t);
                    break;
                case Op::Soft:
                case Op::SoftStar: {
                    TokenBits seconds = behind(n.next);
                    if (n.op == Op::SoftStar) seconds.set(index(n.arg));
                    add(n.arg, seconds);
                    join(n.next);
                    break;
                }
                case Op::End:
                    break;
                default:
                    join(n.next);
            }
        }
    }
    p.second.resize(p.entry.size());
    for (std::size_t r = 0; r < p.entry.size(); ++r)
        for (const auto& [token, seconds] : pairs[index(p.entry[r])])
            for (std::size_t t = 0; t < kMaxTokens; ++t)
                if (seconds[t]) p.second[r][token].insert(static_cast<int>(t));
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
        const Node& after = p.nodes[index(n.run)];
        if (after.canEnd || facts.nullable[index(n.arg)] || after.first.size() > kSelective) continue;
        Guard guard{after.first, facts.last[index(n.arg)], facts.outside[index(n.arg)]};
        const auto found = std::find(p.guards.begin(), p.guards.end(), guard);
        n.guard = static_cast<int>(found - p.guards.begin());
        if (found == p.guards.end()) p.guards.push_back(std::move(guard));
    }
}

/// Whether a round can start with a rule, behind optional tokens at most.
bool startsWithRule(const Program& p, int node) {
    std::vector<int> work{node};
    std::set<int> seen;
    while (!work.empty()) {
        const int i = p.skip(work.back());
        work.pop_back();
        if (!seen.insert(i).second) continue;
        const Node& n = p.nodes[index(i)];
        if (n.op == Op::Call) return true;
        if (n.op == Op::Choice) work.insert(work.end(), n.targets.begin(), n.targets.end());
        if (n.op == Op::Soft || n.op == Op::SoftStar) work.push_back(n.next);
    }
    return false;
}

/// FIRST of every node with the rounds of one loop left out.
std::vector<std::set<int>> firstWithout(const Program& p, const Facts& facts, int loop) {
    std::vector<std::set<int>> first(p.nodes.size());
    for (bool changed = true; changed;) {
        changed = false;
        for (std::size_t i = p.nodes.size(); i-- > 0;) {
            const Node& n = p.nodes[i];
            std::set<int> now = first[i];
            const auto join = [&](int next) {
                now.insert(first[index(next)].begin(), first[index(next)].end());
            };
            switch (n.op) {
                case Op::Token:
                    now.insert(n.arg);
                    break;
                case Op::Set:
                    now.insert(p.sets[index(n.arg)].begin(), p.sets[index(n.arg)].end());
                    break;
                case Op::Call:
                    now.insert(facts.first[index(n.arg)].begin(), facts.first[index(n.arg)].end());
                    if (facts.nullable[index(n.arg)] && !n.nonEmpty) join(n.next);
                    break;
                case Op::Choice:
                    for (std::size_t t = static_cast<int>(i) == loop ? 1 : 0; t < n.targets.size(); ++t)
                        join(n.targets[t]);
                    break;
                case Op::Soft:
                case Op::SoftStar:
                    now.insert(n.arg);
                    join(n.next);
                    break;
                case Op::End:
                    break;
                default:
                    join(n.next);
            }
            if (now.size() != first[i].size()) {
                first[i] = std::move(now);
                changed = true;
            }
        }
    }
    return first;
}

/// The Calls that a node leads to without taking a token, by way of choices.
std::vector<int> leadingCalls(const Program& p, int node) {
    std::vector<int> work{node}, calls;
    std::set<int> seen;
    while (!work.empty()) {
        const int i = p.skip(work.back());
        work.pop_back();
        if (!seen.insert(i).second) continue;
        const Node& n = p.nodes[index(i)];
        if (n.op == Op::Call) calls.push_back(i);
        if (n.op == Op::Choice) work.insert(work.end(), n.targets.begin(), n.targets.end());
    }
    return calls;
}

/// The single tokens that a node can take at once.
std::set<int> leadingTokens(const Program& p, int node) {
    std::vector<int> work{node};
    std::set<int> seen, tokens;
    while (!work.empty()) {
        const int i = p.skip(work.back());
        work.pop_back();
        if (!seen.insert(i).second) continue;
        const Node& n = p.nodes[index(i)];
        if (n.op == Op::Token) tokens.insert(n.arg);
        if (n.op == Op::Choice) work.insert(work.end(), n.targets.begin(), n.targets.end());
    }
    return tokens;
}

/// `(x (sep? x)*)?` : declining the whole list at something that an x starts with is the same as stopping its
/// loop there, so the Choice of the list goes by the loop's rule as well.
void findLoopHeads(Program& p, const Facts& facts, int loop) {
    const Node& l = p.nodes[index(loop)];
    std::set<int> rules;
    for (int call : leadingCalls(p, l.targets[0]))
        if (p.nodes[index(call)].run == loop) rules.insert(p.nodes[index(call)].arg);
    const std::set<int> separators = leadingTokens(p, l.targets[0]);
    const int exit = p.skip(l.targets[1]), id = l.tailLoop;
    for (std::size_t i = 0; i < p.nodes.size(); ++i) {
        Node& n = p.nodes[i];
        if (static_cast<int>(i) == loop || n.op != Op::Choice || n.targets.size() != 2 ||
            p.skip(n.targets[1]) != exit)
            continue;
        for (int call : leadingCalls(p, n.targets[0])) {
            const Node& c = p.nodes[index(call)];
            if (c.run != loop || rules.count(c.arg) == 0) continue;
            n.tailLoop = id;
            // What a round could take as its separator doesn't say who takes the x behind it.
            for (int t : facts.first[index(c.arg)])
                if (separators.count(t) == 0) n.roundFirst.insert(t);
        }
    }
}

/// The nodes of one rule.
std::vector<int> nodesOf(const Program& p, int rule) {
    std::set<int> seen;
    std::vector<int> work{p.entry[index(rule)]}, nodes;
    while (!work.empty()) {
        const int i = work.back();
        work.pop_back();
        if (i < 0 || !seen.insert(i).second) continue;
        nodes.push_back(i);
        const Node& n = p.nodes[index(i)];
        if (n.op == Op::Choice)
            work.insert(work.end(), n.targets.begin(), n.targets.end());
        else
            work.push_back(n.next);
    }
    return nodes;
}

/// By node: whether the next token can be a closer that isn't one of the optional ones.
std::vector<bool> mandatoryCloserNext(const Program& p, const Facts& facts) {
    std::vector<bool> next(p.nodes.size(), false);
    for (bool changed = true; changed;) {
        changed = false;
        for (std::size_t i = p.nodes.size(); i-- > 0;) {
            const Node& n = p.nodes[i];
            bool now = false;
            switch (n.op) {
                case Op::Token:
                    now = n.arg == p.closer;
                    break;
                case Op::Set:
                    now = p.sets[index(n.arg)].count(p.closer) != 0;
                    break;
                case Op::Call:
                    now = facts.first[index(n.arg)].count(p.closer) != 0 ||
                          (facts.nullable[index(n.arg)] && next[index(n.next)]);
                    break;
                case Op::Choice:
                    for (int t : n.targets) now = now || next[index(t)];
                    break;
                case Op::End:
                    break;
                default:
                    now = next[index(n.next)];
            }
            if (now && !next[i]) {
                next[i] = true;
                changed = true;
            }
        }
    }
    return next;
}

constexpr std::size_t kMaxTailLoops = 4;

void findTailLoops(Program& p, const ParserGrammar& grammar, const Facts& facts) {
    for (int loop : p.loops) {
        const Node& n = p.nodes[index(loop)];
        if (n.op != Op::Choice || !p.nodes[index(n.targets[1])].canEnd || !startsWithRule(p, n.targets[0]))
            continue;
        if (p.tailLoops.size() == kMaxTailLoops) break;
        p.nodes[index(loop)].tailLoop = static_cast<int>(p.tailLoops.size());
        p.tailLoops.push_back({loop, p.nodes[index(n.targets[0])].first});
        p.nodes[index(loop)].isTailLoop = true;
        p.nodes[index(loop)].roundFirst = p.nodes[index(n.targets[0])].first;
        findLoopHeads(p, facts, loop);
    }
    for (const ParserGrammar::Declined& d : grammar.declined) {
        const std::vector<int> nodes = nodesOf(p, d.rule), loops = nodesOf(p, d.loopRule);
        int loop = -1;
        for (int i : loops)
            for (const TailLoop& l : p.tailLoops)
                if (l.node == i) loop = p.nodes[index(i)].tailLoop;
        int marked = 0;
        for (int i : nodes) {
            Node& n = p.nodes[index(i)];
            if (loop < 0 || n.op != Op::Choice || n.targets.size() != 2 ||
                p.nodes[index(n.targets[0])].first != std::set<int>{d.token})
                continue;
            n.tailLoop = loop;
            n.roundFirst = {d.token};
            ++marked;
        }
        const Rule& rule = grammar.rules[index(d.rule)];
        if (marked == 0)
            throw GrammarError(rule.file, rule.line,
                               "nothing of rule " + rule.name + " can be declined as said");
    }
    const std::vector<bool> closing = mandatoryCloserNext(p, facts);
    std::vector<std::vector<std::set<int>>> without;
    for (const TailLoop& loop : p.tailLoops) without.push_back(firstWithout(p, facts, loop.node));
    for (Node& n : p.nodes) {
        if (n.op != Op::Call) continue;
        const Node& behind = p.nodes[index(n.run)];
        CallContext context{{}, behind.first, behind.canEnd, closing[index(n.run)]};
        for (std::size_t l = 0; l < p.tailLoops.size(); ++l) {
            std::set<int> other;
            for (int token : without[l][index(n.run)])
                if (p.tailLoops[l].first.count(token) != 0) other.insert(token);
            context.other.push_back(std::move(other));
        }
        const auto found = std::find(p.contexts.begin(), p.contexts.end(), context);
        n.context = static_cast<int>(found - p.contexts.begin());
        if (found == p.contexts.end()) p.contexts.push_back(std::move(context));
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
        if (n.tailLoop >= 0) sets.push_back(&n.roundFirst);
    for (const auto& c : p.contexts) {
        for (const auto& s : c.other) sets.push_back(&s);
        sets.push_back(&c.any);
    }
    for (const Node& n : p.nodes)
        if (n.op == Op::Choice)
            for (int t : n.targets) sets.push_back(&p.nodes[index(t)].first);
    sets.push_back(&p.recoverFollow);
    sets.push_back(&p.owing);
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

void analyse(Program& program, const ParserGrammar& grammar, const Facts& facts, int maxToken) {
    if (index(maxToken) >= kMaxTokens)
        throw GrammarError(grammar.name, 0, "more token numbers than the compiler holds");
    firstSets(program, facts);
    secondTokens(program, facts);
    runLinks(program);
    guardCalls(program, facts);
    findTailLoops(program, grammar, facts);
    checkIsland(grammar, facts);
    if (grammar.recoverRule >= 0)
        for (const Node& n : program.nodes)
            if (n.op == Op::Call && n.arg == grammar.recoverRule) {
                // The rule sits in its own wrapper; what can follow is told by the statement around it.
                const auto& first = program.nodes[index(n.run)].first;
                program.recoverFollow.insert(first.begin(), first.end());
            }
    program.owing = owingTokens(program);
    tokenClasses(program, facts, maxToken);
}

}  // namespace zr::gc
