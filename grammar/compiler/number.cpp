#include <algorithm>

#include "grammar/compiler/passes.h"

namespace zr::gc {
namespace {

/// Nodes that a search can come to behind one at the same position of the text.
std::vector<int> withoutToken(const Program& p, const Facts& facts, int recoverRule, const Node& n) {
    std::vector<int> to;
    switch (n.op) {
        case Op::Token:
        case Op::Set:
        case Op::End:
            break;
        case Op::Choice:
            for (const Branch& branch : n.branches) to.push_back(branch.stop);
            break;
        case Op::Call:
            to.push_back(p.skip(p.entry[index(n.arg)]));
            if ((facts.nullable[index(n.arg)] && !n.nonEmpty) || n.arg == recoverRule) to.push_back(n.run);
            break;
        default:
            to.push_back(p.skip(n.next));
            break;
    }
    return to;
}

/// The nodes that a search stops at and can come to, those of the statement first, each behind those that
/// withoutToken() names. `ofStatement` is how many these are.
std::vector<int> inOrder(const Program& p, const Facts& facts, const ParserGrammar& grammar,
                         int& ofStatement) {
    struct Open {
        int node;
        std::vector<int> behind;
    };
    std::vector<int> order;
    std::vector<bool> met(p.nodes.size(), false);
    std::vector<int> starts{p.skip(p.entry[index(grammar.statement)])};
    ofStatement = 0;
    while (!starts.empty() || ofStatement == 0) {
        if (starts.empty()) {
            ofStatement = static_cast<int>(order.size());
            for (int entry : p.entry) starts.push_back(p.skip(entry));
        }
        const int start = starts.back();
        starts.pop_back();
        std::vector<Open> open;
        const auto enter = [&](int node) {
            if (met[index(node)]) return;
            met[index(node)] = true;
            open.push_back({node, withoutToken(p, facts, grammar.recoverRule, p.nodes[index(node)])});
        };
        enter(start);
        while (!open.empty()) {
            if (!open.back().behind.empty()) {
                const int next = open.back().behind.back();
                open.back().behind.pop_back();
                enter(next);
                continue;
            }
            const Node& done = p.nodes[index(open.back().node)];
            order.push_back(open.back().node);
            open.pop_back();
            if (done.run >= 0) starts.push_back(done.run);
        }
    }
    return order;
}

}  // namespace

void numberNodes(Program& p, const Facts& facts, const ParserGrammar& grammar) {
    std::vector<int> order = inOrder(p, facts, grammar, p.statementStops);
    p.stops = static_cast<int>(order.size());
    std::vector<int> open(p.entry.begin(), p.entry.end());
    std::vector<bool> used(p.nodes.size(), false);
    for (int node : order) used[index(node)] = true;
    for (int node : order) {
        const Node& n = p.nodes[index(node)];
        open.insert(open.end(), n.targets.begin(), n.targets.end());
        if (n.next >= 0) open.push_back(n.next);
    }
    while (!open.empty()) {
        const int node = open.back();
        open.pop_back();
        if (used[index(node)]) continue;
        used[index(node)] = true;
        order.push_back(node);
        // Choices that searches take together with one ahead of them stand here as well.
        const Node& n = p.nodes[index(node)];
        open.insert(open.end(), n.targets.begin(), n.targets.end());
        if (n.next >= 0) open.push_back(n.next);
    }
    std::vector<int> numberOf(p.nodes.size(), -1);
    for (std::size_t i = 0; i < order.size(); ++i) numberOf[index(order[i])] = static_cast<int>(i);
    const auto renumber = [&](int& node) {
        if (node >= 0) node = numberOf[index(node)];
    };
    std::vector<Node> nodes;
    nodes.reserve(order.size());
    for (int old : order) {
        nodes.push_back(std::move(p.nodes[index(old)]));
        renumber(nodes.back().next);
        renumber(nodes.back().run);
        for (int& t : nodes.back().targets) renumber(t);
        for (Branch& branch : nodes.back().branches) {
            renumber(branch.stop);
            for (int& t : branch.path) renumber(t);
        }
    }
    p.nodes = std::move(nodes);
    for (std::size_t i = index(p.stops); i < p.nodes.size(); ++i) p.nodes[i].branches.clear();
    for (int& entry : p.entry) renumber(entry);
}

}  // namespace zr::gc
