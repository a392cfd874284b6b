#include "grammar/engine/known_readings.h"

#include <algorithm>
#include <bit>

namespace zr::engine {
namespace {

/// Room for the places where a search has been, to begin with: one for each token, but no more than so many.
constexpr std::size_t kFewVisits = 4096;

}  // namespace

void KnownReadings::start(std::size_t positions) {
    calledAt_.assign(positions, kNone);
    called_.clear();
    open_.clear();
    ends_.clear();
    olderEnds_.clear();
    stepCount_ = 1;
    forgetVisits();
    compared_ = 0;
}

void KnownReadings::forgetVisits() {
    const std::size_t size = std::bit_ceil(std::min(calledAt_.size(), kFewVisits));
    if (visits_.size() > size) giveBack(visits_);
    visits_.assign(size, Visit());
    visitCount_ = 0;
}

std::uint32_t KnownReadings::add(std::uint16_t rule, std::uint32_t position, const Caller& caller,
                                 std::uint32_t depth) {
    const std::uint32_t number = calledCount();
    std::uint32_t& latest = calledAt_[position];
    growSlowly(called_);
    called_.push_back({caller, position, kNone, kNone, latest, depth, 0, rule, false});
    open_.push_back(number);
    latest = number;
    return number;
}

std::uint32_t KnownReadings::addEnd(std::uint32_t call, std::uint32_t low, std::uint32_t high,
                                    std::uint32_t last) {
    Called& called = called_[call];
    const std::uint32_t seen = std::uint32_t{1} << (low % 32);
    if (called.endsSeen & seen)
        for (std::uint32_t end = called.firstEnd; end != kNone; end = ends_[end].next, ++compared_)
            if (ends_[end].low == low && ends_[end].high == high) return kNone;
    called.endsSeen |= seen;
    const auto number = static_cast<std::uint32_t>(ends_.size());
    (called.lastEnd == kNone ? called.firstEnd : ends_[called.lastEnd].next) = number;
    called.lastEnd = number;
    growSlowly(ends_);
    ends_.push_back({called.position, low, high, kNone, last});
    return number;
}

void KnownReadings::startAgain() {
    complete(0);
    forgetVisits();
}

void KnownReadings::write(std::uint32_t last, std::uint32_t part, Derivation& derivation) {
    // The derivation grows while the ways are still needed: what isn't needed goes ahead of it. The rest
    // stays for the thread's next text.
    giveBack(visits_);
    giveBack(calledAt_);
    giveBack(called_);
    giveBack(open_);
    toWrite_.clear();
    addToWrite(last);
    const auto endPart = [&](std::uint32_t low, std::uint32_t high) {
        derivation.end(part, low, high);
        part = derivation.parts[part].outer;
    };
    while (!toWrite_.empty()) {
        const std::uint32_t next = toWrite_.back();
        toWrite_.pop_back();
        if (next & kPartEnds) {
            const End& end = ends_[next & ~kPartEnds];
            endPart(end.low, end.high);
            continue;
        }
        const std::uint32_t value = steps_[next] & ~kWord;
        switch (steps_[next] & kWord) {
            case kChoice:
                derivation.choices.push_back(static_cast<std::uint16_t>(value));
                break;
            case kEndOfOlder:
                endPart(olderEnds_[value].low, olderEnds_[value].high);
                break;
            default: {
                const std::uint32_t number = steps_[next - 1];
                const End& end = ends_[number];
                growSlowly(derivation.parts);
                derivation.parts.push_back(
                    {part, end.position, 0, 0, 0, 0, static_cast<std::uint16_t>(value), false});
                part = static_cast<std::uint32_t>(derivation.parts.size() - 1);
                toWrite_.push_back(kPartEnds | number);
                addToWrite(end.last);
            }
        }
    }
    giveBack(toWrite_);
}

/// The first step of a way comes to stand behind all others.
void KnownReadings::addToWrite(std::uint32_t last) {
    for (std::uint32_t step = last; step != kNone; step = stepBefore(step)) toWrite_.push_back(step);
}

void KnownReadings::growSteps() {
    growSlowly(steps_, kStepWords);
    steps_.resize(steps_.capacity());
}

void KnownReadings::growVisits() {
    std::vector<Visit> old(visits_.size() * 2);
    old.swap(visits_);
    for (const Visit& each : old)
        if (each != Visit()) insert(each);
}

bool KnownReadings::insert(const Visit& visit) {
    // Multiplicative hashing (Knuth, The Art of Computer Programming 3, 6.4).
    std::uint64_t hash = visit.where * 0x9E3779B97F4A7C15u;
    hash = (hash ^ visit.what) * 0x9E3779B97F4A7C15u;
    const std::size_t mask = visits_.size() - 1;
    for (std::size_t at = (hash >> 32) & mask;; at = (at + 1) & mask) {
        if (visits_[at] == visit) return false;
        if (visits_[at] != Visit()) continue;
        visits_[at] = visit;
        return true;
    }
}

std::size_t KnownReadings::bytes() const {
    return called_.size() * sizeof(Called) + ends_.size() * sizeof(End) + stepCount_ * sizeof(std::uint32_t) +
           olderEnds_.size() * sizeof(OlderEnd) + visits_.size() * sizeof(Visit);
}

std::size_t KnownReadings::capacity() const {
    return (calledAt_.capacity() + open_.capacity() + toWrite_.capacity()) * sizeof(std::uint32_t) +
           called_.capacity() * sizeof(Called) + ends_.capacity() * sizeof(End) +
           olderEnds_.capacity() * sizeof(OlderEnd) + steps_.capacity() * sizeof(std::uint32_t) +
           visits_.capacity() * sizeof(Visit);
}

}  // namespace zr::engine
