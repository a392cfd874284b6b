#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "grammar/engine/derivation.h"
#include "grammar/engine/grow.h"

/// What a search remembers of a text: which rule can end where from which token on, the first way to each
/// end, and where the search has been. What a rule can come to from a token doesn't depend on who calls it,
/// so it is found out once; this is memoised top-down recognition (Norvig, Techniques for Automatic
/// Memoization with Applications to Context-Free Parsing, 1991) that keeps all ends of a rule, in the order
/// in which they are found.
namespace zr::engine {

class KnownReadings {
 public:
    static constexpr std::uint32_t kNone = 0xFFFFFFFF;

    /// Who called a rule: the rule at work there, what it had come by, and its Call.
    struct Caller {
        std::uint32_t atWork, last;
        std::uint16_t node;
    };
    /// A rule that was called somewhere, and what is known of it.
    struct Called {
        Caller caller;
        std::uint32_t position;
        std::uint32_t firstEnd, lastEnd;
        std::uint32_t before;  ///< the one called ahead of it at the same position
        std::uint32_t depth;
        std::uint32_t endsSeen;  ///< bit i: an end at a position that is i modulo 32
        std::uint16_t rule;
        bool isComplete;  ///< has no other ends
    };
    /// An end of a rule, and the first way that comes to it, so that what is inside is shared by all that
    /// call it there.
    struct End {
        std::uint32_t position;  ///< where the rule starts
        std::uint32_t low, high;
        std::uint32_t next;  ///< of the same rule, kNone behind the last one
        std::uint32_t last;  ///< step of the way
    };

    /// Forgets what it knew of another text.
    void start(std::size_t positions);

    /// A call of a rule whose ends are all known; kNone where there is none.
    std::uint32_t find(std::uint16_t rule, std::uint32_t position) const {
        std::uint32_t at = calledAt_[position];
        while (at != kNone && (called_[at].rule != rule || !called_[at].isComplete)) at = called_[at].before;
        return at;
    }
    const Called& called(std::uint32_t number) const { return called_[number]; }
    const End& end(std::uint32_t number) const { return ends_[number]; }
    std::uint32_t calledCount() const { return static_cast<std::uint32_t>(called_.size()); }

    /// Notes a call of a rule of which nothing is known; returns its number.
    std::uint32_t add(std::uint16_t rule, std::uint32_t position, const Caller& caller, std::uint32_t depth);
    /// All ways from the calls with this number and higher ones on have been tried.
    void complete(std::uint32_t from) {
        for (; !open_.empty() && open_.back() >= from; open_.pop_back())
            called_[open_.back()].isComplete = true;
    }
    /// Notes that a call has come to an end by a way; returns its number, kNone where it had come there
    /// before.
    std::uint32_t addEnd(std::uint32_t call, std::uint32_t low, std::uint32_t high, std::uint32_t last);

    // A way is a chain from its last step to its first one. Each of these adds a step behind one, kNone for
    // none, and returns it; what others have added behind the same one stays.
    std::uint32_t addChoice(std::uint32_t before, std::uint16_t branch) {
        goOnBehind(before);
        return addWord(kChoice, branch);
    }
    std::uint32_t addCall(std::uint32_t before, std::uint32_t end, std::uint16_t node) {
        goOnBehind(before);
        steps_[stepCount_++] = end;
        return addWord(kCall, node);
    }
    /// The end of a part of which only the derivation knows where it started.
    std::uint32_t addEndOfOlder(std::uint32_t before, std::uint32_t low, std::uint32_t high) {
        goOnBehind(before);
        growSlowly(olderEnds_);
        olderEnds_.push_back({low, high});
        return addWord(kEndOfOlder, static_cast<std::uint32_t>(olderEnds_.size() - 1));
    }

    /// What was tried may be tried again: another reading is looked for.
    void startAgain();
    /// Writes a way down behind what a derivation holds, whose innermost part at work is `part`. Nothing can
    /// be looked up from here on.
    void write(std::uint32_t last, std::uint32_t part, Derivation& derivation);

    /// Notes that a search stands at a node inside a rule at work; false where it has been there before.
    bool visit(std::uint32_t inside, std::uint16_t node, std::uint32_t low, std::uint32_t high) {
        if (!insert({std::uint64_t{inside} << 32 | low, std::uint64_t{high - low} << 16 | node}))
            return false;
        if (++visitCount_ * 4 > visits_.size() * 3) growVisits();
        return true;
    }

    /// Whether calls have so many ends that to look at all readings at once costs less.
    bool isManifold() const { return ends_.size() > kManyEnds * (called_.size() + kManyEnds); }
    /// What comparing took so far, as search steps.
    std::uint64_t steps() const { return compared_ / kComparedAStep; }
    /// The bytes that it needs, and those that it keeps.
    std::size_t bytes() const;
    std::size_t capacity() const;

 private:
    /// A step is one word: the highest bits tell what it is, the others are a branch, the node of a Call with
    /// its end in the word ahead of it, or an older end. The step ahead of one stands ahead of it, or a word
    /// there tells where.
    enum Word : std::uint32_t {
        kChoice = 0,
        kCall = 0x40000000,
        kEndOfOlder = 0x80000000,
        kElsewhere = 0xC0000000,
        kWord = 0xC0000000,
    };
    static constexpr std::uint32_t kStepWords = 3;  ///< at most
    static constexpr std::uint32_t kNowhere = kNone & ~kWord;
    /// What is still to be written: a step, or with this bit the end of the part at work.
    static constexpr std::uint32_t kPartEnds = 0x80000000;

    struct OlderEnd {
        std::uint32_t low, high;
    };
    struct Visit {
        std::uint64_t where = ~std::uint64_t{0}, what = 0;
        bool operator==(const Visit&) const = default;
    };
    /// Comparing so many ends takes as long as a step.
    static constexpr std::uint64_t kComparedAStep = 16;

    static constexpr std::size_t kManyEnds = 12;

    std::uint32_t addWord(Word word, std::uint32_t value) {
        steps_[stepCount_] = word | value;
        return stepCount_++;
    }
    /// And there is room for a step.
    void goOnBehind(std::uint32_t step) {
        if (stepCount_ + kStepWords > steps_.size()) growSteps();
        if (step + 1 != stepCount_) addWord(kElsewhere, step & ~kWord);
    }
    std::uint32_t stepBefore(std::uint32_t step) const {
        step -= (steps_[step] & kWord) == kCall ? 2 : 1;
        if ((steps_[step] & kWord) != kElsewhere) return step;
        const std::uint32_t elsewhere = steps_[step] & ~kWord;
        return elsewhere == kNowhere ? kNone : elsewhere;
    }
    void forgetVisits();
    bool insert(const Visit& visit);
    void growVisits();
    void growSteps();
    void addToWrite(std::uint32_t last);

    std::vector<std::uint32_t> calledAt_;  ///< by position: the call noted last
    std::vector<Called> called_;
    std::vector<std::uint32_t> open_;  ///< calls that aren't complete, in ascending order
    std::vector<End> ends_;
    std::vector<OlderEnd> olderEnds_;
    std::vector<std::uint32_t> steps_;  ///< words, more than there are
    std::uint32_t stepCount_ = 0;       ///< words, the first of which is none
    std::vector<std::uint32_t> toWrite_;
    std::vector<Visit> visits_;  ///< hashed, open addressing; a power of two
    std::size_t visitCount_ = 0;
    std::uint64_t compared_ = 0;
};

}  // namespace zr::engine
