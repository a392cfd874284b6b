#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "grammar/engine/derivation.h"
#include "grammar/engine/follow.h"
#include "grammar/engine/known_readings.h"
#include "grammar/engine/options.h"
#include "grammar/engine/tables.h"
#include "grammar/engine/text_index.h"

/// The search that takes over where the quick one has gone astray. It tries one reading behind the other in
/// the same order, but remembers what each rule that it calls can come to, so that it finds out only once.
namespace zr::engine {

class RememberingSearch {
 public:
    struct Place {
        std::uint32_t low, high;
        std::uint32_t atWork;  ///< the rule at work: a call that is known, or an older part
        std::uint32_t last;    ///< step of the way inside it
        std::uint32_t depth;
        std::uint16_t node;
    };
    /// A choice that has branches left; or a call that has known ends left, and the next of them.
    struct Point {
        Place place;
        std::uint32_t left;
        std::uint32_t calls;  ///< known by then
    };
    /// What it needs memory for that grows with the text.
    struct Work {
        std::vector<Point> points;
        KnownReadings known;
        std::size_t capacity() const { return points.capacity() * sizeof(Point) + known.capacity(); }
    };

    /// The table, the index, the derivation that is to be filled and the memory must outlive this object.
    RememberingSearch(const ParserTable& table, TextIndex& text, const Options& options,
                      Derivation& derivation, Work& work)
        : table_(table),
          text_(text),
          options_(options),
          made_(derivation),
          known_(work.known),
          points_(work.points) {}

    /// Goes on with a search that has come to `place` and has these choices left, which are used up. `end`
    /// tells where it should end, and then where what was found ends.
    SearchOutcome run(const OpenChoice::Place& place, std::vector<OpenChoice>& older, ReadingEnd& end);

    std::uint64_t steps() const { return steps_ + known_.steps(); }
    /// What it had to remember, as Options::maxMemo counts it.
    std::size_t remembered() const { return remembered_; }

 private:
    /// What Options::maxMemo reckons with for each thing that a search remembers.
    static constexpr std::size_t kMemoBytes = 32;
    /// At work is a part of the derivation from before anything was remembered.
    static constexpr std::uint32_t kOlder = 0x80000000;

    template <class Search, class Place>
    friend bool follow(Search& search, Place& place);

    void goOnAt(const OpenChoice::Place& place);
    SearchOutcome find(std::vector<OpenChoice>& older, ReadingEnd& end);
    std::size_t remembers(const std::vector<OpenChoice>& older) const;
    bool readAgain(ReadingEnd& end);
    bool turnBack(std::vector<OpenChoice>& older);
    bool takeNextEnd();
    void takeBranch(Place& place, const NodeRow& choice, std::uint32_t branch);

    bool choose(Place& place, const NodeRow& node, std::uint32_t branches);
    bool call(Place& place, const NodeRow& node);
    bool isOver(const Place& place) const { return place.atWork == kOlder; }
    bool comeBack(Place& place);
    bool useKnown(Place& place, std::uint32_t call);
    bool comeBackWith(Place& place, std::uint32_t end);

    const ParserTable& table_;
    TextIndex& text_;
    const Options& options_;
    Derivation& made_;
    KnownReadings& known_;
    std::vector<Point>& points_;
    Place place_{};
    std::uint32_t olderPart_ = 0;  ///< of the derivation as it is: the innermost that isn't over
    std::uint32_t deepest_ = 0;    ///< call that it remembers
    std::uint64_t steps_ = 0;
    std::size_t remembered_ = 0;
    bool tooDeep_ = false;
    bool gaveUp_ = false;  ///< what it remembers may be too deep where it is to be used
};

}  // namespace zr::engine
