#include "grammar/engine/position_sets.h"

#include <algorithm>
#include <bit>

namespace zr::engine {

void PositionSets::start(std::uint32_t from, std::uint32_t end) {
    from_ = from;
    sets_.assign(1, {0, 0, 0, 0});
    words_.clear();
    joint_.assign((end - from) / 64 + 1, 0);
    jointFrom_ = jointTo_ = 0;
    lastSingle_ = kEmpty;
}

void PositionSets::widenTo(std::uint32_t from, std::uint32_t to) {
    jointFrom_ = jointTo_ == 0 ? from : std::min(jointFrom_, from);
    jointTo_ = std::max(jointTo_, to);
}

void PositionSets::joinWord(std::uint32_t word, std::uint64_t bits) {
    if (bits == 0) return;
    joint_[word] |= bits;
    widenTo(word, word + 1);
}

void PositionSets::join(SetId id) {
    const Set& set = sets_[id];
    if (set.count == 0) return;
    widenTo(set.from, set.from + set.count);
    // At great depth much time is spent here: a loop that compilers make vector code of.
    std::uint64_t* to = joint_.data() + set.from;
    const std::uint64_t* from = words_.data() + set.offset;
    for (std::uint32_t i = 0; i < set.count; ++i) to[i] |= from[i];
    wordsJoined_ += set.count;
}

SetId PositionSets::joined(SetId like) {
    if (jointTo_ == 0) return kEmpty;
    const auto from = joint_.begin() + jointFrom_, to = joint_.begin() + jointTo_;
    const Set& known = sets_[like];
    SetId made = like;
    if (known.from != jointFrom_ || known.count != jointTo_ - jointFrom_ ||
        !std::equal(from, to, words_.begin() + static_cast<std::ptrdiff_t>(known.offset))) {
        made = static_cast<SetId>(sets_.size());
        std::uint32_t size = 0;
        for (auto word = from; word != to; ++word) size += countOnes(*word);
        sets_.push_back({jointFrom_, jointTo_ - jointFrom_, size, words_.size()});
        words_.insert(words_.end(), from, to);
    }
    drop();
    return made;
}

std::uint32_t PositionSets::takeFew(std::uint32_t* positions, std::uint32_t most) {
    std::uint32_t count = 0;
    for (std::uint32_t word = jointFrom_; word < jointTo_; ++word)
        for (std::uint64_t left = joint_[word]; left != 0; left &= left - 1) {
            if (count == most) return most + 1;
            positions[count++] = positionOf(word, left);
        }
    drop();
    return count;
}

void PositionSets::drop() {
    std::fill(joint_.begin() + jointFrom_, joint_.begin() + jointTo_, 0);
    jointFrom_ = jointTo_ = 0;
}

SetId PositionSets::single(std::uint32_t position) {
    // Rules often end one in the other.
    if (isSingle(lastSingle_, position)) return lastSingle_;
    joinWord(wordOf(position), bitOf(position));
    return lastSingle_ = joined(kEmpty);
}

SetId PositionSets::without(SetId set, std::uint32_t position) {
    if (isSingle(set, position)) return kEmpty;
    join(set);
    joint_[wordOf(position)] &= ~bitOf(position);
    return joined(kEmpty);
}

bool PositionSets::isSingle(SetId id, std::uint32_t position) const {
    const Set& set = sets_[id];
    return set.count == 1 && set.from == wordOf(position) && words_[set.offset] == bitOf(position);
}

bool PositionSets::grows(SetId id, SetId before, std::vector<Part>& gained) const {
    const Range all = range(id), shared = range(before);
    const std::uint64_t* mine = words_.data() + sets_[id].offset;
    const std::uint64_t* theirs = words_.data() + sets_[before].offset;
    bool grows = shared.from == shared.to || (shared.from >= all.from && shared.to <= all.to);
    gained.clear();
    for (std::uint32_t word = shared.from; grows && word < shared.to; ++word) {
        const std::uint64_t now = mine[word - all.from], then = theirs[word - shared.from];
        if (now == then) continue;
        grows = (then & ~now) == 0;
        gained.push_back({word, now & ~then});
    }
    if (!grows) gained.clear();
    for (std::uint32_t word = all.from; word < all.to; ++word) {
        if (grows && word == shared.from) word = shared.to;
        if (word < all.to) gained.push_back({word, mine[word - all.from]});
    }
    return grows;
}

bool PositionSets::meet(SetId one, SetId other) const {
    const Set& a = sets_[one];
    const Set& b = sets_[other];
    const std::uint32_t to = std::min(a.from + a.count, b.from + b.count);
    for (std::uint32_t w = std::max(a.from, b.from); w < to; ++w)
        if (words_[a.offset + w - a.from] & words_[b.offset + w - b.from]) return true;
    return false;
}

std::uint32_t PositionSets::last(SetId id) const {
    const Set& set = sets_[id];
    return positionOf(set.from + set.count - 1, std::bit_floor(words_[set.offset + set.count - 1]));
}

std::uint32_t PositionSets::positionOf(std::uint32_t word, std::uint64_t bits) const {
    return from_ + word * 64 + static_cast<std::uint32_t>(std::countr_zero(bits));
}

}  // namespace zr::engine
