#include <algorithm>
#include <cstddef>
#include <map>
#include <set>
#include <utility>
#include <vector>

#include "grammar/compiler/passes.h"

/// Branches that a search never needs: what such a branch can read up to the end of the rule, earlier ones of
/// the same choice can read as well, so they come to every end first. They would be tried only where all that
/// comes behind has failed already.
///
/// Whether one language lies in another can't be decided for grammars; what is found here is a simulation: as
/// the branch goes on step by step, the set of places that the earlier ones can have come to by the same
/// steps is kept, and never runs empty (Park, Concurrency and Automata on Infinite Sequences, 1981; subsets
/// as in the determinisation of automata). A call is one step where both make it, and is gone into elsewhere.
namespace zr::gc {
namespace {

/// Calls inside each other that are gone into.
constexpr int kDeepest = 12;
/// Places of the others that are looked at for one branch: few for all branches, then more for those that
/// are left. And for all of a grammar, for each of its nodes. Past these a branch is kept.
constexpr std::size_t kPlacesABranch[] = {100'000, 1'000'000, 3'000'000};
constexpr std::size_t kPlacesANode = 20'000;

class Coverage {
 public:
    Coverage(const Program& program, int recoverRule) : p_(program), recoverRule_(recoverRule) {
        findKinds();
    }

    /// Whether `earlier` come to every end that `branch` comes to.
    bool covers(const std::vector<int>& earlier, int branch, std::size_t most) {
        met_.clear();
        open_.clear();
        bound_ = std::min(looked_ + most, p_.nodes.size() * kPlacesANode);
        Places start;
        for (int node : earlier) start.push_back(place(node, kRuleEnds));
        if (!meet(place(branch, kRuleEnds), std::move(start))) return false;
        // The nearest first: most branches that aren't covered show it soon.
        for (std::size_t i = 0; i < open_.size(); ++i)
            if (!goOn(open_[i]->first, open_[i]->second)) return false;
        return true;
    }

 private:
    using Places = std::vector<int>;
    static constexpr int kRuleEnds = -1;  ///< around the choice's own rule
    /// A node, and the place that the call around it goes on at.
    struct Place {
        int node, around;
        int depth;  ///< of calls
    };

    /// Tokens that no node tells apart. The tables' classes are coarser: they only tell what is looked ahead
    /// for.
    void findKinds() {
        std::set<int> alone;
        for (const Node& n : p_.nodes)
            if (n.op == Op::Token) alone.insert(n.arg);
        std::map<std::vector<bool>, int> kinds;
        for (int token = 0; token < static_cast<int>(p_.classOf.size()); ++token) {
            std::vector<bool> tells;
            for (const std::set<int>& set : p_.sets) tells.push_back(set.count(token) != 0);
            const bool isAlone = alone.count(token) != 0;
            const int next = static_cast<int>(kinds.size());
            kindOf_.push_back(isAlone ? -token - 1 : kinds.emplace(std::move(tells), next).first->second);
        }
    }

    int place(int node, int around) {
        const auto [found, fresh] =
            numberOf_.emplace(std::pair(p_.skip(node), around), static_cast<int>(places_.size()));
        if (fresh) {
            const int depth = around == kRuleEnds ? 0 : places_[index(around)].depth + 1;
            places_.push_back({p_.skip(node), around, depth});
            metBy_.push_back(0);
        }
        return found->second;
    }
    const Node& node(int place) const { return p_.nodes[index(places_[index(place)].node)]; }
    int around(int place) const { return places_[index(place)].around; }

    /// Where a place goes on without a step. A call is one where it can be gone into: what can't be the empty
    /// text that a nullable rule reads is taken as a whole only.
    Places beside(int at) {
        const Node& n = node(at);
        if (n.op == Op::Choice) {
            Places to;
            for (int target : n.targets) to.push_back(place(target, around(at)));
            return to;
        }
        if (n.op == Op::Call && !n.nonEmpty && n.arg != recoverRule_ && places_[index(at)].depth < kDeepest)
            return {place(p_.entry[index(n.arg)], place(n.next, around(at)))};
        if (n.op == Op::End && around(at) != kRuleEnds) return {around(at)};
        return {};
    }

    /// All places that can be come to from these ones without a step, sorted; none where there are too many.
    Places closed(Places open) {
        Places found;
        ++turn_;
        for (; !open.empty(); ++looked_) {
            if (looked_ >= bound_) return {};
            const int at = open.back();
            open.pop_back();
            if (metBy_[index(at)] == turn_) continue;
            metBy_[index(at)] = turn_;
            found.push_back(at);
            const Places more = beside(at);
            open.insert(open.end(), more.begin(), more.end());
        }
        std::sort(found.begin(), found.end());
        return found;
    }

    /// The branch can be at a place while the others are at some of these: that has to be looked at.
    bool meet(int place, Places others) {
        others = closed(std::move(others));
        if (others.empty()) return false;
        const auto [met, fresh] = met_.emplace(place, std::move(others));
        if (fresh) open_.push_back(&*met);
        return true;
    }

    bool goOn(int at, const Places& others) {
        const Node& n = node(at);
        switch (n.op) {
            case Op::Choice:
                return std::all_of(n.targets.begin(), n.targets.end(),
                                   [&](int target) { return meet(place(target, around(at)), others); });
            case Op::Token:
                return take(at, n.arg, others);
            case Op::Set:
                return takeEach(at, others);
            case Op::Call:
                return call(at, others);
            case Op::End:
                if (around(at) != kRuleEnds) return meet(around(at), others);
                return std::any_of(others.begin(), others.end(), [&](int other) {
                    return around(other) == kRuleEnds && node(other).op == Op::End;
                });
            default:
                return step(at, others, [&](const Node& o) { return o.op == n.op && o.arg == n.arg; });
        }
    }

    /// A token; the closer, which isn't taken as others are (see docs/recogniser.md), in the same way.
    bool take(int at, int token, const Places& others) {
        return step(at, others, [&](const Node& o) {
            if (token == p_.closer && o.op != node(at).op) return false;
            return (o.op == Op::Token && o.arg == token) ||
                   (o.op == Op::Set && p_.sets[index(o.arg)].count(token) != 0);
        });
    }

    /// Each token of a set; of each kind one stands for all.
    bool takeEach(int at, const Places& others) {
        Places takers;
        for (int other : others)
            if (node(other).op == Op::Token || node(other).op == Op::Set) takers.push_back(other);
        std::set<int> kinds;
        for (int token : p_.sets[index(node(at).arg)])
            if (kinds.insert(kindOf_[index(token)]).second && !take(at, token, takers)) return false;
        return true;
    }

    bool call(int at, const Places& others) {
        const Node& n = node(at);
        // What recovery puts in the place of a rule is looked for along all ways.
        if (n.arg == recoverRule_) return false;
        const auto isSame = [&](const Node& o) {
            return o.op == Op::Call && o.arg == n.arg && (!o.nonEmpty || n.nonEmpty);
        };
        if (std::any_of(others.begin(), others.end(), [&](int other) { return isSame(node(other)); }))
            return step(at, others, isSame);
        if (places_[index(at)].depth >= kDeepest) return false;
        return meet(place(p_.entry[index(n.arg)], place(n.next, around(at))), others);
    }

    /// The branch makes a step, and of the others those that can make the same.
    template <class IsSame>
    bool step(int at, const Places& others, const IsSame& isSame) {
        Places behind;
        looked_ += others.size();
        for (int other : others)
            if (isSame(node(other))) behind.push_back(place(node(other).next, around(other)));
        return meet(place(node(at).next, around(at)), std::move(behind));
    }

    const Program& p_;
    const int recoverRule_;
    std::vector<int> kindOf_;  ///< by token number
    std::vector<Place> places_;
    std::map<std::pair<int, int>, int> numberOf_;
    std::vector<std::size_t> metBy_;  ///< by place: the turn of closed() that met it last
    std::size_t turn_ = 0;
    std::set<std::pair<int, Places>> met_;
    std::vector<const std::pair<int, Places>*> open_;  ///< in the order in which they were met
    std::size_t looked_ = 0;                           ///< at so many places
    std::size_t bound_ = 0;
};

}  // namespace

void dropCovered(Program& program, const ParserGrammar& grammar) {
    Coverage coverage(program, grammar.recoverRule);
    for (const std::size_t most : kPlacesABranch) {
        for (Node& n : program.nodes) {
            std::vector<Branch> kept;
            std::vector<int> stops;
            for (Branch& branch : n.branches) {
                if (!stops.empty() && coverage.covers(stops, branch.stop, most)) continue;
                stops.push_back(branch.stop);
                kept.push_back(std::move(branch));
            }
            n.branches = std::move(kept);
        }
    }
}

}  // namespace zr::gc
