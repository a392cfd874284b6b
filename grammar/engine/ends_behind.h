#pragma once

#include <array>
#include <bit>
#include <cstddef>
#include <cstdint>
#include <vector>

#include "grammar/engine/position_sets.h"

/// For one node that stands behind a Call: where its rule can come to from each position. Most rules mostly
/// end behind a call, and a rule that ends at many places is asked about all of them at once, so this answers
/// for 64 positions at a time.
namespace zr::engine {

class EndsBehind {
 public:
    /// Forgets everything; the positions have so many words.
    void start(std::uint32_t words);
    /// Notes the ends from a position, which lies ahead of all that were noted before it.
    void note(const PositionSets& sets, std::uint32_t position, SetId ends);

    /// The positions of a word where the rule can end at once.
    std::uint64_t here(std::uint32_t word) const { return words_[word].here; }
    /// Those from which it can go on to other places.
    std::uint64_t elsewhere(std::uint32_t word) const { return words_[word].elsewhere; }

    /// Visits those of a word that are `among`, the last one first, each as a bit with the set of its ends.
    template <typename Visit>
    void forEach(std::uint32_t word, std::uint64_t among, Visit visit) const {
        std::size_t next = words_[word].first;
        for (std::uint64_t left = elsewhere(word); (left & among) != 0; ++next) {
            const std::uint64_t bit = std::bit_floor(left);
            left ^= bit;
            if (among & bit) visit(bit, ends_[next]);
        }
    }

    /// The same the other way round, for 64 ends: from which positions of a range each can be reached.
    class Inverse {
     public:
        /// The positions of a word of the range from which the rule comes to an end.
        std::uint64_t startsFor(std::uint32_t word, std::uint32_t bitOfEnd) const {
            return rows_[(word - starts_.from) * std::size_t{64} + bitOfEnd];
        }

     private:
        friend class EndsBehind;
        std::uint32_t ends_ = kNoWord;
        PositionSets::Range starts_{0, 0};
        std::vector<std::uint64_t> rows_;  ///< by word of the range and end
    };
    /// Made when it is first asked for, and kept for the next ends nearby. Good until the next call.
    const Inverse& inverse(const PositionSets& sets, PositionSets::Range starts, std::uint32_t wordOfEnds);

    std::size_t bytes() const { return words_.size() * sizeof(Word) + ends_.size() * sizeof(SetId); }

 private:
    static constexpr std::uint32_t kNoWord = 0xFFFFFFFF;

    struct Word {
        std::uint64_t here = 0, elsewhere = 0;
        std::size_t first = 0;  ///< in ends_, of its last position; those before follow
    };
    std::vector<Word> words_;
    std::vector<SetId> ends_;
    std::array<Inverse, 4> inverses_;
    std::size_t oldest_ = 0;
};

}  // namespace zr::engine
