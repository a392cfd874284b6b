#include "grammar/engine/text_index.h"

#include <cstddef>

namespace zr::engine {

TextIndex::TextIndex(const ParserTable& table, const std::vector<std::uint16_t>& types)
    : table_(&table), types_(&types), count_(static_cast<std::uint32_t>(types.size())) {
    index();
}

void TextIndex::cutAt(std::uint32_t count) {
    count_ = count;
    index();
}

void TextIndex::index() {
    classes_.resize(count_ + 1);
    lastOf_.assign(table_->maxToken + 1, 0);
    bool closers = false;
    for (std::uint32_t i = 0; i < count_; ++i) {
        classes_[i] = table_->classOf[type(i)];
        lastOf_[type(i)] = i + 1;
        closers = closers || isCloser(i);
    }
    classes_[count_] = table_->classOf[0];
    runEnd_.clear();
    if (closers) {
        runEnd_.resize(count_ + 1);
        runEnd_[count_] = count_;
        for (std::uint32_t i = count_; i-- > 0;) runEnd_[i] = isCloser(i) ? runEnd_[i + 1] : i;
    }
    candidates_.assign(table_->guardCount, {});
    barriers_.assign(table_->guardCount, {});
    nextOpener_.clear();
}

void TextIndex::indexGuard(std::uint16_t number) {
    const GuardRow& guard = table_->guards[number];
    std::vector<std::uint32_t>& candidates = candidates_[number];
    std::vector<std::uint32_t>& barriers = barriers_[number];
    candidates.resize(count_ + 1);
    barriers.resize(count_ + 1);
    candidates[count_] = kNone;
    barriers[count_] = count_;
    for (std::uint32_t i = count_; i-- > 0;) {
        const bool here = i > 0 && inSet(guard.follow, classes_[i]) && inSet(guard.last, classes_[i - 1]);
        candidates[i] = here ? i : candidates[i + 1];
        barriers[i] = inSet(guard.outside, classes_[i]) ? barriers[i + 1] : i;
    }
    if (!nextOpener_.empty()) return;
    nextOpener_.resize(count_ + 1);
    nextOpener_[count_] = count_ + 2;
    for (std::uint32_t i = count_; i-- > 0;)
        nextOpener_[i] = inSet(table_->openerSet, classes_[i]) ? i : nextOpener_[i + 1];
}

}  // namespace zr::engine
