#pragma once

#include <cstdint>
#include <stdexcept>
#include <unordered_map>
#include <vector>

#include "grammar/engine/tables.h"
#include "tests/grammar/reading.h"
#include "tests/grammar/syntax_dump.h"

namespace zr::test {

/// A text that takes more work than the reference is given.
struct TooMuchWork : std::runtime_error {
    TooMuchWork() : std::runtime_error("too much work for the reference recogniser") {}
};

/// Reads tokens with the tables of a grammar in the plainest way there is: from every node at every position
/// all ends that the rule can still reach, each with its first derivation, in the order of the derivations.
/// No guards, no contexts, no intervals, nothing left out. What the engine gives has to equal it.
class ReferenceRecogniser {
 public:
    struct Reading {
        bool found = false;
        bool recovered = false;  ///< the recover rule stands for skipped tokens
        std::size_t taken = 0;   ///< tokens of the statement
        SyntaxDump tree;
    };

    ReferenceRecogniser(const engine::GrammarTable& grammar, const std::vector<TokenText>& tokens,
                        std::size_t maxItems);

    /// What the start rule makes of the tokens. Throws TooMuchWork.
    Reading read();

 private:
    /// One end that can be reached from a node, and how its first derivation goes on.
    struct Item {
        std::uint32_t end;
        std::uint32_t way;   ///< branch taken; behind a call the item of the called rule
        std::uint32_t rest;  ///< item of what follows
    };
    using Items = std::vector<Item>;

    struct Place {
        std::uint16_t node;
        std::uint32_t position;
        bool ofFirstToken;  ///< the rule around started at the first token, where recovery may help
    };

    struct Tree {
        int type = 0;
        std::u16string text;
        std::vector<Tree> children;
    };
    /// The trees of a rule at work; the first is the root of what follows once a root was set.
    struct Scope {
        engine::Mark mark;
        std::vector<Tree> list;
        bool rooted = false;
        void becomeRoot(Tree root);
        void gather();
    };

    const Items& itemsFrom(Place place);
    const Items& itemsAt(const Place& place);
    Items find(const Place& place);
    bool stepOver(Place& place) const;
    bool is(std::uint32_t position, std::uint16_t type) const;
    bool inSet(std::uint32_t set, std::uint32_t position) const;
    std::uint32_t endOfRecovery(std::uint32_t position) const;
    const Item* furthest(const Items& items) const;

    void build(std::vector<Scope>& scopes, Place place, std::uint32_t item);
    static void close(std::vector<Scope>& scopes);
    static void dump(const Tree& tree, std::size_t depth, SyntaxDump& to);

    const engine::GrammarTable& grammar_;
    const engine::ParserTable& table_;
    const std::vector<TokenText>& tokens_;
    std::size_t itemsLeft_;
    std::unordered_map<std::uint64_t, Items> memo_;
    bool recovering_ = false;
    std::int64_t askedAt_ = -1, recoverAt_ = -1;  ///< last place where the recover rule was asked for
};

}  // namespace zr::test
