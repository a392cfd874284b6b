#include <algorithm>
#include <vector>

#include "grammar/compiler/passes.h"

/// What the scope of an inlined rule does to its tree: a root made in there stays in there, and a tree of one
/// value is told which tokens it spans. Most small rules need neither of the two.
namespace zr::gc {
namespace {

/// How many values alternatives yield, as far as that matters: none, one, more.
struct Yield {
    int least, most;
};
constexpr int kMore = 2;

bool isSingle(const Alternative& a) {
    return a.root < 0 && a.elements.size() == 1 && a.elements[0].repeat == Repeat::Once;
}

class Scopes {
 public:
    explicit Scopes(const ParserGrammar& grammar) : least_(grammar.rules.size(), 0) {
        for (bool changed = true; changed;) {
            changed = false;
            for (std::size_t i = 0; i < least_.size(); ++i) {
                const int least = yieldOf(grammar.rules[i].alternatives).least;
                changed = changed || least != least_[i];
                least_[i] = least;
            }
        }
    }

    ScopeNeed needOf(const Rule& rule) const {
        if (needed(rule.alternatives)) return ScopeNeed::Always;
        return onlyTokens(rule.alternatives) ? ScopeNeed::Never : ScopeNeed::Marked;
    }

 private:
    /// Whether some element at the rule's own level becomes a root.
    static bool hasRoot(const std::vector<Alternative>& alternatives) {
        return std::any_of(alternatives.begin(), alternatives.end(), [](const Alternative& a) {
            return a.root >= 0 || std::any_of(a.elements.begin(), a.elements.end(), [](const Element& e) {
                       return e.mark == Mark::Root || hasRoot(e.alternatives);
                   });
        });
    }

    Yield yieldOf(const Element& e) const {
        Yield yield{1, 1};
        if (e.kind == Element::Kind::Rule) yield = {least_[static_cast<std::size_t>(e.ruleIndex)], kMore};
        if (e.kind == Element::Kind::Group) yield = yieldOf(e.alternatives);
        if (e.mark == Mark::Drop) yield = {0, 0};
        if (e.repeat == Repeat::Optional || e.repeat == Repeat::Star) yield.least = 0;
        if (yield.most > 0 && (e.repeat == Repeat::Star || e.repeat == Repeat::Plus)) yield.most = kMore;
        return yield;
    }

    /// Of a rule or of a group without roots.
    Yield yieldOf(const std::vector<Alternative>& alternatives) const {
        if (hasRoot(alternatives)) return {0, kMore};
        Yield all{kMore, 0};
        for (const Alternative& a : alternatives) {
            Yield sum{0, 0};
            for (const Element& e : a.elements) {
                const Yield yield = yieldOf(e);
                sum = {std::min(sum.least + yield.least, kMore), std::min(sum.most + yield.most, kMore)};
            }
            all = {std::min(all.least, sum.least), std::max(all.most, sum.most)};
        }
        return all;
    }

    /// A lone token notes its span itself, and a lone rule has noted that of its tree. More values than one
    /// have none.
    bool needed(const std::vector<Alternative>& alternatives) const {
        if (hasRoot(alternatives)) return true;
        return std::any_of(alternatives.begin(), alternatives.end(), [&](const Alternative& a) {
            if (isSingle(a)) return needed(a.elements[0].alternatives);
            const Yield yield = yieldOf({a});
            return yield.least <= 1 && yield.most >= 1;
        });
    }

    static bool onlyTokens(const std::vector<Alternative>& alternatives) {
        return std::all_of(alternatives.begin(), alternatives.end(), [](const Alternative& a) {
            if (!isSingle(a)) return false;
            const Element& e = a.elements[0];
            return e.kind == Element::Kind::Tokens ||
                   (e.kind == Element::Kind::Group && e.mark == Mark::None && onlyTokens(e.alternatives));
        });
    }

    std::vector<int> least_;  ///< by rule: values at least
};

}  // namespace

std::vector<ScopeNeed> scopeNeeds(const ParserGrammar& grammar) {
    const Scopes scopes(grammar);
    std::vector<ScopeNeed> needs;
    for (const Rule& rule : grammar.rules) needs.push_back(scopes.needOf(rule));
    return needs;
}

}  // namespace zr::gc
