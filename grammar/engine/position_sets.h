#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

/// Sets of positions in a text, as bits. A set never changes once it is made, so whoever has the same
/// positions shares it. New ones are made of known ones, one after the other: join what belongs to it, then
/// take joined().
namespace zr::engine {

using SetId = std::uint32_t;

/// How many bits are set. The standard's own calls a library where a processor need not have an instruction
/// for it (Warren, Hacker's Delight, 5-1).
constexpr std::uint32_t countOnes(std::uint64_t bits) {
    bits -= (bits >> 1) & 0x5555555555555555u;
    bits = (bits & 0x3333333333333333u) + ((bits >> 2) & 0x3333333333333333u);
    bits = (bits + (bits >> 4)) & 0x0F0F0F0F0F0F0F0Fu;
    return static_cast<std::uint32_t>((bits * 0x0101010101010101u) >> 56);
}

class PositionSets {
 public:
    static constexpr SetId kEmpty = 0;

    /// The words that a set uses, counted from the one of the first position of all.
    struct Range {
        std::uint32_t from, to;
    };

    /// Forgets all sets; new ones hold positions from `from` to `end`.
    void start(std::uint32_t from, std::uint32_t end);

    // ---- making a set
    void join(SetId set);
    void joinWord(std::uint32_t word, std::uint64_t bits);
    /// The set of all that was joined; `like` is taken where it is the same.
    SetId joined(SetId like);
    /// Writes down what was joined and forgets it, if that is at most so many positions, and gives how many.
    /// One more than `most` says that there are more; then nothing is forgotten.
    std::uint32_t takeFew(std::uint32_t* positions, std::uint32_t most);
    SetId single(std::uint32_t position);
    /// A set without one of its positions.
    SetId without(SetId set, std::uint32_t position);

    // ---- looking at one
    bool isSingle(SetId set, std::uint32_t position) const;
    bool contains(SetId set, std::uint32_t position) const {
        const std::uint32_t here = position - from_;
        return ((word(set, here / 64) >> (here % 64)) & 1) != 0;
    }
    /// Positions in one word.
    struct Part {
        std::uint32_t word;
        std::uint64_t bits;
    };
    /// Whether a set has all that another has; puts what it has more into `gained` then, else all of it.
    bool grows(SetId set, SetId before, std::vector<Part>& gained) const;
    bool meet(SetId one, SetId other) const;
    std::uint32_t last(SetId set) const;
    Range range(SetId set) const { return {sets_[set].from, sets_[set].from + sets_[set].count}; }
    std::uint32_t size(SetId set) const { return sets_[set].size; }
    std::uint64_t word(SetId set, std::uint32_t word) const {
        const Set& s = sets_[set];
        return word - s.from < s.count ? words_[s.offset + (word - s.from)] : 0;
    }

    std::uint32_t from() const { return from_; }
    std::uint32_t wordOf(std::uint32_t position) const { return (position - from_) / 64; }
    std::uint64_t bitOf(std::uint32_t position) const {
        return std::uint64_t{1} << ((position - from_) % 64);
    }
    /// The position of the lowest bit in a word that has one.
    std::uint32_t positionOf(std::uint32_t word, std::uint64_t bits) const;
    /// Words that a set of all positions has.
    std::uint32_t wordCount() const { return static_cast<std::uint32_t>(joint_.size()); }
    /// Words that were gone through in making sets: the work it took.
    std::uint64_t wordsJoined() const { return wordsJoined_; }
    std::size_t bytes() const { return words_.size() * sizeof(std::uint64_t) + sets_.size() * sizeof(Set); }
    std::size_t capacity() const {
        return (words_.capacity() + joint_.capacity()) * sizeof(std::uint64_t) +
               sets_.capacity() * sizeof(Set);
    }

 private:
    struct Set {
        std::uint32_t from, count;
        std::uint32_t size;  ///< positions
        std::size_t offset;  ///< in words_
    };

    void drop();
    void widenTo(std::uint32_t from, std::uint32_t to);

    std::uint32_t from_ = 0;
    std::vector<Set> sets_;
    std::vector<std::uint64_t> words_;
    std::vector<std::uint64_t> joint_;           ///< the set being made
    std::uint32_t jointFrom_ = 0, jointTo_ = 0;  ///< words of it that are in use
    std::uint64_t wordsJoined_ = 0;
    SetId lastSingle_ = kEmpty;
};

}  // namespace zr::engine
