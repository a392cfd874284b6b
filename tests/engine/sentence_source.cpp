#include "tests/engine/sentence_source.h"

#include <algorithm>
#include <deque>

namespace zr::test {

using engine::NodeRow;
using engine::Op;

namespace {

constexpr std::uint64_t kNever = 1u << 30;

}  // namespace

SentenceSource::SentenceSource(const engine::GrammarTable& grammar, std::uint32_t seed)
    : table_(*grammar.parser), lexer_(*grammar.lexer), random_(seed) {
    spell();
    measure();
}

/// The shortest text of every token, from a walk over the lexer's automaton.
void SentenceSource::spell() {
    spelling_.resize(table_.maxToken + 1);
    std::vector<char16_t> unitOf(lexer_.classes, 0);  // letters and digits before signs
    for (char16_t unit = 1; unit < 128; ++unit) {
        char16_t& unitHere = unitOf[lexer_.asciiClass[unit]];
        if (unitHere == 0 || (unit >= u'a' && unit <= u'z' && unitHere < u'a')) unitHere = unit;
    }
    std::vector<bool> seen(0x10000, false);
    std::deque<std::pair<std::uint16_t, std::u16string>> work{{0, u""}};
    seen[0] = true;
    while (!work.empty()) {
        const auto [state, text] = work.front();
        work.pop_front();
        for (std::uint32_t cls = 0; cls < lexer_.classes; ++cls) {
            const std::uint16_t next = lexer_.next[static_cast<std::size_t>(state) * lexer_.classes + cls];
            if (next == engine::kNone16 || seen[next] || unitOf[cls] == 0) continue;
            seen[next] = true;
            const std::u16string longer = text + unitOf[cls];
            if (lexer_.accept[next] != engine::kNone16) {
                const engine::LexRuleRow& rule = lexer_.rules[lexer_.accept[next]];
                if (spelling_[rule.token].empty() && !rule.hidden) spelling_[rule.token] = longer;
            }
            work.emplace_back(next, longer);
        }
    }
}

std::vector<std::uint16_t> SentenceSource::membersOf(std::uint32_t set) const {
    std::vector<std::uint16_t> members;
    for (std::uint16_t type = 1; type <= table_.maxToken; ++type) {
        const std::uint32_t cls = table_.classOf[type];
        if (!spelling_[type].empty() && ((table_.classSets[set * 4 + cls / 64] >> (cls % 64)) & 1))
            members.push_back(type);
    }
    return members;
}

std::uint64_t SentenceSource::lengthOf(std::uint16_t at) const {
    const NodeRow& node = table_.nodes[at];
    switch (node.op) {
        case Op::End:
            return 0;
        case Op::Token:
            return std::min(kNever, (spelling_[node.arg].empty() ? kNever : 1) + shortest_[node.next]);
        case Op::Set:
            return std::min(kNever, (membersOf(node.arg).empty() ? kNever : 1) + shortest_[node.next]);
        case Op::Hard:
            return std::min(kNever, 1 + shortest_[node.next]);
        case Op::Call: {
            std::uint64_t inner = shortest_[table_.rules[node.arg].entry];
            if (node.flags & engine::kNonEmpty) inner = std::max<std::uint64_t>(inner, 1);
            return std::min(kNever, inner + shortest_[node.next]);
        }
        case Op::Choice: {
            std::uint64_t best = kNever;
            const engine::ChoiceRow& choice = table_.choices[node.arg];
            for (std::uint32_t i = 0; i < choice.targets; ++i)
                best = std::min(best, shortest_[table_.targets[choice.firstTarget + i]]);
            return best;
        }
        default:
            return shortest_[node.next];
    }
}

/// Lengths only shrink from "never", so going over all nodes until nothing changes gives the shortest.
void SentenceSource::measure() {
    std::vector<std::uint16_t> nodes;  // all that rules reach
    std::vector<bool> seen(0x10000, false);
    std::vector<std::uint16_t> work;
    for (std::uint32_t r = 0; r < table_.ruleCount; ++r) work.push_back(table_.rules[r].entry);
    while (!work.empty()) {
        const std::uint16_t at = work.back();
        work.pop_back();
        if (seen[at]) continue;
        seen[at] = true;
        nodes.push_back(at);
        const NodeRow& node = table_.nodes[at];
        if (node.op == Op::Choice) {
            const engine::ChoiceRow& choice = table_.choices[node.arg];
            for (std::uint32_t i = 0; i < choice.targets; ++i)
                work.push_back(table_.targets[choice.firstTarget + i]);
        } else if (node.op != Op::End) {
            work.push_back(node.next);
        }
    }
    shortest_.assign(0x10000, kNever);
    for (bool changed = true; changed;) {
        changed = false;
        for (const std::uint16_t at : nodes) {
            const std::uint64_t length = lengthOf(at);
            changed = changed || length != shortest_[at];
            shortest_[at] = length;
        }
    }
}

void SentenceSource::derive(std::uint16_t at, std::size_t size, std::vector<std::uint16_t>& out) {
    for (;;) {
        const NodeRow& node = table_.nodes[at];
        switch (node.op) {
            case Op::End:
                return;
            case Op::Token:
                out.push_back(node.arg);
                break;
            case Op::Hard:
                out.push_back(table_.closer);
                break;
            case Op::Set: {
                const std::vector<std::uint16_t> members = membersOf(node.arg);
                out.push_back(members[number(static_cast<std::uint32_t>(members.size()))]);
                break;
            }
            case Op::Soft:
            case Op::SoftStar:
                if (out.size() < size && number(2) == 0) out.push_back(table_.closer);
                break;
            case Op::Call:
                derive(table_.rules[node.arg].entry, size, out);
                break;
            case Op::Choice: {
                const engine::ChoiceRow& choice = table_.choices[node.arg];
                const std::uint16_t* targets = table_.targets + choice.firstTarget;
                std::uint16_t shortest = targets[0];
                for (std::uint32_t i = 1; i < choice.targets; ++i)
                    if (shortest_[targets[i]] < shortest_[shortest]) shortest = targets[i];
                const std::uint16_t any = targets[number(choice.targets)];
                // Most choices go the short way, or one rule would take all tokens there are.
                at = out.size() >= size || shortest_[any] >= kNever || number(5) < 2 ? shortest : any;
                continue;
            }
            default:
                break;
        }
        at = node.next;
    }
}

std::vector<std::uint16_t> SentenceSource::sentence(std::uint16_t rule, std::size_t size) {
    std::vector<std::uint16_t> out;
    derive(table_.rules[rule].entry, size, out);
    return out;
}

void SentenceSource::spoil(std::vector<std::uint16_t>& tokens) {
    for (std::uint32_t times = 1 + number(3); times-- > 0 && !tokens.empty();) {
        const auto count = static_cast<std::uint32_t>(tokens.size());
        const auto at = tokens.begin() + number(count);
        switch (number(4)) {
            case 0:
                tokens.erase(at);
                break;
            case 1:
                std::iter_swap(at, tokens.begin() + number(count));
                break;
            case 2:
                tokens.insert(at, tokens[number(count)]);
                break;
            default: {
                const auto type = static_cast<std::uint16_t>(number(table_.maxToken + 1));
                if (!spelling_[type].empty()) tokens.insert(at, type);
            }
        }
    }
}

std::u16string SentenceSource::text(const std::vector<std::uint16_t>& tokens) const {
    std::u16string text;
    // A single blank may belong to a token: NOT IN is one where NOT and IN are two.
    for (const std::uint16_t type : tokens) text += spelling_[type] + u"  ";
    return text;
}

}  // namespace zr::test
