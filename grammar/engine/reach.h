#pragma once

#include <algorithm>
#include <cstdint>
#include <span>
#include <vector>

#include "grammar/engine/grow.h"
#include "grammar/engine/tables.h"
#include "grammar/engine/text_index.h"

/// Which nodes of a grammar a reading of a text can pass at which position, looked at without matching calls
/// with their returns: a rule that ends may go on behind any call of it that was met further ahead. So this
/// says "no" only where no reading passes, and takes time and memory linear in the text.
///
/// follow() goes forward from the beginning and notes every way from one node to the next, keep() goes back
/// along these from an end; a node that is kept was met on both.
namespace zr::engine {

class Reach {
 public:
    static constexpr std::uint32_t kNone = 0xFFFFFFFF;

    /// Where tokens that can't be read may stand in place of the recover rule.
    struct Recovery {
        std::uint32_t place = kNone;  ///< kNone for nowhere
        std::uint32_t to = kNone;
    };

    /// Makes ready for a text; the table and the index must outlive what is done with them.
    void start(const ParserTable& table, TextIndex& text, const Recovery& recovery);

    /// Finds what `rule` can pass from `position` on; false where that takes more bytes than `most`.
    bool follow(std::uint16_t rule, std::uint32_t position, std::size_t most);
    /// Where the followed rule could end, in ascending order.
    const std::vector<std::uint32_t>& ends() const { return ends_; }
    /// Keeps what can lead to an end of the followed rule from `first` to `last`.
    void keep(std::uint32_t first, std::uint32_t last);

    /// The nodes that were kept at a position, in ascending order.
    std::span<const std::uint16_t> keptAt(std::uint32_t position) const {
        const std::uint32_t* from = keptFrom_.data() + (position - from_);
        return {kept_.data() + from[1], from[0] - from[1]};
    }
    /// Which of all kept nodes, those of the last position first, is a node at a position; kNone for none.
    std::uint32_t keptPlace(std::uint16_t node, std::uint32_t position) const {
        if (position > end_) return kNone;
        const std::span<const std::uint16_t> nodes = keptAt(position);
        const auto found = std::lower_bound(nodes.begin(), nodes.end(), node);
        if (found == nodes.end() || *found != node) return kNone;
        return keptFrom_[position - from_ + 1] + static_cast<std::uint32_t>(found - nodes.begin());
    }
    /// Nodes that the followed rule can come to have lower numbers.
    std::uint32_t nodes() const { return nodes_; }
    /// The branches of a Choice that are worth a look, as bits.
    std::uint32_t branches(const NodeRow& choice, std::uint32_t position) const {
        // The part that recovery replaces starts with none of its tokens: look at every way to it.
        if (position == recovery_.place)
            return static_cast<std::uint32_t>((std::uint64_t{1} << table_->choices[choice.arg].branches) - 1);
        // Nor need the tokens ahead of it be those that a reading goes on with.
        if (position < recovery_.place && recovery_.place - position < table_->tokensAhead)
            return text_->startable(choice, position);
        return text_->viable(choice, position);
    }
    /// Whether a call may stand for tokens that can't be read.
    bool mayRecover(const NodeRow& call, std::uint32_t position) const {
        return position == recovery_.place && call.arg == table_->recoverRule;
    }
    /// Nodes kept at all positions together.
    std::size_t keptCount() const { return kept_.size(); }
    std::size_t bytes() const;
    std::size_t capacity() const;

 private:
    /// A way from a node to one that comes behind it.
    struct Way {
        std::uint16_t from, to;
    };

    static bool has(const std::uint64_t* row, std::uint16_t node) {
        return ((row[node / 64] >> (node % 64)) & 1) != 0;
    }
    static void set(std::uint64_t* row, std::uint16_t node) {
        row[node / 64] |= std::uint64_t{1} << (node % 64);
    }
    void meet(std::uint16_t node) {
        if (has(met_.data(), node)) return;
        set(met_.data(), node);
        open_.push_back(node);
    }
    void lead(std::uint16_t from, std::uint16_t to) {
        growSlowly(ways_);
        ways_.push_back({from, to});
        meet(to);
    }
    void pass(std::uint16_t node, std::uint32_t position);
    void passCall(std::uint16_t call, std::uint32_t position);
    bool mayCall(const NodeRow& call, std::uint32_t position);
    bool mayBeEmpty(const NodeRow& call) const;
    bool comesBack(std::uint16_t call, std::uint32_t position) const;
    void beginPosition();
    bool leadsOn(std::uint16_t node) const;
    void keepNode(std::uint16_t node);
    void keepAt(std::uint32_t position);
    void noteKept(std::uint32_t here);
    template <typename Visit>
    void forEachCallMet(std::uint16_t rule, Visit visit) const;

    const ParserTable* table_ = nullptr;
    TextIndex* text_ = nullptr;
    Recovery recovery_;
    std::uint32_t nodes_ = 0;
    std::size_t words_ = 0;
    std::uint16_t rule_ = 0;
    std::uint32_t from_ = 0, end_ = 0;

    // Ways at one position and to the next one, in the order in which they were found.
    std::vector<Way> ways_, steps_;
    std::vector<std::uint32_t> waysFrom_, stepsFrom_;  ///< by position
    std::vector<Way> skips_;                           ///< over what can't be read
    std::vector<std::uint32_t> ends_;                  ///< where the followed rule could end

    std::vector<std::uint64_t> met_;         ///< nodes met at the position at hand, as bits
    std::vector<std::uint16_t> open_;        ///< met there and not passed yet
    std::vector<std::uint32_t> metAt_;       ///< by Call: where it was met first
    std::vector<std::uint16_t> called_;      ///< by rule: the Call of it that was met last as a new one
    std::vector<std::uint16_t> callBefore_;  ///< by Call: the one of the same rule met before it
    std::vector<std::uint32_t> endedAt_;     ///< by rule: where it ended last
    std::vector<std::uint16_t> endOf_;       ///< by rule: its End, once it was passed

    std::vector<std::uint16_t> kept_;  ///< nodes, those of the last position first
    std::vector<std::uint32_t>
        keptFrom_;  ///< by position, counted from 1; what one holds ends where that before it starts
    std::vector<std::uint64_t> here_, next_;  ///< nodes kept at the position at hand and at the next, as bits
    std::vector<std::uint8_t> returns_;       ///< by Call: something was kept behind it, further on
    // At the position at hand: the ways to a node, one behind the other.
    std::vector<std::uint32_t> wayTo_;      ///< by node
    std::vector<std::uint32_t> wayBefore_;  ///< by way
    std::vector<std::uint16_t> ended_;      ///< rules
};

}  // namespace zr::engine
