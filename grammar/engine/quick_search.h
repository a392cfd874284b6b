#pragma once

#include <cstdint>
#include <vector>

#include "grammar/engine/derivation.h"
#include "grammar/engine/options.h"
#include "grammar/engine/tables.h"
#include "grammar/engine/text_index.h"

/// The search for plain text: it follows the first reading in written order and turns back to the last choice
/// where that fails. It remembers nothing of what failed, so it costs little a token as long as it seldom
/// turns back, and gives up where it does so often; the other searches give the same derivation then.
namespace zr::engine {

class QuickSearch {
 public:
    static constexpr std::uint32_t kNone = 0xFFFFFFFF;

    /// A rule at work: where its caller goes on.
    struct Call {
        std::uint32_t outer;  ///< the caller's own, kNone for the whole
        std::uint32_t state;
        std::uint32_t part;
        std::uint32_t position;
        std::uint32_t depth;
        std::uint16_t node;
        std::uint8_t stopped;
    };

    /// A choice that has branches left, and how much had been written down there.
    struct Point {
        std::uint32_t low, high, state, mask, call;
        std::uint32_t states, ends, parts, calls;
        std::uint16_t node;
        std::uint8_t stopped;
    };

    /// What grows with the text, for its owner to keep.
    struct Work {
        std::vector<Call> calls;
        std::vector<Point> points;
    };

    /// The table, the index, the derivation that is to be filled and the memory must outlive this object.
    QuickSearch(const ParserTable& table, TextIndex& text, const Options& options, Derivation& derivation,
                Work& work)
        : table_(table), text_(text), options_(options), made_(derivation), work_(work) {}

    enum class Outcome { Found, GaveUp, TooDeep };

    /// Looks for a reading of the text by `rule` from `position` to its end. That it gave up says nothing
    /// about the text.
    Outcome run(std::uint16_t rule, std::uint32_t position);

    /// Where the derivation ends: always the end of the text, which closers may have been taken up to.
    std::uint32_t low() const { return low_; }
    std::uint64_t steps() const { return steps_; }
    /// What the search has to remember, as Options::maxMemo counts it.
    std::size_t remembered() const {
        return made_.parts.size() + made_.ends.size() + made_.states.size() + work_.calls.size() +
               work_.points.size();
    }

 private:
    bool follow();
    bool turnBack();
    void take(std::uint32_t branch);
    bool call(const NodeRow& node);
    bool comeBack();
    std::uint32_t addState(std::uint16_t node, std::uint32_t before, std::uint32_t child, std::uint32_t end);

    const ParserTable& table_;
    TextIndex& text_;
    const Options& options_;
    Derivation& made_;
    Work& work_;
    // where the search stands
    std::uint16_t at_ = 0;
    std::uint8_t stopped_ = 0;
    std::uint32_t low_ = 0, high_ = 0;
    std::uint32_t state_ = kNone, call_ = kNone;
    std::uint64_t steps_ = 0;
    bool tooDeep_ = false;
};

}  // namespace zr::engine
