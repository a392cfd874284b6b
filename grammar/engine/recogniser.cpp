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
    return derivation.capacity() + quick.capacity() + (full ? full->capacity() : 0);
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
    const QuickRun quick = quickSearch(rule, position);
    return quick.outcome == SearchOutcome::OverBudget ? fullSearch(rule, position, {})
                                                      : resultOf(quick.outcome, quick.end);
}

Recogniser::Result Recogniser::resultOf(SearchOutcome outcome, std::uint32_t end) {
    Result result;
    result.overLimit = outcome == SearchOutcome::TooDeep;
    result.overBudget = outcome == SearchOutcome::OverBudget;
    result.found = outcome == SearchOutcome::Found;
    if (result.found) result.high = end;
    return result;
}

Recogniser::QuickRun Recogniser::quickSearch(std::uint16_t rule, std::uint32_t position) {
    QuickSearch quick(*table_, text_, *options_, work_->derivation, work_->quick);
    const SearchOutcome outcome = quick.run(rule, position);
    steps_ += quick.steps();
    remembered_ = std::max(remembered_, quick.remembered());
    return {outcome, quick.end()};
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
    FullSearch& full = fullWork();
    bool overBudget = false;
    for (;;) {
        SearchOutcome outcome = SearchOutcome::OverBudget;
        std::uint32_t end = text_.count();
        if (full.look(*table_, text_, *options_, recovery, rule, position)) {
            outcome = SearchOutcome::NotFound;
            if (full.furthest() < text_.count() && recovery.place == Reach::kNone) {
                // What can't be read whole is often read quickly up to where that ends.
                text_.cutAt(full.furthest());
                const QuickRun quick = quickSearch(rule, position);
                if (quick.outcome != SearchOutcome::OverBudget) outcome = quick.outcome;
                end = quick.end;
            }
        }
        if (outcome == SearchOutcome::NotFound) {
            outcome = full.read(rule, position, work_->derivation);
            end = full.reached();
        }
        steps_ += full.steps();
        remembered_ = std::max(remembered_, full.remembered());
        if (outcome == SearchOutcome::OverBudget && text_.count() > position) {
            overBudget = true;
            text_.cutAt(position + (text_.count() - position) / 2);
            continue;
        }
        Result result = resultOf(outcome, end);
        result.overBudget = result.overBudget || overBudget;
        return result;
    }
}

}  // namespace zr::engine
