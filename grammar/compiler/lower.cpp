#include <algorithm>
#include <functional>
#include <set>

#include "grammar/compiler/error.h"
#include "grammar/compiler/passes.h"

namespace zr::gc {
namespace {

/// A rule is inlined where it is called when it is small and doesn't come back to itself, or when only one
/// place calls it: a call costs the searches more than the nodes do.
constexpr int kInlineNodes = 60;

class Lowering {
 public:
    /// `calledOnce` are inlined whatever their size.
    Lowering(const ParserGrammar& grammar, const Facts& facts, const std::set<int>& calledOnce)
        : grammar_(grammar), facts_(facts), scopeNeeds_(scopeNeeds(grammar)) {
        chooseInlined();
        for (int rule : calledOnce) inlined_[static_cast<std::size_t>(rule)] = true;
    }

    Program run() {
        program_.entry.assign(grammar_.rules.size(), -1);
        for (std::size_t i = 0; i < grammar_.rules.size(); ++i) {
            const int end = add(Node(Op::End));
            node(end).arg = static_cast<int>(i);
            if (static_cast<int>(i) == grammar_.start) {
                // The engine runs the start rule itself: its statement as far as it goes, then the tail.
                program_.entry[i] = end;
                continue;
            }
            program_.entry[i] = body(grammar_.rules[i].alternatives, end, Mark::None, false);
        }
        return std::move(program_);
    }

 private:
    const Rule& rule(int index) const { return grammar_.rules[static_cast<std::size_t>(index)]; }

    void chooseInlined() {
        const std::size_t count = grammar_.rules.size();
        size_.assign(count, -1);
        std::vector<bool> onPath(count, false);
        const std::function<int(int)> sizeOf = [&](int index) -> int {
            const auto i = static_cast<std::size_t>(index);
            if (size_[i] >= 0) return size_[i];
            if (onPath[i]) return 1000000;
            onPath[i] = true;
            const std::function<int(const std::vector<Alternative>&)> measure =
                [&](const std::vector<Alternative>& alternatives) {
                    int total = alternatives.size() > 1 ? 1 : 0;
                    for (const Alternative& a : alternatives) {
                        for (const Element& e : a.elements) {
                            total += e.repeat == Repeat::Once ? 1 : 2;
                            if (e.kind == Element::Kind::Group) total += measure(e.alternatives);
                            if (e.kind == Element::Kind::Rule) {
                                const int inner = sizeOf(e.ruleIndex);
                                total += inlinable(e.ruleIndex, inner) ? inner : 1;
                            }
                        }
                    }
                    return total;
                };
            const int total = measure(rule(index).alternatives);
            onPath[i] = false;
            size_[i] = total;
            return total;
        };
        inlined_.assign(count, false);
        for (std::size_t i = 0; i < count; ++i) sizeOf(static_cast<int>(i));
        for (std::size_t i = 0; i < count; ++i)
            inlined_[i] =
                inlinable(static_cast<int>(i), size_[i]) && !reachesItselfInlined(static_cast<int>(i));
    }

    bool inlinable(int index, int size) const {
        return size <= kInlineNodes && !facts_.nullable[static_cast<std::size_t>(index)] &&
               index != grammar_.recoverRule && !recursive(index);
    }

    /// Whether the rule can come back to itself at all; asked a few hundred times, so a plain search will do.
    bool recursive(int index) const {
        std::vector<bool> seen(grammar_.rules.size(), false);
        std::vector<int> work = callees(index);
        while (!work.empty()) {
            const int at = work.back();
            work.pop_back();
            if (at == index) return !onlyWraps(index);
            if (seen[static_cast<std::size_t>(at)]) continue;
            seen[static_cast<std::size_t>(at)] = true;
            for (int next : callees(at)) work.push_back(next);
        }
        return false;
    }

    /// `node_x : x => ^(X x)` only dresses another rule: inlining it costs two nodes even in a recursion.
    bool onlyWraps(int index) const {
        const auto& alternatives = rule(index).alternatives;
        return alternatives.size() == 1 && alternatives[0].elements.size() == 1 &&
               alternatives[0].elements[0].kind == Element::Kind::Rule &&
               alternatives[0].elements[0].repeat == Repeat::Once &&
               !onlyWrapsShallow(alternatives[0].elements[0].ruleIndex);
    }
    bool onlyWrapsShallow(int index) const {
        const auto& alternatives = rule(index).alternatives;
        return alternatives.size() == 1 && alternatives[0].elements.size() == 1 &&
               alternatives[0].elements[0].kind == Element::Kind::Rule;
    }

    bool reachesItselfInlined(int index) const {
        std::vector<bool> seen(grammar_.rules.size(), false);
        std::vector<int> work = callees(index);
        while (!work.empty()) {
            const int at = work.back();
            work.pop_back();
            if (at == index) return true;
            if (seen[static_cast<std::size_t>(at)] || !inlinable(at, size_[static_cast<std::size_t>(at)]))
                continue;
            seen[static_cast<std::size_t>(at)] = true;
            for (int next : callees(at)) work.push_back(next);
        }
        return false;
    }

    std::vector<int> callees(int index) const {
        std::vector<int> result;
        const std::function<void(const std::vector<Alternative>&)> collect =
            [&](const std::vector<Alternative>& alternatives) {
                for (const Alternative& a : alternatives)
                    for (const Element& e : a.elements) {
                        if (e.kind == Element::Kind::Rule) result.push_back(e.ruleIndex);
                        collect(e.alternatives);
                    }
            };
        collect(rule(index).alternatives);
        return result;
    }

    int add(Node node) {
        program_.nodes.push_back(std::move(node));
        return static_cast<int>(program_.nodes.size()) - 1;
    }

    int set(const std::set<int>& tokens) {
        const auto found = std::find(program_.sets.begin(), program_.sets.end(), tokens);
        if (found != program_.sets.end()) return static_cast<int>(found - program_.sets.begin());
        program_.sets.push_back(tokens);
        return static_cast<int>(program_.sets.size()) - 1;
    }

    /// Alternatives that lead to `next`. `outer` is a mark of the group around them: it holds for what is
    /// inside. With `ownSpan` they are the tree of a rule without a scope.
    int body(const std::vector<Alternative>& alternatives, int next, Mark outer, bool ownSpan) {
        if (alternatives.size() > 1) {
            std::set<int> tokens;
            const bool plain =
                std::all_of(alternatives.begin(), alternatives.end(), [&](const Alternative& a) {
                    if (a.elements.size() != 1 || a.root >= 0) return false;
                    const Element& e = a.elements[0];
                    tokens.insert(e.tokens.begin(), e.tokens.end());
                    return e.kind == Element::Kind::Tokens && e.repeat == Repeat::Once &&
                           e.mark == alternatives[0].elements[0].mark;
                });
            if (plain) {
                const Mark own = alternatives[0].elements[0].mark;
                return tokenNode(tokens, own != Mark::None ? own : outer, next, ownSpan);
            }
        }
        std::vector<int> targets;
        for (const Alternative& a : alternatives) {
            int at = next;
            if (a.root >= 0) {
                at = add(Node(Op::Root));
                node(at).arg = a.root;
                node(at).next = next;
            }
            const bool alone = a.elements.size() == 1;
            for (auto e = a.elements.rbegin(); e != a.elements.rend(); ++e)
                at = element(*e, at, outer, ownSpan && alone);
            targets.push_back(at);
        }
        if (targets.size() == 1) return targets[0];
        return choice(std::move(targets));
    }

    int choice(std::vector<int> targets) {
        if (targets.size() > Program::kTargets) {
            const auto rest = targets.begin() + Program::kTargets - 1;
            const int more = choice({rest, targets.end()});
            targets.erase(rest, targets.end());
            targets.push_back(more);
        }
        const int at = add(Node(Op::Choice));
        node(at).targets = std::move(targets);
        return at;
    }

    int element(const Element& e, int next, Mark outer, bool ownSpan) {
        switch (e.repeat) {
            case Repeat::Once:
                return once(e, next, outer, false, ownSpan);
            case Repeat::Optional:
                return choice({once(e, next, outer, true, false), next});
            case Repeat::Star:
            case Repeat::Plus:
                break;
        }
        const int loop = add(Node(Op::Choice));
        const int round = once(e, loop, outer, true, false);
        node(loop).targets = {round, next};
        return e.repeat == Repeat::Star ? loop : round;
    }

    int once(const Element& e, int next, Mark outer, bool nonEmpty, bool ownSpan) {
        const Mark mark = e.mark != Mark::None ? e.mark : outer;
        if (e.kind == Element::Kind::Tokens) return tokenNode(e.tokens, mark, next, ownSpan);
        if (e.kind == Element::Kind::Group) return body(e.alternatives, next, mark, ownSpan);
        if (inlined_[static_cast<std::size_t>(e.ruleIndex)]) {
            const ScopeNeed need = scopeNeeds_[static_cast<std::size_t>(e.ruleIndex)];
            if (need == ScopeNeed::Never || (need == ScopeNeed::Marked && mark == Mark::None))
                return body(rule(e.ruleIndex).alternatives, next, mark, true);
            const int end = add(Node(Op::ScopeEnd));
            node(end).next = next;
            const int inner = body(rule(e.ruleIndex).alternatives, end, Mark::None, false);
            const int begin = add(Node(Op::ScopeBegin));
            node(begin).mark = mark;
            node(begin).next = inner;
            return begin;
        }
        const int call = add(Node(Op::Call));
        node(call).arg = e.ruleIndex;
        node(call).mark = mark;
        node(call).nonEmpty = nonEmpty && facts_.nullable[static_cast<std::size_t>(e.ruleIndex)];
        node(call).next = next;
        return call;
    }

    int tokenNode(const std::set<int>& tokens, Mark mark, int next, bool ownSpan) {
        const int at = add(Node(tokens.size() == 1 ? Op::Token : Op::Set));
        node(at).arg = tokens.size() == 1 ? *tokens.begin() : set(tokens);
        node(at).mark = mark;
        node(at).next = next;
        node(at).ownSpan = ownSpan;
        return at;
    }

    Node& node(int index) { return program_.nodes[static_cast<std::size_t>(index)]; }

    const ParserGrammar& grammar_;
    const Facts& facts_;
    const std::vector<ScopeNeed> scopeNeeds_;
    Program program_;
    std::vector<int> size_;
    std::vector<bool> inlined_;
};

/// Rules that one place alone calls in what the statement can come to.
std::set<int> rulesCalledOnce(const ParserGrammar& grammar, const Facts& facts, const Program& program) {
    std::vector<int> places(grammar.rules.size(), 0);
    std::vector<bool> met(program.nodes.size(), false);
    std::vector<int> open{program.entry[static_cast<std::size_t>(grammar.statement)]};
    while (!open.empty()) {
        const auto at = static_cast<std::size_t>(open.back());
        open.pop_back();
        if (met[at]) continue;
        met[at] = true;
        const Node& node = program.nodes[at];
        open.insert(open.end(), node.targets.begin(), node.targets.end());
        if (node.next >= 0) open.push_back(node.next);
        if (node.op != Op::Call) continue;
        ++places[static_cast<std::size_t>(node.arg)];
        open.push_back(program.entry[static_cast<std::size_t>(node.arg)]);
    }
    std::set<int> once;
    for (std::size_t i = 0; i < places.size(); ++i) {
        const int rule = static_cast<int>(i);
        if (places[i] == 1 && !facts.nullable[i] && rule != grammar.recoverRule &&
            rule != grammar.statement && rule != grammar.islandRule)
            once.insert(rule);
    }
    return once;
}

}  // namespace

Program lower(const ParserGrammar& grammar, const Facts& facts) {
    std::set<int> calledOnce;
    for (;;) {
        Program program = Lowering(grammar, facts, calledOnce).run();
        const std::set<int> more = rulesCalledOnce(grammar, facts, program);
        if (more.empty()) return program;
        calledOnce.insert(more.begin(), more.end());
    }
}

}  // namespace zr::gc
