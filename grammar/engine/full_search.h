#pragma once

#include <cstdint>
#include <vector>

#include "grammar/engine/derivation.h"
#include "grammar/engine/options.h"
#include "grammar/engine/reach.h"
#include "grammar/engine/tables.h"
#include "grammar/engine/text_index.h"

/// The search that never turns back, for texts on which the lazy one (recogniser.h) asks for too much.
///
/// It goes through the text once from its end to its beginning and finds, for every node that Reach leaves
/// (reach.h) and every position, the set of all ends that the node's rule can come to from there. What lies
/// behind a node is the same for every rule that passes it, so sets are shared and a text with many readings
/// costs what its sets cost and not what trying the readings in order would. Then it walks down once from
/// the whole, and at every choice takes the first branch that still leads to an end that is wanted there.
namespace zr::engine {

class FullSearch {
 public:
    static constexpr std::uint32_t kNone = 0xFFFFFFFF;

    enum class Outcome { Found, NotFound, TooDeep, OverBudget };

    /// The table and the index must outlive this object.
    FullSearch(const ParserTable& table, TextIndex& text, const Options& options,
               const Reach::Recovery& recovery)
        : table_(table), text_(text), options_(options), recovery_(recovery), reach_(table, text, recovery) {}

    /// Reads `rule` from `position` as far as any derivation reaches that ends at `bound` at most. The index
    /// is left cut somewhere behind that place.
    Outcome run(std::uint16_t rule, std::uint32_t position, std::uint32_t bound);

    /// The derivation that was found, and where it ends.
    Derivation& derivation() { return derivation_; }
    std::uint32_t reached() const { return reached_; }
    std::uint64_t steps() const { return steps_; }
    /// What the search has to remember, as Options::maxMemo counts it.
    std::size_t remembered() const;

 private:
    /// Positions as bits, words counted from the first one of the search. A set is never changed, so nodes
    /// share it.
    struct Set {
        std::uint32_t firstWord, count;
        std::size_t offset;  ///< in words_
    };
    using SetId = std::uint32_t;
    static constexpr SetId kEmpty = 0;

    bool findSets(std::uint32_t position, std::uint32_t end);
    SetId setFor(std::uint16_t node, std::uint32_t position);
    bool isSkipped(const NodeRow& call, std::uint32_t position) const;
    SetId setBehind(const NodeRow& call, std::uint32_t position);
    SetId setAt(std::uint16_t node, std::uint32_t position) const;
    SetId endsOf(std::uint16_t rule, std::uint32_t position) const {
        return setAt(searchedFrom(table_, table_.rules[rule].entry), position);
    }
    void join(SetId set);
    void widenTo(std::uint32_t from, std::uint32_t to);
    void joinWord(std::uint32_t word, std::uint64_t bits);
    SetId joined(SetId like);
    SetId single(std::uint32_t position);
    bool isSingle(SetId set, std::uint32_t position) const;
    bool contains(SetId set, std::uint32_t position) const;
    bool containsAll(SetId whole, SetId part) const;
    bool meet(SetId one, SetId other) const;
    std::uint32_t last(SetId set) const;

    /// For a node that stands behind a Call, as bits by position: where its rule can end at once, and where
    /// it can go on to other places. Most rules mostly end behind a call, so ends pass on by the word.
    struct Behind {
        std::uint64_t* here;
        std::uint64_t* elsewhere;
    };
    Behind behind(std::uint16_t node);
    /// The last ends of a call in front of such a node, and what was found behind them.
    struct Known {
        SetId ends = kEmpty, behind = kEmpty;
    };

    /// A rule whose path is being written down.
    struct Walk {
        std::uint32_t part;
        SetId wanted;
        std::uint16_t node;
        std::uint32_t position;
        std::uint32_t state;
    };

    Outcome writeDown(std::uint16_t rule, std::uint32_t position);
    void comeBack(Walk& walk, std::uint32_t part, std::uint32_t end, std::uint32_t state);
    void startWalk(std::uint16_t rule, std::uint32_t position, SetId wanted);
    bool walkOn(Walk& walk);
    SetId wantedBy(const Walk& walk, const NodeRow& call);
    std::uint32_t addState(std::uint16_t node, std::uint32_t position, std::uint32_t before,
                           std::uint32_t part, std::uint32_t end);

    const ParserTable& table_;
    TextIndex& text_;
    const Options& options_;
    const Reach::Recovery recovery_;
    Reach reach_;

    std::uint32_t from_ = 0, end_ = 0;
    std::size_t setWords_ = 0;  ///< words of a set that holds all positions
    std::vector<Set> sets_;
    std::vector<std::uint64_t> words_;
    std::vector<SetId> byVertex_;             ///< of the nodes that were kept, position by position
    std::vector<std::uint32_t> vertexFrom_;   ///< by position
    std::vector<std::uint8_t> vertexBefore_;  ///< by position and word of its row: nodes in the words before
    std::vector<std::uint32_t> columnOf_;     ///< by node: its place among those that stand behind a Call
    std::vector<std::uint64_t> columns_;
    std::vector<Known> knownBehind_;             ///< by column
    std::vector<std::uint64_t> joint_;           ///< the set being made
    std::uint32_t jointFrom_ = 0, jointTo_ = 0;  ///< words of it that are in use

    std::vector<Walk> walks_;
    Derivation derivation_;
    std::uint64_t steps_ = 0;
    std::uint32_t reached_ = 0;
};

}  // namespace zr::engine
