#pragma once

#include <cstdint>
#include <memory>
#include <vector>

#include "grammar/engine/derivation.h"
#include "grammar/engine/known_readings.h"
#include "grammar/engine/options.h"
#include "grammar/engine/tables.h"
#include "grammar/engine/text_index.h"

/// The search for plain text: it follows the first reading in written order and turns back to the last choice
/// where that fails. At first it remembers nothing of what failed, so it costs little a token as long as it
/// seldom turns back. Where it goes astray it goes on in the same way, but remembers what each rule that it
/// calls can come to. Where that takes many steps as well, it gives up; the full search gives the same
/// derivation then.
namespace zr::engine {

class QuickSearch {
 public:
    /// Where the search stands.
    struct Place {
        std::uint32_t low, high;
        std::uint32_t part, depth;
        std::uint16_t node;
    };
    /// A choice that has branches left, and how much had been written down there; or a call that has known
    /// ends left, and the next of them.
    struct Point {
        Place place;
        std::uint32_t mask, choices, parts;
    };

    /// What it needs memory for that grows with the text.
    struct Work {
        std::vector<Point> points;
        std::unique_ptr<KnownReadings> known;  ///< null until a text needs it
        std::vector<std::uint32_t> callsAt;    ///< by point: calls known when it was come to
        std::size_t capacity() const;
    };

    /// NotFound where the rule can't be read from there; OverBudget says nothing about the text.
    using Outcome = SearchOutcome;

    /// The table, the index, the derivation that is to be filled and the memory must outlive this object.
    QuickSearch(const ParserTable& table, TextIndex& text, const Options& options, Derivation& derivation,
                Work& work)
        : table_(table), text_(text), options_(options), made_(derivation), work_(work) {}

    /// Looks for the reading of the text by `rule` from `position` that gets furthest, and writes its
    /// derivation down.
    Outcome run(std::uint16_t rule, std::uint32_t position);
    /// Where what was found ends.
    std::uint32_t end() const { return goal_; }

    std::uint64_t steps() const { return steps_ + (known_ != nullptr ? known_->steps() : 0); }
    /// What the search has to remember, as Options::maxMemo counts it.
    std::size_t remembered() const {
        return made_.parts.size() + made_.choices.size() / 16 + work_.points.size() +
               (known_ != nullptr ? known_->bytes() / kMemoBytes : 0);
    }

 private:
    /// What Options::maxMemo reckons with for each thing that a search remembers.
    static constexpr std::size_t kMemoBytes = 32;

    Outcome runRemembering();
    Outcome readAgain();
    Outcome writeEnd();
    void start();
    bool isWhole();
    template <bool kRemembers>
    bool follow();
    bool turnBack();
    bool turnBackRemembering();
    void takeAgain(Point& point);
    void goBackTo(const Point& point);
    template <bool kRemembers>
    void addPoint(const Place& place, std::uint32_t left);
    std::uint16_t take(const NodeRow& choice, std::uint32_t branch);
    template <bool kRemembers>
    bool call(Place& place);
    template <bool kRemembers>
    bool comeBack(Place& place);
    bool visit(const Place& place);
    bool useKnown(Place& place, std::uint32_t call);
    bool comeBackWith(Place& place, std::uint32_t end);

    const ParserTable& table_;
    TextIndex& text_;
    const Options& options_;
    Derivation& made_;
    Work& work_;
    Place place_{};
    std::uint16_t rule_ = 0;
    std::uint32_t from_ = 0, goal_ = 0;  ///< where a reading starts and must end
    /// The furthest end ahead of the goal, and whether there was one.
    std::uint32_t end_ = 0;
    bool hasEnd_ = false;
    KnownReadings* known_ = nullptr;  ///< while it remembers
    std::uint32_t deepest_ = 0;       ///< call that it remembers
    std::uint64_t steps_ = 0;
    bool tooDeep_ = false;
    bool gaveUp_ = false;  ///< what it remembers may be too deep where it is to be used
};

}  // namespace zr::engine
