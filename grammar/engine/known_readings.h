#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "grammar/engine/derivation.h"

/// What the quick search remembers of a text once it has gone astray: which rule can end where from which
/// token on, and where it has been. What a rule can come to from a token doesn't depend on who calls it, so
/// it is found out once; this is memoised top-down recognition (Norvig, Techniques for Automatic Memoization
/// with Applications to Context-Free Parsing, 1991) that keeps all ends of a rule, in the order in which they
/// are found.
namespace zr::engine {

class KnownReadings {
 public:
    static constexpr std::uint32_t kNone = 0xFFFFFFFF;

    /// An end of a rule, and the first derivation that comes to it: its own choices, and the ends of the
    /// rules that it calls, so that what is inside is shared by all that call it.
    struct End {
        std::uint32_t low, high;
        std::uint32_t next;  ///< of the same rule, kNone behind the last one
        std::uint32_t firstChoice, choices, firstPart, parts;
    };
    /// A rule that was called somewhere, and what is known of it.
    struct Called {
        std::uint32_t firstEnd, lastEnd;
        std::uint32_t before;  ///< the one called ahead of it at the same position
        std::uint32_t depth;
        std::uint16_t rule;
        bool isComplete;  ///< has no other ends
    };
    /// What is known of a part of the derivation that a search is writing down.
    struct PartNote {
        std::uint32_t call = kNone;  ///< kNone: the part is older than what is known
        std::uint32_t end = kNone;   ///< that it came to last
        std::uint32_t choices = 0;   ///< of the derivation, ahead of it
        bool isKnown = false;        ///< an end that was known before: what is in it isn't written down
    };

    /// Forgets what it knew of another text. Of the parts that are there nothing is known.
    void start(std::size_t positions, std::size_t parts);

    /// A call of a rule whose ends are all known; kNone where there is none.
    std::uint32_t find(std::uint16_t rule, std::uint32_t position) const {
        std::uint32_t at = calledAt_[position];
        while (at != kNone && (called_[at].rule != rule || !called_[at].isComplete)) at = called_[at].before;
        return at;
    }
    const Called& called(std::uint32_t number) const { return called_[number]; }
    const End& end(std::uint32_t number) const { return ends_[number]; }
    std::uint32_t calledCount() const { return static_cast<std::uint32_t>(called_.size()); }

    /// Notes that a derivation comes to a part that calls a rule of which nothing is known.
    void add(const Derivation& derivation, std::uint16_t rule, std::uint32_t depth);
    /// All ways from the calls with this number and higher ones on have been tried.
    void complete(std::uint32_t from) {
        for (; !open_.empty() && open_.back() >= from; open_.pop_back())
            called_[open_.back()].isComplete = true;
    }
    /// Notes that a part, the innermost that wasn't over, has come to an end; false where its call had come
    /// there before.
    bool addEnd(const Derivation& derivation, std::uint32_t part, std::uint32_t low, std::uint32_t high);
    /// Writes a part with a known end down, without what is in it.
    void use(std::uint32_t end, Derivation& derivation, std::uint32_t outer, std::uint16_t node,
             std::uint32_t position);
    /// The number of the call that a part is, kNone where nothing is known of it.
    std::uint32_t callOf(std::uint32_t part) const { return notes_[part].call; }

    /// Another derivation is written down from here on, and what was tried may be tried again.
    void startAgain();
    /// Writes down what is in the parts that were used. Nothing can be looked up from here on.
    void fillIn(Derivation& derivation);

    /// Notes that a search stands at a node with several ways on, inside a call; false where it has been
    /// there before.
    bool visit(std::uint32_t inside, std::uint16_t node, std::uint32_t low, std::uint32_t high);

    /// Whether calls have so many ends that to look at all readings at once costs less.
    bool isManifold() const { return ends_.size() > kManyEnds * (called_.size() + kManyEnds); }
    /// What copying and comparing took so far, as search steps.
    std::uint64_t steps() const { return work_ / kItemsAStep; }
    /// The bytes that it needs, and those that it keeps.
    std::size_t bytes() const;
    std::size_t capacity() const;

 private:
    struct Visit {
        std::uint32_t inside = kNone, low = 0, high = 0;
        std::uint32_t node = 0;
        bool operator==(const Visit&) const = default;
    };
    /// A part of a derivation that comes to a known end.
    struct Part {
        std::uint32_t end;
        std::uint32_t position;
        std::uint32_t choices;  ///< of those of the part around it, ahead of it
        std::uint16_t node;
    };
    /// One that is being filled in.
    struct Filled {
        std::uint32_t end, part, nextPart, nextChoice;
    };
    /// Copying so many items of a derivation, or comparing so many ends, takes as long as a step.
    static constexpr std::uint64_t kItemsAStep = 16;

    static constexpr std::size_t kManyEnds = 8;

    void forgetVisits();
    bool insert(const Visit& visit);
    void copyOwn(const Derivation& derivation, std::uint32_t part, std::uint32_t low, std::uint32_t high);
    void note(std::size_t part, const PartNote& note);
    void fillIn(std::uint32_t end, std::uint32_t part, Derivation& derivation);

    std::vector<std::uint32_t> calledAt_;  ///< by position: the call noted last
    std::vector<Called> called_;
    std::vector<std::uint32_t> open_;  ///< calls that aren't complete, in ascending order
    std::vector<End> ends_;
    std::vector<std::uint16_t> choices_;  ///< of all ends
    std::vector<Part> parts_;
    std::vector<PartNote> notes_;  ///< by part of the derivation
    std::vector<Filled> filled_;
    std::vector<Visit> visits_;  ///< hashed, open addressing; a power of two
    std::size_t visitCount_ = 0;
    std::uint64_t work_ = 0;
};

}  // namespace zr::engine
