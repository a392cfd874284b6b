#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <vector>

#include "grammar/engine/position_sets.h"

/// For nodes that stand behind a Call: from where their rules can come to which ends. Most rules mostly end
/// behind a call, and a rule that ends at many places is asked about all of them at once, so this answers for
/// 64 positions at a time.
namespace zr::engine {

class EndsBehind {
 public:
    /// 64 positions.
    struct Word {
        std::uint64_t here = 0;       ///< where the rule can end at once
        std::uint64_t elsewhere = 0;  ///< from where it can come to other places
    };
    /// The last ends of a call in front of a node, and all that is behind them.
    struct Known {
        SetId ends = PositionSets::kEmpty, behind = PositionSets::kEmpty;
    };

    /// Forgets everything; nodes have numbers below `nodes`, and the sets are those of `sets`.
    void start(const PositionSets& sets, std::size_t nodes);
    void note(std::uint16_t node, std::uint32_t position, SetId ends);

    /// By word of the positions; null for a node that was never noted. Good until the next note().
    const Word* words(std::uint16_t node) const {
        const std::uint32_t place = placeOf_[node];
        return place == kNone ? nullptr : words_.data() + place * std::size_t{sets_->wordCount()};
    }
    /// Of a node that was noted.
    Known& known(std::uint16_t node) { return known_[placeOf_[node]]; }
    std::size_t bytes() const { return words_.size() * sizeof(Word); }
    std::size_t capacity() const {
        return words_.capacity() * sizeof(Word) + known_.capacity() * sizeof(Known) +
               placeOf_.capacity() * sizeof(std::uint32_t);
    }

 private:
    static constexpr std::uint32_t kNone = 0xFFFFFFFF;

    const PositionSets* sets_ = nullptr;
    std::vector<std::uint32_t> placeOf_;  ///< by node
    std::vector<Word> words_;
    std::vector<Known> known_;
};

/// The same the other way round: from where a node comes to an end, for the ends that were asked for last.
class StartsBefore {
 public:
    void start();

    /// By word of `range`, and in there by end: the positions from which `node` comes to an end in the word
    /// `ends`. `endsAt` gives the set of ends from a position. Good until the next call.
    template <typename EndsAt>
    const std::uint64_t* rows(const PositionSets& sets, std::uint16_t node, const EndsBehind::Word* behind,
                              PositionSets::Range range, std::uint32_t ends, EndsAt endsAt) {
        Block& block = blockFor(node, ends);
        if (block.node != node || block.ends != ends || block.range.from > range.from ||
            block.range.to < range.to) {
            block.node = kNoNode;
            block.rows.assign((range.to - range.from) * kBits, 0);
            for (std::uint32_t word = range.from; word < range.to; ++word) {
                std::uint64_t* rows = block.rows.data() + (word - range.from) * kBits;
                for (std::uint64_t left = behind[word].elsewhere; left != 0; left &= left - 1) {
                    const std::uint32_t position = sets.positionOf(word, left);
                    rows[(position - sets.from()) % kBits] = sets.word(endsAt(position), ends);
                }
                transpose(rows);
            }
            block.node = node;
            block.ends = ends;
            block.range = range;
        }
        return block.rows.data() + (range.from - block.range.from) * kBits;
    }

    std::size_t capacity() const;

 private:
    static constexpr std::size_t kBits = 64;
    static constexpr std::uint16_t kNoNode = 0xFFFF;

    struct Block {
        std::uint16_t node = kNoNode;
        std::uint32_t ends = 0;
        PositionSets::Range range{0, 0};
        std::vector<std::uint64_t> rows;
    };

    Block& blockFor(std::uint16_t node, std::uint32_t ends);
    static void transpose(std::uint64_t* rows);

    std::array<Block, 4> blocks_;
    std::size_t oldest_ = 0;
};

}  // namespace zr::engine
