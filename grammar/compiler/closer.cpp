#include <functional>
#include <map>

#include "grammar/compiler/passes.h"

namespace zr::gc {
namespace {

const Node& at(const Program& p, int node) {
    return p.nodes[static_cast<std::size_t>(node)];
}

/// The token that a Choice takes optionally, or -1: once, dropped or kept, or any number of times, dropped. A
/// loop's round comes back to the Choice itself.
int softToken(const Program& p, int index) {
    const Node& node = at(p, index);
    if (node.op != Op::Choice || node.targets.size() != 2) return -1;
    const Node& body = at(p, node.targets[0]);
    if (body.op != Op::Token || body.mark == Mark::Root || body.ownSpan) return -1;
    const bool isLoop = body.next == index && body.mark == Mark::Drop;
    return body.next == node.targets[1] || isLoop ? body.arg : -1;
}

/// `(CLOSER!)?` or `(CLOSER!)*`, with or without the parentheses.
bool isSoft(const Element& e, int closer) {
    if (e.repeat != Repeat::Optional && e.repeat != Repeat::Star) return false;
    const Element* inner = &e;
    while (inner->kind == Element::Kind::Group && inner->alternatives.size() == 1 &&
           inner->alternatives[0].elements.size() == 1)
        inner = &inner->alternatives[0].elements[0];
    return inner->single && inner->tokens.count(closer) != 0;
}

/// Whether an alternative that can be empty could be read as nothing but the closer: leaving it out would
/// then change what "taken on no tokens" says. Bodies of repetitions can't be empty, so only rules and plain
/// groups are left to look at.
bool softInEmptyAlternative(const std::vector<Alternative>& alternatives, const Facts& facts, int closer) {
    for (const Alternative& a : alternatives) {
        bool empty = true, soft = false;
        for (const Element& e : a.elements) {
            empty = empty && facts.nullableElement(e);
            soft = soft || isSoft(e, closer);
            if (softInEmptyAlternative(e.alternatives, facts, closer) && !isSoft(e, closer)) return true;
        }
        if (empty && soft) return true;
    }
    return false;
}

bool softInNullableRule(const ParserGrammar& grammar, const Facts& facts, int closer) {
    for (const Rule& rule : grammar.rules)
        if (softInEmptyAlternative(rule.alternatives, facts, closer)) return true;
    return false;
}

/// FIRST and "reaches the end" of nodes with Soft nodes read as taking nothing: what must take the closer.
struct HardFirst {
    std::vector<bool> takesCloser, takesOther, canEnd;

    HardFirst(const Program& p, const Facts& facts, int closer)
        : takesCloser(p.nodes.size()), takesOther(p.nodes.size()), canEnd(p.nodes.size()) {
        for (bool changed = true; changed;) {
            changed = false;
            for (std::size_t i = p.nodes.size(); i-- > 0;) {
                bool c = false, o = false, e = false;
                const Node& n = p.nodes[i];
                const auto join = [&](int next) {
                    const auto j = static_cast<std::size_t>(next);
                    c = c || takesCloser[j];
                    o = o || takesOther[j];
                    e = e || canEnd[j];
                };
                const auto tokens = [&](const std::set<int>& set) {
                    c = c || set.count(closer) != 0;
                    o = o || set.size() > set.count(closer);
                };
                switch (n.op) {
                    case Op::Token:
                        tokens({n.arg});
                        break;
                    case Op::Set:
                        tokens(p.sets[static_cast<std::size_t>(n.arg)]);
                        break;
                    case Op::Call:
                        tokens(facts.first[static_cast<std::size_t>(n.arg)]);
                        if (facts.nullable[static_cast<std::size_t>(n.arg)] && !n.nonEmpty) join(n.next);
                        break;
                    case Op::Choice:
                        for (int t : n.targets) join(t);
                        break;
                    case Op::End:
                        e = true;
                        break;
                    default:
                        join(n.next);
                }
                if (c != takesCloser[i] || o != takesOther[i] || e != canEnd[i]) {
                    takesCloser[i] = c;
                    takesOther[i] = o;
                    canEnd[i] = e;
                    changed = true;
                }
            }
        }
    }
};

/// Goes through every node that can be reached inside a run of closers and looks for what would make the
/// outcome depend on who took which closer. See docs/recogniser.md for the argument.
std::string checkRuns(const Program& p, const Facts& facts, int closer) {
    const HardFirst hard(p, facts, closer);
    std::map<int, std::vector<int>> callers;  // rule -> Call nodes
    std::map<int, int> ruleOfEnd;
    for (std::size_t r = 0; r < p.entry.size(); ++r) {
        std::vector<bool> seen(p.nodes.size(), false);
        std::vector<int> work{p.entry[r]};
        while (!work.empty()) {
            const int i = work.back();
            work.pop_back();
            if (i < 0 || seen[static_cast<std::size_t>(i)]) continue;
            seen[static_cast<std::size_t>(i)] = true;
            const Node& n = at(p, i);
            if (n.op == Op::Call) callers[n.arg].push_back(i);
            if (n.op == Op::End) ruleOfEnd[i] = static_cast<int>(r);
            if (n.op == Op::Choice)
                work.insert(work.end(), n.targets.begin(), n.targets.end());
            else
                work.push_back(n.next);
        }
    }
    std::vector<bool> seen(p.nodes.size(), false);
    std::vector<int> work;
    for (const Node& n : p.nodes)
        if (n.op == Op::Soft || n.op == Op::SoftStar) work.push_back(n.next);
    while (!work.empty()) {
        const int i = work.back();
        work.pop_back();
        if (seen[static_cast<std::size_t>(i)]) continue;
        seen[static_cast<std::size_t>(i)] = true;
        const Node& n = at(p, i);
        switch (n.op) {
            case Op::Token:
                if (n.arg == closer) work.push_back(n.next);
                break;
            case Op::Set:
                if (p.sets[static_cast<std::size_t>(n.arg)].count(closer)) return "a token set takes it";
                break;
            case Op::Call:
                if (facts.first[static_cast<std::size_t>(n.arg)].count(closer))
                    return "a rule can start with it";
                if (facts.nullable[static_cast<std::size_t>(n.arg)] && !n.nonEmpty)
                    return "a rule that can be empty follows it";
                break;
            case Op::Choice:
                for (std::size_t a = 0; a < n.targets.size(); ++a) {
                    const auto first = static_cast<std::size_t>(n.targets[a]);
                    for (std::size_t b = a + 1; b < n.targets.size(); ++b) {
                        const auto later = static_cast<std::size_t>(n.targets[b]);
                        if ((hard.takesCloser[first] || hard.canEnd[first]) &&
                            (hard.takesOther[later] || hard.canEnd[later]))
                            return "a choice in the middle of a run prefers the closer";
                    }
                }
                work.insert(work.end(), n.targets.begin(), n.targets.end());
                break;
            case Op::End:
                for (int call : callers[ruleOfEnd[i]]) work.push_back(at(p, call).next);
                break;
            default:
                work.push_back(n.next);
        }
    }
    return {};
}

}  // namespace

void applyCloser(Program& program, int closer) {
    program.closer = closer;
    for (std::size_t i = 0; i < program.nodes.size(); ++i) {
        if (softToken(program, static_cast<int>(i)) != closer) continue;
        Node& node = program.nodes[i];
        const Node& body = at(program, node.targets[0]);
        const bool star = body.next == static_cast<int>(i);
        node.mark = body.mark;
        node.op = star ? Op::SoftStar : Op::Soft;
        node.arg = closer;
        node.next = node.targets[1];
        node.targets.clear();
    }
}

int findCloser(const ParserGrammar& grammar, const Facts& facts, const Program& program, std::string& why) {
    std::map<int, int> count;
    for (std::size_t i = 0; i < program.nodes.size(); ++i) {
        const int token = softToken(program, static_cast<int>(i));
        // An optional token ahead of something is no closer: only what a rule may end with counts.
        if (token >= 0) ++count[token];
    }
    int best = -1;
    std::string refusals;
    for (const auto& [token, times] : count) {
        if (best >= 0 && times <= count[best]) continue;
        if (softInNullableRule(grammar, facts, token)) {
            refusals += " #" + std::to_string(token) + ": a rule that can be empty holds it;";
            continue;
        }
        Program trial = program;
        applyCloser(trial, token);
        const std::string refusal = checkRuns(trial, facts, token);
        if (!refusal.empty()) {
            refusals += " #" + std::to_string(token) + ": " + refusal + ";";
            continue;
        }
        best = token;
    }
    why = refusals;
    return best;
}

}  // namespace zr::gc
