#pragma once

#include <cstdint>
#include <memory>
#include <vector>

#include "grammar/engine/derivation.h"
#include "grammar/engine/full_search.h"
#include "grammar/engine/options.h"
#include "grammar/engine/quick_search.h"
#include "grammar/engine/tables.h"
#include "grammar/engine/text_index.h"

/// The recogniser: finds, for a rule and a list of tokens, the derivation that the grammar's meaning fixes:
/// of all that reach furthest the first in written order (docs/recogniser.md tells the idea and its proof).
///
/// Most text is read by the quick search, which tries one reading behind the other; what that doesn't read is
/// left to the full search, which looks at all readings at once. Neither needs machine stack for nesting.
namespace zr::engine {

class Recogniser {
 public:
    struct Result {
        bool found = false;
        bool overLimit = false;   ///< nesting deeper than the options allow: no derivation is given
        bool overBudget = false;  ///< only a first part of the text could be searched
        std::uint32_t high = 0;   ///< where the derivation ends
    };

    /// `types` holds the token numbers of the on-channel tokens without end of file. It, the table and the
    /// options must outlive this object.
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

    /// What was found last.
    const Derivation& derivation() const { return work_->derivation; }

    /// Gives back what only a search needs. Nothing can be run from here on; the derivation stays.
    void finish() { text_.release(); }

    /// Work done so far, in search steps; a benchmark figure.
    std::uint64_t steps() const { return steps_; }
    /// The most that one of the searches had to remember, as Options::maxMemo counts it.
    std::size_t remembered() const { return remembered_; }

 private:
    /// What grows with the text. A thread keeps that of its last one for its next: taking and giving back
    /// fresh memory for each text costs more than the search of a short one.
    struct Work {
        Derivation derivation;
        QuickSearch::Work quick;
        std::unique_ptr<FullSearch> full;  ///< null until a text needs it
        std::size_t bytes() const;
    };
    FullSearch& fullWork();
    static std::unique_ptr<Work>& spare();

    static Result resultOf(SearchOutcome outcome, std::uint32_t end);
    struct QuickRun {
        SearchOutcome outcome;
        std::uint32_t end;
    };
    QuickRun quickSearch(std::uint16_t rule, std::uint32_t position);
    Result fullSearch(std::uint16_t rule, std::uint32_t position, const Reach::Recovery& recovery);

    const ParserTable* table_;
    const Options* options_;
    TextIndex text_;
    std::unique_ptr<Work> work_;
    std::uint64_t steps_ = 0;
    std::size_t remembered_ = 0;
};

}  // namespace zr::engine
