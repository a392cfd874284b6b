#pragma once

#include <algorithm>
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
    /// Of a node: how many positions go on to other places, and for the last ends of a call in front of it
    /// all that is behind them. Few and many ends often take turns, as at each level of a nested text.
    struct Known {
        struct Last {
            SetId ends = PositionSets::kEmpty, behind = PositionSets::kEmpty;
        };
        std::array<Last, 2> last;
        std::uint32_t elsewhere = 0;
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
    static constexpr std::size_t kBits = 64;

    void start();

    /// Positions by word; those outside of `words` have none.
    struct Starts {
        const std::uint64_t* rows;
        std::uint32_t firstRow;
        PositionSets::Range words;
        std::uint64_t in(std::uint32_t word) const { return rows[(word - firstRow) * kBits]; }
    };
    /// From where in the words `range` a node comes to an end. `endsAt` gives the set of ends from a
    /// position. Good until the next call.
    template <typename EndsAt>
    Starts of(const PositionSets& sets, std::uint16_t node, const EndsBehind::Word* behind,
              PositionSets::Range range, std::uint32_t end, EndsAt endsAt) {
        const std::uint32_t ends = sets.wordOf(end);
        range.to = std::min(range.to, ends + 1);
        if (range.from >= range.to) return {nullptr, 0, {0, 0}};
        Block& block = blockFor(node, ends);
        if (block.node != node || block.ends != ends || block.range.from > range.from ||
            block.range.to < range.to) {
            block.node = kNoNode;
            block.range = range;
            block.rows.assign((range.to - range.from) * kBits, 0);
            block.used.fill({range.to, range.from});
            for (std::uint32_t word = range.from; word < range.to; ++word) {
                std::uint64_t* rows = block.rows.data() + (word - range.from) * kBits;
                std::uint64_t any = 0;
                for (std::uint64_t left = behind[word].elsewhere; left != 0; left &= left - 1) {
                    const std::uint32_t position = sets.positionOf(word, left);
                    const std::uint64_t comesTo = sets.word(endsAt(position), ends);
                    rows[(position - sets.from()) % kBits] = comesTo;
                    any |= comesTo;
                }
                if (any != 0) block.turn(word);
            }
            block.node = node;
            block.ends = ends;
        }
        const std::uint32_t bit = (end - sets.from()) % kBits;
        return {block.rows.data() + bit, block.range.from, block.used[bit]};
    }

    std::size_t capacity() const;

 private:
    static constexpr std::uint16_t kNoNode = 0xFFFF;

    struct Block {
        std::uint16_t node = kNoNode;
        std::uint32_t ends = 0;
        PositionSets::Range range{0, 0};
        std::vector<std::uint64_t> rows;
        std::array<PositionSets::Range, kBits> used{};  ///< by end: words that are not empty
        void turn(std::uint32_t word);
    };

    Block& blockFor(std::uint16_t node, std::uint32_t ends);

    std::array<Block, 16> blocks_;
    std::size_t oldest_ = 0;
};

}  // namespace zr::engine
