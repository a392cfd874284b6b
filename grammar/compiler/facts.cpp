#include <algorithm>
#include <functional>

#include "grammar/compiler/error.h"
#include "grammar/compiler/passes.h"

namespace zr::gc {
namespace {

/// A complement such as ~X takes nearly every token.
constexpr std::size_t kOpenSet = 100;
bool isOpenSet(const Element& e) {
    return e.kind == Element::Kind::Tokens && e.tokens.size() > kOpenSet;
}

const Element& unwrapped(const Element& e) {
    const Element* inner = &e;
    while (inner->kind == Element::Kind::Group && inner->alternatives.size() == 1 &&
           inner->alternatives[0].elements.size() == 1)
        inner = &inner->alternatives[0].elements[0];
    return *inner;
}

bool canSkip(const Element& e) {
    return e.repeat == Repeat::Optional || e.repeat == Repeat::Star;
}

template <typename T>
bool addAll(std::set<T>& to, const std::set<T>& from) {
    const auto before = to.size();
    to.insert(from.begin(), from.end());
    return to.size() != before;
}

/// Runs `step` over all rules until nothing changes any more.
void fixpoint(std::size_t rules, const std::function<bool(std::size_t)>& step) {
    for (bool changed = true; changed;) {
        changed = false;
        for (std::size_t i = 0; i < rules; ++i) changed |= step(i);
    }
}

}  // namespace

bool Facts::nullableElement(const Element& e) const {
    if (canSkip(e)) return true;
    if (e.kind == Element::Kind::Tokens) return false;
    if (e.kind == Element::Kind::Rule) return nullable[static_cast<std::size_t>(e.ruleIndex)];
    return nullableBody(e.alternatives);
}

bool Facts::nullableBody(const std::vector<Alternative>& alternatives) const {
    return std::any_of(alternatives.begin(), alternatives.end(), [&](const Alternative& a) {
        return std::all_of(a.elements.begin(), a.elements.end(),
                           [&](const Element& e) { return nullableElement(e); });
    });
}

std::set<int> Facts::firstElement(const Element& e) const {
    if (e.kind == Element::Kind::Tokens) return e.tokens;
    if (e.kind == Element::Kind::Rule) return first[static_cast<std::size_t>(e.ruleIndex)];
    std::set<int> result;
    for (const Alternative& a : e.alternatives) {
        for (const Element& inner : a.elements) {
            addAll(result, firstElement(inner));
            if (!nullableElement(inner)) break;
        }
    }
    return result;
}

Facts collectFacts(const ParserGrammar& grammar) {
    const std::size_t count = grammar.rules.size();
    Facts facts;
    facts.nullable.assign(count, false);
    facts.first.resize(count);
    facts.last.resize(count);
    facts.outside.resize(count);

    fixpoint(count, [&](std::size_t i) {
        const bool before = facts.nullable[i];
        facts.nullable[i] = facts.nullableBody(grammar.rules[i].alternatives);
        return facts.nullable[i] != before;
    });
    fixpoint(count, [&](std::size_t i) {
        Element body(Element::Kind::Group);
        body.alternatives = grammar.rules[i].alternatives;
        return addAll(facts.first[i], facts.firstElement(body));
    });
    const std::function<std::set<int>(const std::vector<Alternative>&)> lastOf =
        [&](const std::vector<Alternative>& alternatives) {
            std::set<int> result;
            for (const Alternative& a : alternatives) {
                for (auto e = a.elements.rbegin(); e != a.elements.rend(); ++e) {
                    if (e->kind == Element::Kind::Tokens)
                        addAll(result, e->tokens);
                    else if (e->kind == Element::Kind::Rule)
                        addAll(result, facts.last[static_cast<std::size_t>(e->ruleIndex)]);
                    else
                        addAll(result, lastOf(e->alternatives));
                    if (!facts.nullableElement(*e)) break;
                }
            }
            return result;
        };
    fixpoint(count,
             [&](std::size_t i) { return addAll(facts.last[i], lastOf(grammar.rules[i].alternatives)); });

    if (grammar.islandToken >= 0) facts.openers.insert(grammar.islandToken);
    const std::function<std::set<int>(const std::vector<Alternative>&)> outsideOf =
        [&](const std::vector<Alternative>& alternatives) {
            std::set<int> result;
            for (const Alternative& a : alternatives) {
                const Element* before = nullptr;
                for (const Element& e : a.elements) {
                    const Element& inner = unwrapped(e);
                    if (isOpenSet(inner) && before != nullptr && before->single &&
                        before->repeat == Repeat::Once)
                        facts.openers.insert(*before->tokens.begin());
                    else if (e.kind == Element::Kind::Tokens)
                        addAll(result, e.tokens);
                    else if (e.kind == Element::Kind::Group)
                        addAll(result, outsideOf(e.alternatives));
                    else if (e.ruleIndex != grammar.islandRule)
                        addAll(result, facts.outside[static_cast<std::size_t>(e.ruleIndex)]);
                    before = &e;
                }
            }
            return result;
        };
    fixpoint(count, [&](std::size_t i) {
        return addAll(facts.outside[i], outsideOf(grammar.rules[i].alternatives));
    });
    return facts;
}

}  // namespace zr::gc
