#include <algorithm>
#include <cstddef>
#include <map>
#include <unordered_map>
#include <vector>

#include "grammar/compiler/outline_places.h"
#include "grammar/compiler/passes.h"

/// What a statement can look like: a finite automaton that takes all that the statement can read, and more.
/// It is the determinised form of OutlinePlaces (subset construction: Rabin and Scott, Finite Automata and
/// Their Decision Problems, 1959), with states that tell the same joined (Moore, Gedanken-Experiments on
/// Sequential Machines, 1956).
namespace zr::gc {
namespace {

/// A grammar that needs more gets no outline: states, and places looked at to find them.
constexpr std::size_t kManyStates = 10'000;
constexpr std::size_t kManySteps = 300'000'000;

constexpr int kDead = 0;  ///< nothing can be read up to here
constexpr int kAnything = 1;

class Determiniser {
 public:
    Determiniser(const Program& program, const OutlinePlaces& places)
        : p_(program), places_(places), metBy_(places.count(), 0) {}

    /// No states where there would be too many.
    Outline run() {
        addState({}, false);
        addState({}, true);
        made_.next[kAnything].assign(index(p_.classes), kAnything);
        stateOf_.emplace(Places(), kDead);
        made_.start = stateBehind(Places{OutlinePlaces::kStart});
        for (std::size_t state = kAnything + 1; state < made_.next.size(); ++state) {
            if (made_.next.size() > kManyStates || steps_ > kManySteps) return {};
            pass(state);
        }
        return std::move(made_);
    }

 private:
    using Places = std::vector<int>;
    struct Hash {
        std::size_t operator()(const Places& all) const {
            std::size_t hash = all.size();
            for (int place : all)
                hash = (hash ^ (hash >> 29)) * 0x9E3779B97F4A7C15u + static_cast<std::size_t>(place);
            return hash;
        }
    };
    using StateOf = std::unordered_map<Places, int, Hash>;

    int addState(Places places, bool accepts) {
        made_.next.emplace_back(index(p_.classes), kDead);
        made_.accepts.push_back(accepts);
        sets_.push_back(std::move(places));
        return static_cast<int>(sets_.size() - 1);
    }

    void pass(std::size_t state) {
        std::map<int, Places> to;
        for (int place : sets_[state])
            for (int c : classesOf(places_.node(place))) to[c].push_back(places_.behind(place));
        for (auto& [c, places] : to) {
            std::sort(places.begin(), places.end());
            places.erase(std::unique(places.begin(), places.end()), places.end());
            const int next = stateBehind(std::move(places));
            made_.next[state][index(c)] = next;
        }
    }

    std::set<int> classesOf(const Node& n) const {
        if (n.op != Op::Set) return {p_.classOf[index(n.arg)]};
        std::set<int> found;
        for (int token : p_.sets[index(n.arg)]) found.insert(p_.classOf[index(token)]);
        return found;
    }

    /// The state in which one is at all places that can be come to from these without a token.
    int stateBehind(Places from) {
        const auto [known, fresh] = behind_.emplace(std::move(from), 0);
        if (!fresh) return known->second;
        Places open = known->first, stops;
        bool accepts = false;
        ++turn_;
        while (!open.empty()) {
            const int place = open.back();
            open.pop_back();
            if (metBy_[index(place)] == turn_) continue;
            metBy_[index(place)] = turn_;
            ++steps_;
            accepts = accepts || places_.isEnd(place);
            if (places_.behind(place) >= 0) stops.push_back(place);
            open.insert(open.end(), places_.beside(place).begin(), places_.beside(place).end());
        }
        std::sort(stops.begin(), stops.end());
        known->second = stateOf(std::move(stops), accepts);
        return known->second;
    }

    int stateOf(Places stops, bool accepts) {
        if (isBlurred(stops, accepts)) return kAnything;
        // The accepting state of the same places is another one.
        Places key = stops;
        if (accepts) key.push_back(-1);
        const auto [found, fresh] = stateOf_.emplace(std::move(key), 0);
        if (fresh) found->second = addState(std::move(stops), accepts);
        return found->second;
    }

    /// Whether one may be inside quotes that take anything, or outside: the two would go on beside each other
    /// to the end of the text.
    bool isBlurred(const Places& stops, bool accepts) const {
        const auto open = std::find_if(stops.begin(), stops.end(), [&](int place) {
            // A complement such as ~X takes nearly every token.
            const Node& n = places_.node(place);
            return n.op == Op::Set && p_.sets[index(n.arg)].size() > p_.classOf.size() / 2;
        });
        if (open == stops.end()) return false;
        return accepts || std::any_of(stops.begin(), stops.end(),
                                      [&](int place) { return places_.rule(place) != places_.rule(*open); });
    }

    const Program& p_;
    const OutlinePlaces& places_;
    Outline made_;
    std::vector<Places> sets_;  ///< by state: places in front of a token
    StateOf stateOf_, behind_;
    std::vector<std::size_t> metBy_;  ///< by place: the turn that met it last
    std::size_t turn_ = 0, steps_ = 0;
};

/// Joins the states from which the same can come.
void minimise(Outline& outline) {
    const std::size_t states = outline.next.size();
    std::vector<int> groupOf(outline.accepts.begin(), outline.accepts.end());
    std::size_t groups = 0;
    for (;;) {
        std::map<std::vector<int>, int> found;
        std::vector<int> finer(states);
        for (std::size_t state = 0; state < states; ++state) {
            std::vector<int> tells{groupOf[state]};
            for (int next : outline.next[state]) tells.push_back(groupOf[index(next)]);
            finer[state] = found.emplace(std::move(tells), static_cast<int>(found.size())).first->second;
        }
        groupOf = std::move(finer);
        if (found.size() == groups) break;
        groups = found.size();
    }
    Outline joined;
    joined.next.resize(groups);
    joined.accepts.resize(groups);
    joined.start = groupOf[index(outline.start)];
    for (std::size_t state = 0; state < states; ++state) {
        const std::size_t group = index(groupOf[state]);
        joined.accepts[group] = outline.accepts[state];
        if (!joined.next[group].empty()) continue;
        for (int next : outline.next[state]) joined.next[group].push_back(groupOf[index(next)]);
    }
    outline = std::move(joined);
}

}  // namespace

void findOutline(Program& program, const ParserGrammar& grammar) {
    const OutlinePlaces places(program, grammar);
    if (places.areTooMany()) return;
    program.outline = Determiniser(program, places).run();
    if (!program.outline.next.empty()) minimise(program.outline);
}

}  // namespace zr::gc
