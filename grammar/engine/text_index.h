#pragma once

#include <cstdint>
#include <vector>

#include "grammar/engine/tables.h"

/// What the searches ask about a text, answered in constant time: one pass over the tokens for each kind of
/// question, made when it is first asked.
namespace zr::engine {

class TextIndex {
 public:
    static constexpr std::uint32_t kNone = 0xFFFFFFFF;

    /// `types` holds the token numbers of the on-channel tokens without end of file; it must outlive this
    /// object.
    TextIndex(const ParserTable& table, const std::vector<std::uint16_t>& types);

    /// Takes the text to end at `count`, for all questions from here on.
    void cutAt(std::uint32_t count);

    /// Gives back what was made to answer; nothing can be asked from here on.
    void release();

    std::uint32_t count() const { return count_; }
    std::uint32_t fullCount() const { return static_cast<std::uint32_t>(types_->size()); }
    std::uint16_t type(std::uint32_t position) const { return (*types_)[position]; }
    /// The class of a token, at count() that of the end of the text.
    std::uint8_t classAt(std::uint32_t position) const { return classes_[position]; }
    bool isCloser(std::uint32_t position) const {
        return position < count_ && table_->closer != 0 && type(position) == table_->closer;
    }
    /// Where the run of closers that starts at a position ends.
    std::uint32_t runEnd(std::uint32_t position) const {
        return runEnd_.empty() ? position : runEnd_[position];
    }
    bool inSet(std::uint32_t set, std::uint32_t cls) const {
        return (table_->classSets[set * 4 + cls / 64] >> (cls % 64)) & 1;
    }

    /// Whether the text still holds what a Call and the part behind it can't do without. A cheap "no" here
    /// saves the search of an alternative that was never going to work, such as an alias behind every column.
    bool guarded(const NodeRow& call, std::uint32_t position) {
        if (call.required != 0 && lastOf_[call.required - 1] <= position) return false;
        if (call.guard == kNone16 || position >= count_) return true;
        return mayComeBehind(call.guard, position);
    }
    // A place in the text is an interval: inside a run of closers every position from `low` to `high` can be
    // it.

    /// A token that isn't the closer can only be taken where the run of closers is over, so an undecided
    /// place becomes that position, if it is among the possible ones.
    bool settle(std::uint32_t& low, std::uint32_t& high) const {
        if (low == high) return true;
        if (high != runEnd(low)) return false;
        low = high;
        return true;
    }
    /// Moves a place past what a node takes that is neither a Choice, a Call nor an End; says whether the
    /// node could take it.
    bool take(const NodeRow& node, std::uint32_t& low, std::uint32_t& high) const {
        switch (node.op) {
            case Op::Token:
            case Op::Set:
                if (!settle(low, high) || low >= count_) return false;
                if (node.op == Op::Token ? type(low) != node.arg : !inSet(node.arg, classes_[low]))
                    return false;
                high = ++low;
                return true;
            case Op::Hard: {
                const std::uint32_t run = runEnd(low);
                if (low == run) return false;
                ++low;
                high = high + 1 < run ? high + 1 : run;
                return true;
            }
            case Op::Soft: {
                const std::uint32_t run = runEnd(low);
                high = high + 1 < run ? high + 1 : run;
                return true;
            }
            case Op::SoftStar:
                high = runEnd(low);
                return true;
            default:
                return true;  // only shapes the tree
        }
    }
    /// The branches of a Choice that can go on at a position, as bits: those that some reading of the next
    /// tokens starts with.
    std::uint32_t viable(const NodeRow& choice, std::uint32_t position) const {
        std::uint32_t found = masks(choice)[classes_[position]];
        while (found & kMoreTokens) found = aheadRow(found)[classes_[++position]];
        return found;
    }
    /// The same by the next token alone.
    std::uint32_t startable(const NodeRow& choice, std::uint32_t position) const {
        return byOneToken(masks(choice)[classes_[position]]);
    }
    /// The same at a place.
    std::uint32_t viable(const NodeRow& choice, std::uint32_t low, std::uint32_t high) const {
        if (low == high) return viable(choice, low);
        std::uint32_t found = byOneToken(masks(choice)[table_->classOf[table_->closer]]);
        if (high == runEnd(low)) found |= startable(choice, high);
        return found;
    }

 private:
    const std::uint32_t* masks(const NodeRow& choice) const {
        return table_->choiceMask + static_cast<std::size_t>(choice.arg) * table_->classes;
    }
    const std::uint32_t* aheadRow(std::uint32_t found) const {
        return table_->aheadRows + static_cast<std::size_t>(found & ~kMoreTokens) * (table_->classes + 1);
    }
    std::uint32_t byOneToken(std::uint32_t found) const {
        return found & kMoreTokens ? aheadRow(found)[table_->classes] : found;
    }
    /// Where what a guard waits for stands: a pass over the text for each.
    struct GuardIndex {
        std::vector<std::uint32_t> candidates;  ///< by position: the next that could satisfy it
        std::vector<std::uint32_t> barriers;    ///< by position: the next outside
    };
    struct Guarded {
        std::uint32_t last = kNone;   ///< where it stands last, 0 for nowhere; kNone: not looked for
        std::uint32_t index = kNone;  ///< kNone: not made
    };

    void index();
    bool mayComeBehind(std::uint16_t guard, std::uint32_t position);
    /// Whether what a guard waits for can come at a position: such a token, behind what can be the last two
    /// of the call.
    bool isCandidate(std::uint16_t number, std::uint32_t position) const {
        const GuardRow& guard = table_->guards[number];
        if (!inSet(guard.follow, classes_[position]) || !inSet(guard.last, classes_[position - 1]))
            return false;
        const std::uint16_t before = table_->guardBefore[number * table_->classes + classes_[position - 1]];
        return before == kNone16 || (position > 1 && inSet(before, classes_[position - 2]));
    }
    GuardIndex indexOf(std::uint16_t number);

    const ParserTable* table_;
    const std::vector<std::uint16_t>* types_;
    std::uint32_t count_;
    std::vector<std::uint8_t> classes_;  ///< by position, the last one for the end of the text
    std::vector<std::uint32_t> runEnd_;  ///< by position; empty when there is no closer
    std::vector<std::uint32_t> lastOf_;  ///< by class: one past the last position where it stands
    std::vector<Guarded> guards_;
    std::vector<GuardIndex> guardIndexes_;
    std::vector<std::uint32_t> nextOpener_;
};

}  // namespace zr::engine
