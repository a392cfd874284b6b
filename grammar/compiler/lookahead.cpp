#include <algorithm>
#include <bitset>
#include <cstddef>
#include <map>
#include <unordered_map>
#include <unordered_set>
#include <utility>

#include "grammar/compiler/passes.h"

/// Which alternatives of a choice still fit once a few more tokens are known. This is the construction of
/// strong LL(k) lookahead as an automaton over sets of configurations (Parr and Fisher, LL(*): The Foundation
/// of the ANTLR Parser Generator, 2011), cut off at Program::kLookahead tokens: it only ever says
/// "no" to what can't be read.
namespace zr::gc {
namespace {

/// A set of more configurations than this isn't followed: everything fits.
constexpr std::size_t kManyConfigurations = 4000;
/// Of more than these only one more token is looked at.
constexpr std::size_t kFewConfigurations = 40;

class Lookahead {
 public:
    explicit Lookahead(Program& program) : p_(program) {
        stacks_.emplace_back(-1, -1);
        sets_.resize(2);  // kDead and kAnything
        tokens();
    }

    void run() {
        for (int i = 0; i < p_.stops; ++i)
            if (p_.nodes[index(i)].op == Op::Choice) look(p_.nodes[index(i)]);
    }

 private:
    /// A node in front of a token, with the nodes that the calls around it go on at, innermost first.
    using Configuration = std::pair<int, int>;
    using Configurations = std::vector<Configuration>;
    using Classes = std::bitset<256>;
    static constexpr int kDead = 0, kAnything = 1, kNoStack = 0, kUnknown = -1;

    void tokens() {
        takes_.resize(p_.nodes.size());
        for (std::size_t i = 0; i < p_.nodes.size(); ++i) {
            const Node& n = p_.nodes[i];
            if (n.op == Op::Token || n.op == Op::Soft || n.op == Op::SoftStar)
                takes_[i].set(index(p_.classOf[index(n.arg)]));
            if (n.op == Op::Set)
                for (int t : p_.sets[index(n.arg)]) takes_[i].set(index(p_.classOf[index(t)]));
        }
    }

    int push(int node, int stack) {
        const auto [found, fresh] =
            stackOf_.emplace(std::pair(node, stack), static_cast<int>(stacks_.size()));
        if (fresh) stacks_.emplace_back(node, stack);
        return found->second;
    }

    struct Hash {
        std::size_t operator()(const Configuration& each) const {
            return static_cast<std::size_t>(each.first) * 0x9E3779B97F4A7C15u +
                   static_cast<std::size_t>(each.second);
        }
        std::size_t operator()(const Configurations& all) const {
            std::size_t hash = all.size();
            for (const Configuration& each : all) hash = hash * 31 + operator()(each);
            return hash;
        }
    };
    using Met = std::unordered_set<Configuration, Hash>;

    /// Adds what can be come to from a node without a token; false where the rule of the choice can end.
    bool close(int node, int stack, Met& met, Configurations& made) {
        std::vector<Configuration> open{{node, stack}};
        while (!open.empty()) {
            auto [at, behind] = open.back();
            open.pop_back();
            at = p_.skip(at);
            if (!met.emplace(at, behind).second) continue;
            const Node& n = p_.nodes[index(at)];
            switch (n.op) {
                case Op::Token:
                case Op::Set:
                    made.emplace_back(at, behind);
                    break;
                case Op::Soft:
                case Op::SoftStar:
                    made.emplace_back(at, behind);
                    open.emplace_back(n.next, behind);
                    break;
                case Op::Choice:
                    for (int t : n.targets) open.emplace_back(t, behind);
                    break;
                case Op::Call:
                    open.emplace_back(p_.entry[index(n.arg)], push(n.run, behind));
                    break;
                case Op::End:
                    if (behind == kNoStack) return false;
                    open.emplace_back(stacks_[index(behind)].first, stacks_[index(behind)].second);
                    break;
                default:
                    break;
            }
        }
        return true;
    }

    int intern(Configurations configurations) {
        if (configurations.empty()) return kDead;
        if (configurations.size() > kManyConfigurations) return kAnything;
        std::sort(configurations.begin(), configurations.end());
        const auto [found, fresh] = setOf_.emplace(std::move(configurations), static_cast<int>(sets_.size()));
        if (fresh) sets_.push_back(found->first);
        return found->second;
    }

    int start(int node) {
        Met met;
        Configurations made;
        return close(node, kNoStack, met, made) ? intern(std::move(made)) : kAnything;
    }

    /// The configurations behind a token of class `c`.
    int step(int set, int c) {
        if (set <= kAnything) return set;
        if (steps_.size() < sets_.size())
            steps_.resize(sets_.size(), std::vector<int>(index(p_.classes), kUnknown));
        if (steps_[index(set)][index(c)] != kUnknown) return steps_[index(set)][index(c)];
        Met met;
        Configurations made;
        bool ends = false;
        const Configurations& from = sets_[index(set)];
        for (const auto& [node, stack] : from) {
            if (!takes_[index(node)][index(c)]) continue;
            const Node& n = p_.nodes[index(node)];
            if (!close(n.op == Op::SoftStar ? node : n.next, stack, met, made)) {
                ends = true;
                break;
            }
        }
        const int found = ends ? kAnything : intern(std::move(made));
        steps_[index(set)][index(c)] = found;
        return found;
    }

    using State = std::vector<int>;  ///< a set of configurations for each alternative

    static std::uint32_t alive(const State& state) {
        std::uint32_t mask = 0;
        for (std::size_t i = 0; i < state.size(); ++i)
            if (state[i] != kDead) mask |= std::uint32_t{1} << i;
        return mask;
    }

    State behind(const State& state, int c) {
        State next;
        for (int set : state) next.push_back(step(set, c));
        return next;
    }

    std::size_t sizeOf(const State& state) const {
        std::size_t size = 0;
        for (int set : state) size += sets_[index(set)].size();
        return size;
    }

    /// The classes of tokens that some configuration of a set takes.
    const Classes& taken(int set) {
        while (taken_.size() < sets_.size()) {
            Classes classes;
            for (const Configuration& each : sets_[taken_.size()]) classes |= takes_[index(each.first)];
            if (taken_.size() == kAnything) classes.set();
            taken_.push_back(classes);
        }
        return taken_[index(set)];
    }

    /// The alternatives that can take a token of class `c`.
    std::uint32_t fits(const State& state, int c) {
        std::uint32_t mask = 0;
        for (std::size_t i = 0; i < state.size(); ++i)
            if (taken(state[i])[index(c)]) mask |= std::uint32_t{1} << i;
        return mask;
    }

    /// What is known of a state from `left` more tokens: the alternatives, or a row.
    std::uint32_t decide(const State& state, int left) {
        const std::uint32_t mask = alive(state);
        const bool open = std::any_of(state.begin(), state.end(), [](int set) { return set > kAnything; });
        if (left == 0 || !open || (mask & (mask - 1)) == 0) return mask;
        const auto known = decided_.find({state, left});
        if (known != decided_.end()) return known->second;
        std::vector<std::uint32_t> row;
        row.reserve(index(p_.classes) + 1);
        const bool last = left == 1 || sizeOf(state) > kFewConfigurations;
        for (int c = 0; c < p_.classes; ++c) row.push_back(last ? fits(state, c) : decide(state, c, left));
        const bool same = std::all_of(row.begin(), row.end(), [&](std::uint32_t m) { return m == mask; });
        std::uint32_t found = mask;
        if (!same) {
            row.push_back(mask);
            const auto [at, fresh] = rowOf_.emplace(row, static_cast<int>(p_.lookahead.size()));
            if (fresh) p_.lookahead.push_back(std::move(row));
            found = Program::kMore | static_cast<std::uint32_t>(at->second);
        }
        decided_[{state, left}] = found;
        return found;
    }

    /// The same behind a token of class `c`.
    std::uint32_t decide(const State& state, int c, int left) {
        const std::uint32_t mask = fits(state, c);
        return (mask & (mask - 1)) == 0 ? mask : decide(behind(state, c), left - 1);
    }

    void look(Node& n) {
        State state;
        for (const Branch& branch : n.branches) state.push_back(start(branch.stop));
        n.ahead.resize(index(p_.classes));
        for (int c = 0; c < p_.classes; ++c) n.ahead[index(c)] = decide(state, c, Program::kLookahead);
    }

    Program& p_;
    std::vector<Classes> takes_;  ///< by node
    std::vector<Classes> taken_;  ///< by set
    std::vector<std::pair<int, int>> stacks_;
    std::unordered_map<Configuration, int, Hash> stackOf_;
    std::vector<Configurations> sets_;
    std::unordered_map<Configurations, int, Hash> setOf_;
    std::vector<std::vector<int>> steps_;  ///< by set and class
    std::map<std::pair<State, int>, std::uint32_t> decided_;
    std::map<std::vector<std::uint32_t>, int> rowOf_;
};

}  // namespace

void lookAhead(Program& program) {
    Lookahead(program).run();
}

}  // namespace zr::gc
