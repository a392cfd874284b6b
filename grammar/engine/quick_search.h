#pragma once

#include <cstdint>
#include <memory>
#include <vector>

#include "grammar/engine/derivation.h"
#include "grammar/engine/follow.h"
#include "grammar/engine/options.h"
#include "grammar/engine/remembering_search.h"
#include "grammar/engine/tables.h"
#include "grammar/engine/text_index.h"

/// The search for plain text: it follows the first reading in written order and turns back to the last choice
/// where that fails. It remembers nothing of what failed, so it costs little a token as long as it seldom
/// turns back. Where it goes astray a search that remembers goes on from there, in the same order. Where that
/// takes many steps as well, it gives up; the full search gives the same derivation then.
namespace zr::engine {

class QuickSearch {
 public:
    /// What it needs memory for that grows with the text.
    struct Work {
        std::vector<OpenChoice> points;
        std::unique_ptr<RememberingSearch::Work> remembering;  ///< null until a text needs it
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
    std::uint32_t end() const { return end_.goal; }

    std::uint64_t steps() const { return steps_; }
    /// What the search has to remember, as Options::maxMemo counts it.
    std::size_t remembered() const {
        const std::size_t now = made_.parts.size() + made_.choices.size() / 16 + work_.points.size();
        return now > rememberedFurther_ ? now : rememberedFurther_;
    }

 private:
    using Place = OpenChoice::Place;
    template <class Search, class Place>
    friend bool follow(Search& search, Place& place);

    void start(std::uint16_t rule, std::uint32_t position);
    bool findsEnd();
    bool outline();
    bool turnBack();
    Outcome remember();
    Outcome writeEnd();

    bool choose(Place& place, const NodeRow& node, std::uint32_t branches);
    bool call(Place& place, const NodeRow& node);
    bool isOver(const Place& place) const { return place.part == 0; }
    bool comeBack(Place& place);
    std::uint16_t take(const NodeRow& choice, std::uint32_t branch);

    const ParserTable& table_;
    TextIndex& text_;
    const Options& options_;
    Derivation& made_;
    Work& work_;
    Place place_{};
    ReadingEnd end_;
    std::uint64_t steps_ = 0;
    std::size_t rememberedFurther_ = 0;
    bool tooDeep_ = false;
    bool isOutlined_ = false;  ///< the goal is where the statement can end at most
};

}  // namespace zr::engine
