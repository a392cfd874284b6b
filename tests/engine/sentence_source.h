#pragma once

#include <cstdint>
#include <random>
#include <string>
#include <vector>

#include "grammar/engine/tables.h"

namespace zr::test {

/// Makes token sequences that a grammar's tables derive, and spoils them. The same seed gives the same
/// sequences on every machine.
class SentenceSource {
 public:
    SentenceSource(const engine::GrammarTable& grammar, std::uint32_t seed);

    /// A random derivation of `rule`. From about `size` tokens on every open rule is ended the shortest way.
    std::vector<std::uint16_t> sentence(std::uint16_t rule, std::size_t size);

    /// Deletes, doubles, swaps or inserts a few tokens.
    void spoil(std::vector<std::uint16_t>& tokens);

    /// A text whose tokens these are, for a lexer that drops blanks.
    std::u16string text(const std::vector<std::uint16_t>& tokens) const;

    std::uint32_t number(std::uint32_t below) { return random_() % below; }

 private:
    void spell();
    void measure();
    std::uint64_t lengthOf(std::uint16_t node) const;
    std::uint16_t shortestOf(std::uint32_t set) const;
    void derive(std::uint16_t node, std::size_t size, std::vector<std::uint16_t>& out);
    std::vector<std::uint16_t> membersOf(std::uint32_t set) const;

    const engine::ParserTable& table_;
    const engine::LexerTable& lexer_;
    std::mt19937 random_;
    std::vector<std::u16string> spelling_;  ///< by token number; empty when no text makes it
    std::vector<std::uint64_t> shortest_;   ///< by node: tokens to the end of its rule
};

}  // namespace zr::test
