#include <algorithm>
#include <deque>

#include "grammar/compiler/passes.h"

namespace zr::gc {
namespace {

std::size_t index(int i) {
    return static_cast<std::size_t>(i);
}

std::vector<int> successors(const Node& n) {
    if (n.op == Op::Choice) return n.targets;
    return n.next < 0 ? std::vector<int>{} : std::vector<int>{n.next};
}

bool isHard(const Program& p, int node) {
    return p.nodes[index(node)].op == Op::Token && p.nodes[index(node)].arg == p.closer;
}

/// By node of a rule: the least difference of openers and closers that any path has taken ahead of it. What a
/// call takes has its own account.
std::vector<int> leastBalance(const Program& p, int entry, int floor) {
    constexpr int kUnseen = 1000;
    std::vector<int> least(p.nodes.size(), kUnseen);
    std::deque<int> work{entry};
    least[index(entry)] = 0;
    while (!work.empty()) {
        const int at = work.front();
        work.pop_front();
        const Node& n = p.nodes[index(at)];
        int behind = least[index(at)];
        if (n.op == Op::Token && n.arg == p.opener) ++behind;
        if (isHard(p, at)) behind = std::max(behind - 1, floor);
        for (const int next : successors(n)) {
            if (least[index(next)] <= behind) continue;
            least[index(next)] = behind;
            work.push_back(next);
        }
    }
    return least;
}

/// Whether every path from a rule's entry to a node passes another one.
bool passesAlways(const Program& p, int entry, int target, int by) {
    std::vector<bool> seen(p.nodes.size(), false);
    std::vector<int> work{entry};
    while (!work.empty()) {
        const int at = work.back();
        work.pop_back();
        if (at == by || seen[index(at)]) continue;
        if (at == target) return false;
        seen[index(at)] = true;
        for (const int next : successors(p.nodes[index(at)])) work.push_back(next);
    }
    return true;
}

}  // namespace

std::set<int> owingTokens(const Program& p) {
    if (p.opener <= 0 || p.closer < 0) return {};
    constexpr int kFloor = -2;
    std::set<int> owing{p.opener};
    for (const int entry : p.entry) {
        const std::vector<int> least = leastBalance(p, entry, kFloor);
        for (std::size_t i = 0; i < p.nodes.size(); ++i) {
            const int hard = static_cast<int>(i);
            if (!isHard(p, hard) || least[i] > 0) continue;
            if (least[i] < 0) return {};  // more than one closer for what was taken once
            const auto serves = [&](const Node& n, int at) {
                return (n.op == Op::Token || n.op == Op::Set) && !isHard(p, at) && least[index(at)] <= 0 &&
                       passesAlways(p, entry, hard, at);
            };
            std::size_t by = 0;
            while (by < p.nodes.size() && !serves(p.nodes[by], static_cast<int>(by))) ++by;
            if (by == p.nodes.size()) return {};
            const Node& n = p.nodes[by];
            if (n.op == Op::Token)
                owing.insert(n.arg);
            else
                owing.insert(p.sets[index(n.arg)].begin(), p.sets[index(n.arg)].end());
        }
    }
    return owing;
}

}  // namespace zr::gc
