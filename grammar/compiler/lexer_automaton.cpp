#include <algorithm>
#include <functional>
#include <map>
#include <string>

#include "grammar/compiler/error.h"
#include "grammar/compiler/passes.h"

namespace zr::gc {
namespace {

constexpr int kUnits = 0x10000;

/// Sets of instructions can be without number, and a state must fit 16 bits; the lexers here have
/// some thousand.
constexpr std::size_t kMostStates = 4000;
/// Instructions in all these sets; the lexers here have some ten thousand.
constexpr std::size_t kMostHeld = 200000;

class LexerBuilder {
 public:
    explicit LexerBuilder(const LexerGrammar& grammar) : grammar_(grammar) {
        for (std::size_t i = 0; i < grammar.rules.size(); ++i) indexOf_[grammar.rules[i].name] = i;
    }

    LexerProgram run() {
        for (const LexRule& rule : grammar_.rules) {
            if (rule.alternatives.empty()) {
                program_.entry.push_back(-1);
                continue;
            }
            const int accept = add(LexInstruction(LexInstruction::Op::Accept));
            program_.entry.push_back(alternatives(rule, rule.alternatives, accept));
        }
        classes();
        determinise();
        return std::move(program_);
    }

 private:
    int add(LexInstruction i) {
        program_.code.push_back(i);
        return static_cast<int>(program_.code.size()) - 1;
    }
    LexInstruction& at(int i) { return program_.code[static_cast<std::size_t>(i)]; }

    int split(int a, int b) {
        const int s = add(LexInstruction(LexInstruction::Op::Split));
        at(s).next = a;
        at(s).other = b;
        return s;
    }

    int alternatives(const LexRule& rule, const std::vector<std::vector<LexElement>>& all, int next) {
        int entry = -1;
        for (auto a = all.rbegin(); a != all.rend(); ++a) {
            int start = next;
            for (auto e = a->rbegin(); e != a->rend(); ++e) start = element(rule, *e, start);
            entry = entry < 0 ? start : split(start, entry);
        }
        return entry;
    }

    int element(const LexRule& rule, const LexElement& e, int next) {
        using R = LexElement::Repeat;
        if (e.repeat == R::Once) return once(rule, e, next);
        if (e.repeat == R::Optional) return split(once(rule, e, next), next);
        const int loop = add(LexInstruction(LexInstruction::Op::Split));
        const int round = once(rule, e, loop);
        at(loop).next = round;
        at(loop).other = next;
        return e.repeat == R::Star ? loop : round;
    }

    int once(const LexRule& rule, const LexElement& e, int next) {
        switch (e.kind) {
            case LexElement::Kind::Text:
                for (auto c = e.text.rbegin(); c != e.text.rend(); ++c) next = unit(*c, e.anyCase, next);
                return next;
            case LexElement::Kind::Set:
                if (e.set.ranges.empty()) throw GrammarError(grammar_.file, e.line, "the set holds nothing");
                return set(e.set, next);
            case LexElement::Kind::Group:
                return alternatives(rule, e.alternatives, next);
            case LexElement::Kind::Rule:
                break;
        }
        const auto found = indexOf_.find(e.rule);
        if (found == indexOf_.end())
            throw GrammarError(grammar_.file, e.line, "lexer rule " + e.rule + " is not defined");
        const LexRule& other = grammar_.rules[found->second];
        if (&other == &rule || std::find(open_.begin(), open_.end(), &other) != open_.end())
            throw GrammarError(grammar_.file, e.line, "lexer rule " + e.rule + " refers to itself");
        if (other.alternatives.empty())
            throw GrammarError(grammar_.file, e.line, "lexer rule " + e.rule + " never matches");
        open_.push_back(&other);
        const int result = alternatives(other, other.alternatives, next);
        open_.pop_back();
        return result;
    }

    int range(int low, int high, int next) {
        const int r = add(LexInstruction(LexInstruction::Op::Range));
        at(r).low = low;
        at(r).high = high;
        at(r).next = next;
        return r;
    }

    int unit(char16_t c, bool anyCase, int next) {
        const bool letter = (c >= u'A' && c <= u'Z') || (c >= u'a' && c <= u'z');
        if (!anyCase || !letter) return range(c, c, next);
        const int upper = c & ~0x20, lower = c | 0x20;
        return split(range(upper, upper, next), range(lower, lower, next));
    }

    int set(const CharSet& s, int next) {
        int entry = -1;
        for (const auto& [low, high] : s.ranges) {
            const int r = range(low, high, next);
            entry = entry < 0 ? r : split(entry, r);
        }
        return entry;
    }

    void classes() {
        std::vector<bool> edge(kUnits + 1, false);
        edge[0] = true;
        for (const LexInstruction& i : program_.code) {
            if (i.op != LexInstruction::Op::Range) continue;
            edge[static_cast<std::size_t>(i.low)] = true;
            edge[static_cast<std::size_t>(i.high) + 1] = true;
        }
        // Two stretches of units behave alike when the same ranges hold them.
        std::map<std::vector<int>, int> known;
        program_.unitClass.assign(kUnits, 0);
        int current = 0;
        for (int c = 0; c < kUnits; ++c) {
            if (edge[static_cast<std::size_t>(c)]) {
                std::vector<int> holders;
                for (std::size_t i = 0; i < program_.code.size(); ++i) {
                    const LexInstruction& r = program_.code[i];
                    if (r.op == LexInstruction::Op::Range && r.low <= c && c <= r.high)
                        holders.push_back(static_cast<int>(i));
                }
                current = known.emplace(std::move(holders), static_cast<int>(known.size())).first->second;
                if (static_cast<std::size_t>(current) == representative_.size()) representative_.push_back(c);
            }
            program_.unitClass[static_cast<std::size_t>(c)] = current;
        }
        program_.classes = static_cast<int>(known.size());
    }

    void close(std::vector<int>& states) const {
        std::vector<bool> seen(program_.code.size(), false);
        std::vector<int> work = std::move(states);
        states.clear();
        while (!work.empty()) {
            const int s = work.back();
            work.pop_back();
            if (seen[static_cast<std::size_t>(s)]) continue;
            seen[static_cast<std::size_t>(s)] = true;
            const LexInstruction& i = program_.code[static_cast<std::size_t>(s)];
            if (i.op == LexInstruction::Op::Split) {
                work.push_back(i.next);
                work.push_back(i.other);
            } else {
                states.push_back(s);
            }
        }
        std::sort(states.begin(), states.end());
    }

    void determinise() {
        std::map<int, int> ruleOfAccept;
        std::vector<int> start;
        for (std::size_t r = 0; r < grammar_.rules.size(); ++r) {
            // Fragments help other rules and never stand for a token themselves.
            if (grammar_.rules[r].fragment || program_.entry[r] < 0) continue;
            start.push_back(program_.entry[r]);
        }
        int accept = -1, rule = -1;
        for (std::size_t i = 0, r = 0; i < program_.code.size(); ++i) {
            if (program_.code[i].op != LexInstruction::Op::Accept) continue;
            while (program_.entry[r] < 0) ++r;
            accept = static_cast<int>(i);
            rule = static_cast<int>(r++);
            ruleOfAccept[accept] = rule;
        }
        std::map<std::vector<int>, int> known;
        std::vector<std::vector<int>> sets;
        std::size_t held = 0;
        const auto state = [&](std::vector<int> set) {
            close(set);
            const auto [found, fresh] = known.emplace(set, static_cast<int>(sets.size()));
            if (fresh) {
                held += set.size();
                sets.push_back(std::move(set));
            }
            if (held > kMostHeld)
                throw GrammarError(
                    grammar_.file, 0,
                    "more than " + std::to_string(kMostHeld) + " instructions in lexer states");
            if (sets.size() > kMostStates)
                throw GrammarError(grammar_.file, 0,
                                   "more than " + std::to_string(kMostStates) + " lexer states");
            return found->second;
        };
        state(std::move(start));
        for (std::size_t s = 0; s < sets.size(); ++s) {
            const std::vector<int> set = sets[s];
            int accepts = -1;
            for (int i : set) {
                const auto found = ruleOfAccept.find(i);
                if (found != ruleOfAccept.end() && (accepts < 0 || found->second < accepts))
                    accepts = found->second;
            }
            program_.accept.push_back(accepts);
            std::vector<int> row(static_cast<std::size_t>(program_.classes), -1);
            for (int c = 0; c < program_.classes; ++c) {
                const int unit = representative_[static_cast<std::size_t>(c)];
                std::vector<int> to;
                for (int i : set) {
                    const LexInstruction& r = program_.code[static_cast<std::size_t>(i)];
                    if (r.op == LexInstruction::Op::Range && r.low <= unit && unit <= r.high)
                        to.push_back(r.next);
                }
                if (!to.empty()) row[static_cast<std::size_t>(c)] = state(std::move(to));
            }
            program_.next.push_back(std::move(row));
        }
    }

    const LexerGrammar& grammar_;
    std::map<std::string, std::size_t> indexOf_;
    std::vector<int> representative_;
    LexerProgram program_;
    std::vector<const LexRule*> open_;  ///< rules that are being put into others
};

}  // namespace

LexerProgram buildLexer(const LexerGrammar& grammar) {
    return LexerBuilder(grammar).run();
}

}  // namespace zr::gc
