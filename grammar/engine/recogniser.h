#pragma once

#include <array>
#include <cstdint>
#include <vector>

#include "grammar/engine/derivation.h"
#include "grammar/engine/options.h"
#include "grammar/engine/quick_search.h"
#include "grammar/engine/tables.h"
#include "grammar/engine/text_index.h"

/// The recogniser: finds, for a rule and a list of tokens, the derivation that the grammar's meaning fixes:
/// of all that reach furthest the first in written order (docs/recogniser.md tells the idea and its proof).
///
/// Every (rule, position) that the search comes to has one entry. An entry is a resumable search: it hands
/// out the ends its rule can reach from there, each once, in the order of the derivations, and only as many
/// as somebody asks for. Entries ask entries; the chain of those at work is a vector on the heap, so nesting
/// costs memory and never machine stack.
namespace zr::engine {

class Recogniser {
 public:
    using End = PathEnd;
    using State = PathState;

    struct Result {
        bool found = false;
        bool overLimit = false;   ///< nesting deeper than the options allow: no derivation is given
        bool overBudget = false;  ///< the search was cut: the furthest derivation found so far stands
        std::uint32_t entry = kNone;
        std::uint32_t endState = kNone;
        std::uint32_t low = 0, high = 0;
    };

    static constexpr std::uint32_t kNone = 0xFFFFFFFF;

    /// `types` holds the token numbers of the on-channel tokens without end of file; it must outlive this
    /// object.
    Recogniser(const ParserTable& table, const std::vector<std::uint16_t>& types, const Options& options);
    ~Recogniser();
    Recogniser(Recogniser&&) = default;
    Recogniser& operator=(Recogniser&&) = default;
    Recogniser(const Recogniser&) = delete;
    Recogniser& operator=(const Recogniser&) = delete;

    /// Runs `rule` from `position`.
    Result run(std::uint16_t rule, std::uint32_t position);

    /// The same for a statement that run() of another object couldn't read: its recover rule, at the last
    /// place where the statement itself asks for it, may stand for anything up to a token that can follow it.
    Result recover(std::uint16_t rule, std::uint32_t position);

    // What the tree builder reads.
    const State& state(std::uint32_t index) const {
        return hasDerivation_ ? derivation_.states[index] : states_[index];
    }
    std::uint16_t ruleOf(std::uint32_t entry) const {
        return hasDerivation_ ? derivation_.parts[entry].rule : entries_[entry].rule;
    }
    std::uint32_t startOf(std::uint32_t entry) const {
        return hasDerivation_ ? derivation_.parts[entry].position : entries_[entry].position;
    }
    const End& end(std::uint32_t index) const {
        return hasDerivation_ ? derivation_.ends[index] : ends_[index];
    }
    /// Whether the entry stands for tokens that were skipped where its rule didn't parse.
    bool isRecovered(std::uint32_t entry) const {
        return hasDerivation_ ? derivation_.parts[entry].recovered : entries_[entry].recovered;
    }

    /// Work done so far, in search steps; a benchmark figure.
    std::uint64_t steps() const { return steps_; }
    std::size_t entryCount() const { return entries_.size(); }
    /// What the search at work has to remember, as Options::maxMemo counts it.
    std::size_t remembered() const {
        return entries_.size() + ends_.size() + states_.size() + frames_.size() + visits_.size() +
               derivation_.parts.size() + derivation_.ends.size() + derivation_.states.size() +
               quick_.calls.size() + quick_.points.size();
    }

 private:
    struct Entry {
        std::uint32_t position;
        std::uint32_t nextHere;  ///< next entry at the same position
        std::uint32_t firstEnd = kNone, lastEnd = kNone;
        std::uint32_t frames = kNone;   ///< top of the entry's backtrack stack
        std::uint32_t visited = kNone;  ///< merge states entered, newest first
        std::uint32_t visitedCount = 0;
        std::uint16_t rule;
        std::uint16_t context;
        std::uint8_t endCount = 0;
        bool started = false, done = false, mayRecover = false, recovered = false;
    };

    struct Frame {
        std::uint32_t below;
        std::uint32_t low, high;
        std::uint32_t state;
        std::uint32_t child;    ///< call: the entry asked; kNone for a choice
        std::uint32_t lastEnd;  ///< call: the end taken last, kNone before the first
        std::uint32_t mask;     ///< choice: targets still to try
        std::uint16_t node;
        std::uint8_t stopped;
    };

    struct Visit {
        std::uint32_t next;  ///< older visit of the entry, or the entry itself once it is in the shared table
        std::uint32_t low, high;
        std::uint16_t node;
        std::uint8_t stopped;
    };

    using ClassSet = std::array<std::uint64_t, 4>;

    /// What a caller's surroundings can do behind it: entries of one rule at one place differ by it.
    struct Context {
        std::array<ClassSet, 8> other{};  ///< by tail loop: what something else than the loop can take
        ClassSet any{};                   ///< what anything of it can take
        bool closing = false;             ///< a closer that must stand may come next
        bool mayEnd = false;              ///< all of it can end without a token more
        bool operator==(const Context&) const = default;
    };

    enum class Outcome { Yielded, Exhausted, NeedsChild };

    /// The larger vectors of a thread's last search, kept for its next one: taking and giving back fresh
    /// memory for each text costs more than the search of a short one.
    struct Spare;
    static Spare& spare();
    void exchange(Spare& with);
    std::uint32_t entryFor(std::uint16_t rule, std::uint32_t position, std::uint16_t context);
    void prepareContexts();
    std::uint16_t contextOf(std::uint16_t call, std::uint16_t outer);
    bool isOpenEnd(const Entry& entry, std::uint32_t low, std::uint32_t high, std::uint8_t stopped);
    bool isCovered(const Entry& entry, std::uint32_t low, std::uint32_t high, std::uint8_t stopped);
    Result lazySearch(std::uint16_t rule, std::uint32_t position);
    Result fullSearch(std::uint16_t rule, std::uint32_t position, std::uint32_t bound);
    Result narrowSearch(std::uint16_t rule, std::uint32_t position);
    Result search(std::uint16_t rule, std::uint32_t position);
    void pushFrame(Entry& entry, Frame frame);
    void popFrame(Entry& entry);
    bool enterInTable(std::uint32_t entry, std::uint16_t node, std::uint32_t low, std::uint32_t high,
                      std::uint8_t stopped);
    void growVisitTable();
    Outcome resume(std::uint32_t entry, std::uint32_t& child);
    bool forward(std::uint32_t entry, std::uint16_t node, std::uint32_t low, std::uint32_t high,
                 std::uint32_t state, std::uint8_t stopped);
    bool enterOnce(std::uint32_t entry, std::uint16_t node, std::uint32_t low, std::uint32_t high,
                   std::uint8_t stopped);
    bool addEnd(std::uint32_t entry, std::uint32_t low, std::uint32_t high, std::uint32_t state,
                std::uint8_t stopped);
    bool recover(std::uint32_t entry);
    bool recoversIn(std::uint32_t entry) const {
        return recovering_ && entries_[entry].position == recoverStart_;
    }
    void reset();
    std::uint32_t addState(std::uint16_t node, std::uint32_t low, std::uint32_t high, std::uint32_t before,
                           std::uint32_t child, std::uint32_t childEnd);

    const ParserTable* table_;
    const Options* options_;
    TextIndex text_;
    std::vector<std::uint32_t> entriesAt_;
    std::vector<Entry> entries_;
    std::vector<End> ends_;
    std::vector<State> states_;
    std::vector<Frame> frames_;
    std::uint32_t freeFrame_ = kNone;
    std::vector<Visit> visits_;
    std::vector<std::uint32_t> visitTable_;  ///< open addressing over visits of entries that have many
    std::uint32_t visitTableUsed_ = 0;
    std::vector<std::uint32_t> chain_;
    std::uint64_t steps_ = 0;
    std::uint32_t furthest_ = 0;  ///< the furthest place where the search met a reading that could end
    std::uint8_t endsEach_ = 0;   ///< ends that an entry may have, 0 for any number
    const ParserTable* contextsOf_ = nullptr;  ///< the grammar that the contexts are of
    std::vector<Context> contexts_;
    std::vector<std::uint16_t> contextCache_;  ///< by context and call context
    Derivation derivation_;                    ///< of the searches that write one down
    QuickSearch::Work quick_;
    bool hasDerivation_ = false;
    bool recovering_ = false;
    std::uint32_t recoverStart_ = 0;        ///< where the statement starts
    std::uint32_t recoverPlace_ = kNone;    ///< the one place where the recover rule may stand for anything
    std::uint32_t recoverAskedAt_ = kNone;  ///< last place where the statement asked for it
};

}  // namespace zr::engine
