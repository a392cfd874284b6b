#include "grammar/engine/known_readings.h"

#include "grammar/engine/grow.h"

namespace zr::engine {
namespace {

constexpr std::size_t kFewVisits = 64;

}  // namespace

void KnownReadings::start(std::size_t positions, std::size_t parts) {
    calledAt_.assign(positions, kNone);
    called_.clear();
    open_.clear();
    ends_.clear();
    choices_.clear();
    parts_.clear();
    notes_.assign(parts, PartNote());
    forgetVisits();
    work_ = 0;
}

void KnownReadings::forgetVisits() {
    if (visits_.size() > kFewVisits) giveBack(visits_);
    visits_.assign(kFewVisits, Visit());
    visitCount_ = 0;
}

void KnownReadings::note(std::size_t part, const PartNote& note) {
    notes_.resize(part);  // those of parts that are gone
    notes_.push_back(note);
}

void KnownReadings::add(const Derivation& derivation, std::uint16_t rule, std::uint32_t depth) {
    const std::size_t part = derivation.parts.size() - 1;
    const std::uint32_t number = calledCount();
    std::uint32_t& latest = calledAt_[derivation.parts[part].position];
    note(part, {number, kNone, static_cast<std::uint32_t>(derivation.choices.size()), false});
    open_.push_back(number);
    called_.push_back({kNone, kNone, latest, depth, rule, false});
    latest = number;
}

bool KnownReadings::addEnd(const Derivation& derivation, std::uint32_t part, std::uint32_t low,
                           std::uint32_t high) {
    PartNote& note = notes_[part];
    if (note.call == kNone) return true;
    Called& called = called_[note.call];
    for (std::uint32_t end = called.firstEnd; end != kNone; end = ends_[end].next, ++work_)
        if (ends_[end].low == low && ends_[end].high == high) return false;
    note.end = static_cast<std::uint32_t>(ends_.size());
    (called.lastEnd == kNone ? called.firstEnd : ends_[called.lastEnd].next) = note.end;
    called.lastEnd = note.end;
    copyOwn(derivation, part, low, high);
    return true;
}

/// Keeps a part's own choices, those in between the parts that it calls, and the ends of these.
void KnownReadings::copyOwn(const Derivation& derivation, std::uint32_t part, std::uint32_t low,
                            std::uint32_t high) {
    const auto firstChoice = static_cast<std::uint32_t>(choices_.size());
    const auto firstPart = static_cast<std::uint32_t>(parts_.size());
    const auto choiceCount = static_cast<std::uint32_t>(derivation.choices.size());
    const auto partCount = static_cast<std::uint32_t>(derivation.parts.size());
    std::uint32_t choice = notes_[part].choices;
    for (std::uint32_t i = part + 1;;) {
        const std::uint32_t to = i < partCount ? notes_[i].choices : choiceCount;
        for (; choice < to; ++choice) choices_.push_back(derivation.choices[choice]);
        if (i >= partCount) break;
        const Derivation::Part& inner = derivation.parts[i];
        parts_.push_back({notes_[i].end, inner.position,
                          static_cast<std::uint32_t>(choices_.size()) - firstChoice, inner.node});
        choice = inner.choices;
        i = inner.parts;
    }
    const auto choices = static_cast<std::uint32_t>(choices_.size()) - firstChoice;
    const auto parts = static_cast<std::uint32_t>(parts_.size()) - firstPart;
    ends_.push_back({low, high, kNone, firstChoice, choices, firstPart, parts});
    work_ += choices + parts;
}

void KnownReadings::use(std::uint32_t end, Derivation& derivation, std::uint32_t outer, std::uint16_t node,
                        std::uint32_t position) {
    const auto part = static_cast<std::uint32_t>(derivation.parts.size());
    note(part, {kNone, end, static_cast<std::uint32_t>(derivation.choices.size()), true});
    growSlowly(derivation.parts);
    derivation.parts.push_back({outer, position, 0, 0, 0, 0, node, false});
    derivation.end(part, ends_[end].low, ends_[end].high);
}

void KnownReadings::startAgain() {
    complete(0);
    notes_.assign(1, PartNote());
    forgetVisits();
}

void KnownReadings::fillIn(Derivation& derivation) {
    giveBack(visits_);
    giveBack(calledAt_);
    giveBack(called_);
    giveBack(open_);
    Derivation filled;
    filled.rule = derivation.rule;
    // How much had come in ahead of each part.
    std::vector<std::uint32_t> partsIn{0}, choicesIn{0};
    std::uint32_t choice = 0;
    for (std::uint32_t i = 0; i < derivation.parts.size(); ++i) {
        Derivation::Part part = derivation.parts[i];
        part.outer += partsIn[part.outer];
        filled.parts.push_back(part);
        if (notes_[i].isKnown) {
            filled.choices.insert(filled.choices.end(), derivation.choices.begin() + choice,
                                  derivation.choices.begin() + notes_[i].choices);
            choice = notes_[i].choices;
            fillIn(notes_[i].end, static_cast<std::uint32_t>(filled.parts.size()) - 1, filled);
        }
        partsIn.push_back(static_cast<std::uint32_t>(filled.parts.size()) - i - 1);
        choicesIn.push_back(static_cast<std::uint32_t>(filled.choices.size()) - choice);
    }
    filled.choices.insert(filled.choices.end(), derivation.choices.begin() + choice,
                          derivation.choices.end());
    for (std::uint32_t i = 0; i < derivation.parts.size(); ++i) {
        Derivation::Part& part = filled.parts[i + partsIn[i]];
        const std::uint32_t behind = derivation.parts[i].parts;
        part.parts = behind + partsIn[behind];
        part.choices = derivation.parts[i].choices + choicesIn[behind];
    }
    derivation.choices.swap(filled.choices);
    derivation.parts.swap(filled.parts);
}

/// Writes down what is in a part that was written down last.
void KnownReadings::fillIn(std::uint32_t number, std::uint32_t part, Derivation& derivation) {
    filled_.assign(1, {number, part, 0, 0});
    while (!filled_.empty()) {
        Filled& at = filled_.back();
        const End& end = ends_[at.end];
        const bool isLast = at.nextPart == end.parts;
        const std::uint32_t to = isLast ? end.choices : parts_[end.firstPart + at.nextPart].choices;
        const auto choices = choices_.begin() + end.firstChoice;
        derivation.choices.insert(derivation.choices.end(), choices + at.nextChoice, choices + to);
        at.nextChoice = to;
        if (isLast) {
            derivation.end(at.part, end.low, end.high);
            filled_.pop_back();
            continue;
        }
        const Part& inner = parts_[end.firstPart + at.nextPart++];
        const auto next = static_cast<std::uint32_t>(derivation.parts.size());
        derivation.parts.push_back({at.part, inner.position, 0, 0, 0, 0, inner.node, false});
        filled_.push_back({inner.end, next, 0, 0});
    }
}

bool KnownReadings::visit(std::uint32_t inside, std::uint16_t node, std::uint32_t low, std::uint32_t high) {
    if (!insert({inside, low, high, node})) return false;
    if (++visitCount_ * 2 <= visits_.size()) return true;
    std::vector<Visit> old(visits_.size() * 2);
    old.swap(visits_);
    for (const Visit& each : old)
        if (each.inside != kNone) insert(each);
    return true;
}

bool KnownReadings::insert(const Visit& visit) {
    // Multiplicative hashing (Knuth, The Art of Computer Programming 3, 6.4).
    std::uint64_t hash = (std::uint64_t{visit.inside} << 32 | visit.low) * 0x9E3779B97F4A7C15u;
    hash = (hash ^ (std::uint64_t{visit.high - visit.low} << 16 | visit.node)) * 0x9E3779B97F4A7C15u;
    const std::size_t mask = visits_.size() - 1;
    for (std::size_t at = (hash >> 32) & mask;; at = (at + 1) & mask) {
        if (visits_[at] == visit) return false;
        if (visits_[at].inside != kNone) continue;
        visits_[at] = visit;
        return true;
    }
}

std::size_t KnownReadings::bytes() const {
    return called_.size() * sizeof(Called) + ends_.size() * sizeof(End) +
           choices_.size() * sizeof(std::uint16_t) + parts_.size() * sizeof(Part) +
           notes_.size() * sizeof(PartNote) + visits_.size() * sizeof(Visit);
}

std::size_t KnownReadings::capacity() const {
    return (calledAt_.capacity() + open_.capacity()) * sizeof(std::uint32_t) +
           called_.capacity() * sizeof(Called) + ends_.capacity() * sizeof(End) +
           choices_.capacity() * sizeof(std::uint16_t) + parts_.capacity() * sizeof(Part) +
           notes_.capacity() * sizeof(PartNote) + filled_.capacity() * sizeof(Filled) +
           visits_.capacity() * sizeof(Visit);
}

}  // namespace zr::engine
