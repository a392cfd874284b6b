#include "grammar/engine/ends_behind.h"

#include <algorithm>

namespace zr::engine {
namespace {

/// Turns 64 rows of 64 bits so that bit c of row r becomes bit r of row c: halves are exchanged, then
/// quarters in each half, down to single bits (Warren, Hacker's Delight, 7-3).
void transpose(std::uint64_t* rows) {
    std::uint64_t mask = 0x00000000FFFFFFFFu;
    for (unsigned width = 32; width != 0; width /= 2, mask ^= mask << width)
        for (unsigned row = 0; row < 64; row = ((row | width) + 1) & ~width) {
            const std::uint64_t exchanged = ((rows[row] >> width) ^ rows[row | width]) & mask;
            rows[row] ^= exchanged << width;
            rows[row | width] ^= exchanged;
        }
}

}  // namespace

void EndsBehind::start(const PositionSets& sets, std::size_t nodes) {
    sets_ = &sets;
    placeOf_.assign(nodes, kNone);
    words_.clear();
    known_.clear();
}

void EndsBehind::note(std::uint16_t node, std::uint32_t position, SetId ends) {
    if (placeOf_[node] == kNone) {
        placeOf_[node] = static_cast<std::uint32_t>(known_.size());
        known_.emplace_back();
        words_.resize(words_.size() + sets_->wordCount());
    }
    Word& word = words_[placeOf_[node] * std::size_t{sets_->wordCount()} + sets_->wordOf(position)];
    if (sets_->contains(ends, position)) word.here |= sets_->bitOf(position);
    if (sets_->isSingle(ends, position)) return;
    word.elsewhere |= sets_->bitOf(position);
    ++known_[placeOf_[node]].elsewhere;
}

void StartsBefore::start() {
    for (Block& block : blocks_) block.node = kNoNode;
}

StartsBefore::Block& StartsBefore::blockFor(std::uint16_t node, std::uint32_t ends) {
    const auto known = std::find_if(blocks_.begin(), blocks_.end(), [&](const Block& block) {
        return block.node == node && block.ends == ends;
    });
    return known != blocks_.end() ? *known : blocks_[oldest_++ % blocks_.size()];
}

std::size_t StartsBefore::capacity() const {
    std::size_t rows = 0;
    for (const Block& block : blocks_) rows += block.rows.capacity();
    return rows * sizeof(std::uint64_t);
}

/// Turns ends by position into positions by end.
void StartsBefore::Block::turn(std::uint32_t word) {
    std::uint64_t* row = rows.data() + (word - range.from) * kBits;
    transpose(row);
    for (std::size_t bit = 0; bit < kBits; ++bit)
        if (row[bit] != 0) used[bit] = {std::min(used[bit].from, word), word + 1};
}

}  // namespace zr::engine
