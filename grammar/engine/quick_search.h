#pragma once

#include <cstdint>
#include <vector>

#include "grammar/engine/derivation.h"
#include "grammar/engine/options.h"
#include "grammar/engine/tables.h"
#include "grammar/engine/text_index.h"

/// The search for plain text: it follows the first reading in written order and turns back to the last choice
/// where that fails. It remembers nothing of what failed, so it costs little a token as long as it seldom
/// turns back, and gives up where it does so often; the full search gives the same derivation then.
namespace zr::engine {

class QuickSearch {
 public:
    /// Where the search stands.
    struct Place {
        std::uint32_t low, high;
        std::uint32_t part, depth;
        std::uint16_t node;
    };
    /// A choice that has branches left, and how much had been written down there.
    struct Point {
        Place place;
        std::uint32_t mask, choices, parts;
    };

    enum class Outcome { Found, GaveUp, TooDeep };

    /// The table, the index, the derivation that is to be filled and the memory for the points must outlive
    /// this object.
    QuickSearch(const ParserTable& table, TextIndex& text, const Options& options, Derivation& derivation,
                std::vector<Point>& points)
        : table_(table), text_(text), options_(options), made_(derivation), points_(points) {}

    /// Looks for a reading of the text by `rule` from `position` to its end. That it gave up says nothing
    /// about the text.
    Outcome run(std::uint16_t rule, std::uint32_t position);

    /// Where a search that gave up can be taken up by another one: a choice from which on no reading was
    /// found yet, while all that stand ahead of it in written order have failed. The derivation is cut there.
    /// Null where so little was read ahead of it that it isn't worth that.
    const Place* resting() const { return rests_ ? &place_ : nullptr; }

    std::uint64_t steps() const { return steps_; }
    /// What the search has to remember, as Options::maxMemo counts it.
    std::size_t remembered() const { return made_.parts.size() + made_.choices.size() / 16 + points_.size(); }

 private:
    Outcome giveUp();
    bool follow();
    bool turnBack();
    std::uint16_t take(const NodeRow& choice, std::uint32_t branch);
    bool call(Place& place);
    bool comeBack(Place& place);

    const ParserTable& table_;
    TextIndex& text_;
    const Options& options_;
    Derivation& made_;
    std::vector<Point>& points_;
    Place place_{};
    bool rests_ = false;
    std::uint64_t steps_ = 0;
    bool tooDeep_ = false;
};

}  // namespace zr::engine
