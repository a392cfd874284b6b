#include <functional>

#include "grammar/compiler/error.h"
#include "grammar/compiler/passes.h"

namespace zr::gc {
namespace {

void forEachElement(std::vector<Alternative>& alternatives, const std::function<void(Element&)>& visit) {
    for (Alternative& alternative : alternatives) {
        for (Element& element : alternative.elements) {
            visit(element);
            forEachElement(element.alternatives, visit);
        }
    }
}

[[noreturn]] void refuse(const Rule& rule, int line, const std::string& what) {
    throw GrammarError(rule.file, line, what);
}

void resolveNames(ParserGrammar& grammar) {
    for (Rule& rule : grammar.rules) {
        forEachElement(rule.alternatives, [&](Element& e) {
            if (e.kind != Element::Kind::Rule) return;
            const auto found = grammar.indexOf.find(e.rule);
            if (found == grammar.indexOf.end()) refuse(rule, e.line, "rule " + e.rule + " is not defined");
            e.ruleIndex = found->second;
        });
    }
}

void checkReachable(ParserGrammar& grammar) {
    std::vector<bool> seen(grammar.rules.size(), false);
    std::vector<int> work = grammar.entryRules;
    work.push_back(grammar.start);
    while (!work.empty()) {
        const int at = work.back();
        work.pop_back();
        if (seen[static_cast<std::size_t>(at)]) continue;
        seen[static_cast<std::size_t>(at)] = true;
        forEachElement(grammar.rules[static_cast<std::size_t>(at)].alternatives, [&](Element& e) {
            if (e.kind == Element::Kind::Rule) work.push_back(e.ruleIndex);
        });
    }
    for (std::size_t i = 0; i < seen.size(); ++i)
        if (!seen[i])
            refuse(grammar.rules[i], grammar.rules[i].line,
                   "rule " + grammar.rules[i].name + " can't be reached from the start rule");
}

/// The start rule is `statement tail* EOF`; whether the tail stays in the tree is told by its marks.
void readStart(ParserGrammar& grammar) {
    const Rule& rule = grammar.rules[static_cast<std::size_t>(grammar.start)];
    const auto& alternatives = rule.alternatives;
    const bool shape = alternatives.size() == 1 && alternatives[0].elements.size() == 3 &&
                       alternatives[0].elements[0].kind == Element::Kind::Rule &&
                       alternatives[0].elements[1].repeat == Repeat::Star &&
                       alternatives[0].elements[2].tokens == std::set<int>{kEof};
    if (!shape) refuse(rule, rule.line, "the start rule must be: statement (.)* EOF");
    grammar.statement = alternatives[0].elements[0].ruleIndex;
    grammar.keepTail = alternatives[0].elements[2].mark != Mark::Drop;
}

/// A rule whose whole body is one `(...)?` doesn't succeed on nothing.
void unwrapOptionalBodies(ParserGrammar& grammar) {
    for (Rule& rule : grammar.rules) {
        if (rule.alternatives.size() != 1 || rule.alternatives[0].elements.size() != 1) continue;
        Element& only = rule.alternatives[0].elements[0];
        if (only.repeat == Repeat::Optional) only.repeat = Repeat::Once;
    }
}

void checkLeftRecursion(const ParserGrammar& grammar, const Facts& facts) {
    enum class Colour { White, Grey, Black };
    std::vector<Colour> colour(grammar.rules.size(), Colour::White);
    const std::function<void(int)> visit = [&](int index) {
        const Rule& rule = grammar.rules[static_cast<std::size_t>(index)];
        colour[static_cast<std::size_t>(index)] = Colour::Grey;
        const std::function<void(const std::vector<Alternative>&)> leftCorner =
            [&](const std::vector<Alternative>& alternatives) {
                for (const Alternative& alternative : alternatives) {
                    for (const Element& e : alternative.elements) {
                        if (e.kind == Element::Kind::Rule) {
                            const auto c = colour[static_cast<std::size_t>(e.ruleIndex)];
                            if (c == Colour::Grey)
                                refuse(rule, e.line,
                                       "left recursion: rule " + rule.name + " reaches " + e.rule +
                                           " again without taking a token");
                            if (c == Colour::White) visit(e.ruleIndex);
                        } else if (e.kind == Element::Kind::Group) {
                            leftCorner(e.alternatives);
                        }
                        if (!facts.nullableElement(e)) break;
                    }
                }
            };
        leftCorner(rule.alternatives);
        colour[static_cast<std::size_t>(index)] = Colour::Black;
    };
    for (std::size_t i = 0; i < grammar.rules.size(); ++i)
        if (colour[i] == Colour::White) visit(static_cast<int>(i));
}

void checkLoops(const ParserGrammar& grammar, const Facts& facts) {
    for (const Rule& rule : grammar.rules) {
        const std::function<void(const std::vector<Alternative>&)> check =
            [&](const std::vector<Alternative>& alternatives) {
                for (const Alternative& alternative : alternatives) {
                    for (const Element& e : alternative.elements) {
                        if (e.kind == Element::Kind::Group && e.repeat != Repeat::Once &&
                            facts.nullableBody(e.alternatives))
                            refuse(rule, e.line,
                                   "the body of a repetition in rule " + rule.name +
                                       " can be empty; give it a rule of its own");
                        if (e.kind == Element::Kind::Rule && e.repeat != Repeat::Once &&
                            facts.firstElement(e).empty())
                            refuse(rule, e.line, "repetition without progress in rule " + rule.name);
                        check(e.alternatives);
                    }
                }
            };
        check(rule.alternatives);
    }
}

}  // namespace

void resolve(ParserGrammar& grammar) {
    resolveNames(grammar);
    readStart(grammar);
    checkReachable(grammar);
    unwrapOptionalBodies(grammar);
    const Facts facts = collectFacts(grammar);
    checkLeftRecursion(grammar, facts);
    checkLoops(grammar, facts);
}

}  // namespace zr::gc
