#pragma once

#include <map>
#include <set>
#include <utility>
#include <vector>

#include "grammar/compiler/grammar_model.h"
#include "grammar/compiler/program.h"

namespace zr::gc {

/// The places that a reader of a statement can be at who doesn't remember all calls that it is in: a node,
/// and what is remembered of the calls around it. Where a rule is over, it may go on behind any call that
/// leads to the same place.
///
/// Calls that can't come again inside themselves are remembered; the rules of a recursion go on behind any
/// call of theirs (Nederhof, Practical Experiments with Regular Approximation of Context-Free Languages,
/// 2000). What is remembered inside a nested statement is only that there is one.
class OutlinePlaces {
 public:
    OutlinePlaces(const Program& program, const ParserGrammar& grammar);

    /// Whether the grammar has so many that nobody should go through them.
    bool areTooMany() const { return places_.size() > kMany; }
    std::size_t count() const { return places_.size(); }
    const Node& node(int place) const { return p_.nodes[index(places_[index(place)].first)]; }
    int rule(int place) const { return ruleOf_[index(places_[index(place)].first)]; }
    /// Where it goes on without a token, and behind one.
    const std::vector<int>& beside(int place) const { return beside_[index(place)]; }
    int behind(int place) const { return behind_[index(place)]; }
    /// Whether the statement is over there.
    bool isEnd(int place) const { return isEnd_[index(place)]; }

    static constexpr int kStart = 0;

 private:
    static constexpr std::size_t kMany = 60'000;
    /// What is remembered of the calls around a node: the node that the innermost goes on at, and the calls
    /// around that one; or nothing, in the statement itself and inside a nested one.
    static constexpr int kStatement = 0, kNested = 1;
    struct Around {
        int next, outer;
        int level;  ///< kStatement or kNested
    };

    void findRules();
    void findDepths();
    void findRecursions();
    void findPlaces();
    void passPlace(int place);
    std::set<int> callsOf(int rule) const;
    bool isNested(int from, int to) const;
    int around(const Node& call, int from, int outer);
    int place(int node, int around);

    const Program& p_;
    const ParserGrammar& grammar_;
    std::vector<int> ruleOf_;                 ///< by node
    std::vector<std::vector<int>> callsIn_;   ///< by rule: nodes
    std::vector<int> depthOf_;                ///< by rule: calls from the statement to it at least
    std::vector<std::vector<bool>> leadsTo_;  ///< by rule and rule, through calls that don't nest statements
    std::vector<Around> arounds_{{-1, kStatement, kStatement}, {-1, kNested, kNested}};
    std::map<std::pair<int, int>, int> aroundOf_;
    std::vector<std::pair<int, int>> places_;  ///< a node, and what is around it
    std::map<std::pair<int, int>, int> placeOf_;
    std::vector<std::vector<int>> beside_;
    std::vector<int> behind_;
    std::vector<bool> isEnd_;
    std::map<std::pair<int, int>, std::set<int>> behindCalls_;  ///< by rule and what is around it
};

}  // namespace zr::gc
