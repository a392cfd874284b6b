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

void EndsBehind::start(std::uint32_t words) {
    words_.assign(words, {});
    ends_.clear();
    for (Inverse& inverse : inverses_) inverse.ends_ = kNoWord;
}

void EndsBehind::note(const PositionSets& sets, std::uint32_t position, SetId ends) {
    Word& word = words_[sets.wordOf(position)];
    const std::uint64_t bit = sets.bitOf(position);
    if (sets.contains(ends, position)) word.here |= bit;
    if (sets.isSingle(ends, position)) return;
    if (word.elsewhere == 0) word.first = ends_.size();
    word.elsewhere |= bit;
    ends_.push_back(ends);
}

const EndsBehind::Inverse& EndsBehind::inverse(const PositionSets& sets, PositionSets::Range starts,
                                               std::uint32_t wordOfEnds) {
    Inverse* made = nullptr;
    for (Inverse& known : inverses_) {
        if (known.ends_ != wordOfEnds) continue;
        if (known.starts_.from <= starts.from && known.starts_.to >= starts.to) return known;
        made = &known;
    }
    if (made == nullptr) made = &inverses_[oldest_++ % inverses_.size()];
    made->ends_ = kNoWord;
    made->rows_.assign((starts.to - starts.from) * std::size_t{64}, 0);
    for (std::uint32_t word = starts.from; word < starts.to; ++word) {
        std::uint64_t* rows = made->rows_.data() + (word - starts.from) * std::size_t{64};
        forEach(word, ~std::uint64_t{0}, [&](std::uint64_t bit, SetId ends) {
            rows[std::countr_zero(bit)] = sets.word(ends, wordOfEnds);
        });
        transpose(rows);
    }
    made->starts_ = starts;
    made->ends_ = wordOfEnds;
    return *made;
}

}  // namespace zr::engine
