#pragma once

#include <array>
#include <cstdint>
#include <vector>

#include "grammar/engine/derivation.h"
#include "grammar/engine/ends_behind.h"
#include "grammar/engine/options.h"
#include "grammar/engine/position_sets.h"
#include "grammar/engine/reach.h"
#include "grammar/engine/tables.h"
#include "grammar/engine/text_index.h"

/// The search that never turns back, for texts that the quick one (quick_search.h) gives up.
///
/// It goes through the text once from its end to its beginning and finds, for every node that Reach leaves
/// (reach.h) and every position, the set of all ends that the node's rule can come to from there. What lies
/// behind a node is the same for every rule that passes it, so sets are shared and a text with many readings
/// costs what its sets cost and not what trying the readings in order would. Then it walks down once from
/// the whole, and at every choice takes the first branch that still leads to an end that is wanted there.
namespace zr::engine {

class FullSearch {
 public:
    using Outcome = SearchOutcome;

    /// Looks how far `rule` can be read from `position`; false past the options' bounds. What the search
    /// remembers is kept for the next one. The table, the index and the options must outlive what follows.
    bool look(const ParserTable& table, TextIndex& text, const Options& options,
              const Reach::Recovery& recovery, std::uint16_t rule, std::uint32_t position);
    /// No derivation ends behind this; kNone where there is none at all.
    std::uint32_t furthest() const { return reach_.ends().empty() ? Reach::kNone : reach_.ends().back(); }
    /// Reads as far as any derivation of what was looked at reaches, and writes the derivation down. The
    /// index is left cut somewhere behind that place.
    Outcome read(std::uint16_t rule, std::uint32_t position, Derivation& derivation);

    /// All ends that `rule` can come to from `position`, in ascending order; none past the options' bounds.
    std::vector<std::uint32_t> allEnds(const ParserTable& table, TextIndex& text, const Options& options,
                                       std::uint16_t rule, std::uint32_t position);

    /// Where the derivation ends.
    std::uint32_t reached() const { return reached_; }
    std::uint64_t steps() const { return steps_ + (sets_.wordsJoined() - joinedBefore_) / kWordsAStep; }
    /// What the search has to remember, as Options::maxMemo counts it.
    std::size_t remembered() const { return bytes() / kMemoBytes; }
    std::size_t bytes() const;
    /// The bytes of memory that it keeps.
    std::size_t capacity() const;

 private:
    static constexpr SetId kEmpty = PositionSets::kEmpty;
    static constexpr std::uint64_t kWordsAStep = 8;
    /// What Options::maxMemo reckons with for each thing that a search remembers.
    static constexpr std::size_t kMemoBytes = 32;

    void start(const ParserTable& table, TextIndex& text, const Options& options,
               const Reach::Recovery& recovery);

    bool findSets(std::uint32_t position, std::uint32_t end);
    SetId setFor(std::uint16_t node, std::uint32_t position);
    bool isSkipped(const NodeRow& call, std::uint32_t position) const;
    SetId setBehind(const NodeRow& call, std::uint32_t position);
    void joinBehind(std::uint16_t node, const EndsBehind::Word& behind, std::uint32_t word,
                    std::uint64_t from);
    std::uint64_t counted(const NodeRow& call, std::uint32_t position, std::uint32_t word,
                          std::uint64_t bits) const;
    SetId setAt(std::uint16_t node, std::uint32_t position) const;
    SetId endsOf(std::uint16_t rule, std::uint32_t position) const {
        return setAt(searchedFrom(*table_, table_->rules[rule].entry), position);
    }
    /// The ends that a walk may come to: mostly very few, and far from each other.
    struct Wanted {
        static constexpr std::uint32_t kFew = 4;
        std::array<std::uint32_t, kFew> few{};
        std::uint32_t count = 0;  ///< in `few`; kFew + 1 where they are in `many`
        SetId many = kEmpty;
    };
    bool leadsTo(SetId set, const Wanted& wanted) const;

    /// A rule whose path is being written down.
    struct Walk {
        std::uint32_t part;
        Wanted wanted;
        std::uint16_t node;
        std::uint32_t position;
    };

    Outcome writeDown(std::uint16_t rule, std::uint32_t position);
    void comeBack(Walk& walk, std::uint32_t part, std::uint32_t end);
    std::uint32_t addPart(const Walk& walk, bool recovered);
    bool walkOn(Walk& walk);
    Wanted wantedBy(const Walk& walk, const NodeRow& call);

    const ParserTable* table_ = nullptr;
    TextIndex* text_ = nullptr;
    const Options* options_ = nullptr;
    Reach::Recovery recovery_;
    Derivation* made_ = nullptr;

    Reach reach_;
    PositionSets sets_;
    std::vector<SetId> byVertex_;      ///< of the nodes that were kept
    std::vector<SetId> here_, ahead_;  ///< by node: of the position at hand and of the next one
    EndsBehind behind_;
    StartsBefore starts_;
    std::vector<PositionSets::Part> gained_;

    std::vector<Walk> walks_;
    std::uint64_t steps_ = 0, joinedBefore_ = 0;
    std::uint32_t reached_ = 0;
};

}  // namespace zr::engine
