#include "grammar/engine/recogniser.h"

#include <algorithm>
#include <utility>

#include "grammar/engine/recovery.h"

namespace zr::engine {

Recogniser::Recogniser(const ParserTable& table, const std::vector<std::uint16_t>& types,
                       const Options& options)
    : table_(&table), options_(&options), text_(table, types) {
    work_ = std::move(spare());
    if (!work_) work_ = std::make_unique<Work>();
}

Recogniser::~Recogniser() {
    if (!work_ || work_->bytes() > kSpareBytes) return;
    std::unique_ptr<Work>& kept = spare();
    if (!kept || work_->bytes() > kept->bytes()) kept = std::move(work_);
}

std::size_t Recogniser::Work::bytes() const {
    return derivation.parts.capacity() * sizeof(Derivation::Part) +
           derivation.choices.capacity() * sizeof(std::uint16_t) +
           points.capacity() * sizeof(QuickSearch::Point) + (full ? full->capacity() : 0);
}

std::unique_ptr<Recogniser::Work>& Recogniser::spare() {
    static thread_local std::unique_ptr<Work> mine;
    return mine;
}

FullSearch& Recogniser::fullWork() {
    if (!work_->full) work_->full = std::make_unique<FullSearch>();
    return *work_->full;
}

Recogniser::Result Recogniser::run(std::uint16_t rule, std::uint32_t position) {
    QuickSearch quick(*table_, text_, *options_, work_->derivation, work_->points);
    const QuickSearch::Outcome outcome = quick.run(rule, position);
    steps_ += quick.steps();
    remembered_ = quick.remembered();
    bool tooDeep = outcome == QuickSearch::Outcome::TooDeep;
    if (outcome == QuickSearch::Outcome::GaveUp) {
        const FullSearch::Outcome completed = complete(quick);
        if (completed != FullSearch::Outcome::Found && completed != FullSearch::Outcome::TooDeep)
            return fullSearch(rule, position, {});
        tooDeep = completed == FullSearch::Outcome::TooDeep;
    }
    Result result;
    result.overLimit = tooDeep;
    if (result.overLimit) return result;
    result.found = true;
    result.high = text_.count();
    return result;
}

/// What the quick search has read ahead of the place where it rests stands if it can be completed at all.
FullSearch::Outcome Recogniser::complete(const QuickSearch& quick) {
    if (quick.resting() == nullptr) return FullSearch::Outcome::NotFound;
    const QuickSearch::Place& at = *quick.resting();
    FullSearch& full = fullWork();
    const FullSearch::Outcome outcome =
        full.complete(*table_, text_, *options_, {at.part, at.node, at.low}, work_->derivation);
    steps_ += full.steps();
    remembered_ = std::max(remembered_, full.remembered());
    return outcome;
}

Recogniser::Result Recogniser::recover(std::uint16_t rule, std::uint32_t position) {
    const std::uint32_t place = recoveryPlace(*table_, text_, *options_, fullWork(), rule, position);
    if (place == Reach::kNone) return {};
    return fullSearch(rule, position, {place, skippedTo(*table_, text_, place)});
}

/// Where a text takes more than the options allow, the furthest reading of its first half stands, or of a
/// quarter.
Recogniser::Result Recogniser::fullSearch(std::uint16_t rule, std::uint32_t position,
                                          const Reach::Recovery& recovery) {
    Result result;
    FullSearch& full = fullWork();
    for (;;) {
        const FullSearch::Outcome outcome =
            full.run(*table_, text_, *options_, recovery, rule, position, work_->derivation);
        steps_ += full.steps();
        remembered_ = std::max(remembered_, full.remembered());
        if (outcome == FullSearch::Outcome::OverBudget && text_.count() > position) {
            result.overBudget = true;
            text_.cutAt(position + (text_.count() - position) / 2);
            continue;
        }
        result.overBudget = result.overBudget || outcome == FullSearch::Outcome::OverBudget;
        result.overLimit = outcome == FullSearch::Outcome::TooDeep;
        if (outcome != FullSearch::Outcome::Found) return result;
        result.found = true;
        result.high = full.reached();
        return result;
    }
}

}  // namespace zr::engine
