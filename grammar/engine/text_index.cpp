#include "grammar/engine/text_index.h"

#include <algorithm>
#include <cstddef>

#include "grammar/engine/grow.h"

namespace zr::engine {

TextIndex::TextIndex(const ParserTable& table, const std::vector<std::uint16_t>& types)
    : table_(&table), types_(&types), count_(static_cast<std::uint32_t>(types.size())) {
    index();
}

void TextIndex::cutAt(std::uint32_t count) {
    count_ = count;
    index();
}

void TextIndex::release() {
    giveBack(classes_);
    giveBack(runEnd_);
    giveBack(lastOf_);
    giveBack(guards_);
    giveBack(guardIndexes_);
    giveBack(nextOpener_);
}

void TextIndex::index() {
    classes_.resize(count_ + 1);
    lastOf_.assign(table_->classes, 0);
    bool closers = false;
    for (std::uint32_t i = 0; i < count_; ++i) {
        classes_[i] = table_->classOf[type(i)];
        lastOf_[classes_[i]] = i + 1;
        closers = closers || isCloser(i);
    }
    classes_[count_] = table_->classOf[0];
    runEnd_.clear();
    if (closers) {
        runEnd_.resize(count_ + 1);
        runEnd_[count_] = count_;
        for (std::uint32_t i = count_; i-- > 0;) runEnd_[i] = isCloser(i) ? runEnd_[i + 1] : i;
    }
    guards_.assign(table_->guardCount, {});
    guardIndexes_.clear();
    nextOpener_.clear();
}

bool TextIndex::mayComeBehind(std::uint16_t number, std::uint32_t position) {
    // Mostly one of the next few tokens decides; a pass over the whole text pays only where they don't.
    constexpr std::uint32_t kFewTokens = 16;
    const GuardRow& guard = table_->guards[number];
    Guarded& known = guards_[number];
    if (known.last == kNone)
        for (known.last = count_ - 1; known.last != 0 && !isCandidate(number, known.last);) --known.last;
    if (known.last <= position) return false;
    if (known.index == kNone) {
        const std::uint32_t end = std::min(count_, position + kFewTokens);
        for (std::uint32_t i = position; i < end; ++i) {
            if (inSet(table_->openerSet, classes_[i]) || (i > position && isCandidate(number, i)))
                return true;
            if (!inSet(guard.outside, classes_[i]))
                return i + 1 < count_ && inSet(table_->openerSet, classes_[i + 1]);
        }
        known.index = static_cast<std::uint32_t>(guardIndexes_.size());
        guardIndexes_.push_back(indexOf(number));
    }
    const GuardIndex& index = guardIndexes_[known.index];
    const std::uint32_t barrier = index.barriers[position];
    return index.candidates[position + 1] <= barrier || nextOpener_[position] <= barrier + 1;
}

TextIndex::GuardIndex TextIndex::indexOf(std::uint16_t number) {
    const GuardRow& guard = table_->guards[number];
    GuardIndex known;
    known.candidates.resize(count_ + 1);
    known.barriers.resize(count_ + 1);
    known.candidates[count_] = kNone;
    known.barriers[count_] = count_;
    for (std::uint32_t i = count_; i-- > 0;) {
        known.candidates[i] = i > 0 && isCandidate(number, i) ? i : known.candidates[i + 1];
        known.barriers[i] = inSet(guard.outside, classes_[i]) ? known.barriers[i + 1] : i;
    }
    if (!nextOpener_.empty()) return known;
    nextOpener_.resize(count_ + 1);
    nextOpener_[count_] = count_ + 2;
    for (std::uint32_t i = count_; i-- > 0;)
        nextOpener_[i] = inSet(table_->openerSet, classes_[i]) ? i : nextOpener_[i + 1];
    return known;
}

}  // namespace zr::engine
