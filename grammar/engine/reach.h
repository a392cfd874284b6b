#pragma once

#include <cstdint>
#include <vector>

#include "grammar/engine/tables.h"
#include "grammar/engine/text_index.h"

/// Which nodes of a grammar a reading of a text can pass at which position, looked at without matching calls
/// with their returns: a rule that ends may go on behind any call of it that was met further ahead. So this
/// says "no" only where no reading passes, and takes time and memory linear in the text.
///
/// follow() goes forward from the beginning, keep() back from an end; a node that is kept was met on both
/// ways.
namespace zr::engine {

class Reach {
 public:
    static constexpr std::uint32_t kNone = 0xFFFFFFFF;

    /// Where tokens that can't be read may stand in place of the recover rule.
    struct Recovery {
        std::uint32_t place = kNone;  ///< kNone for nowhere
        std::uint32_t to = kNone;
    };

    /// The table and the index must outlive this object.
    Reach(const ParserTable& table, TextIndex& text, const Recovery& recovery);

    /// What looking at so many tokens takes, nearly all of it for the two tables of nodes.
    static std::size_t bytesFor(const ParserTable& table, std::size_t tokens) {
        return (tokens + 1) * ((table.stops + 63) / 64) * 2 * sizeof(std::uint64_t);
    }

    /// Finds what `rule` can pass from `position` on.
    void follow(std::uint16_t rule, std::uint32_t position);
    /// Where the followed rule could end, in ascending order.
    const std::vector<std::uint32_t>& ends() const { return ends_; }
    /// Keeps what can lead to an end of the followed rule from `first` to `last`.
    void keep(std::uint32_t first, std::uint32_t last);

    /// Whether a node was kept at a position.
    bool keeps(std::uint16_t node, std::uint32_t position) const {
        return position <= end_ && has(kept_, node, position);
    }
    /// What was kept at a position, as bits by node, in words of which there are words().
    const std::uint64_t* keptAt(std::uint32_t position) const {
        return kept_.data() + (position - from_) * words_;
    }
    std::size_t words() const { return words_; }
    /// The branches of a Choice that are worth a look, as bits.
    std::uint32_t branches(const NodeRow& choice, std::uint32_t position) const;
    /// Whether a call may stand for tokens that can't be read.
    bool mayRecover(const NodeRow& call, std::uint32_t position) const {
        return position == recovery_.place && call.arg == table_.recoverRule;
    }
    /// Nodes kept at all positions together.
    std::size_t keptCount() const { return keptCount_; }

 private:
    using Rows = std::vector<std::uint64_t>;

    bool has(const Rows& rows, std::uint16_t node, std::uint32_t position) const {
        return (rows[(position - from_) * words_ + node / 64] >> (node % 64)) & 1;
    }
    void set(Rows& rows, std::uint16_t node, std::uint32_t position) const {
        rows[(position - from_) * words_ + node / 64] |= std::uint64_t{1} << (node % 64);
    }
    void meet(std::uint16_t node, std::uint32_t position);
    void pass(std::uint16_t node, std::uint32_t position);
    bool leadsOn(std::uint16_t node, std::uint32_t position);
    void noteReturns(std::uint16_t end, std::uint32_t position);
    bool mayCall(const NodeRow& call, std::uint32_t position);
    bool mayBeEmpty(const NodeRow& call) const;
    bool comesBack(std::uint16_t call, std::uint32_t position) const;
    template <typename Visit>
    void forEachCall(std::uint16_t rule, Visit visit) const;

    const ParserTable& table_;
    TextIndex& text_;
    const Recovery recovery_;
    std::size_t words_;
    std::uint16_t rule_ = 0;
    std::uint32_t from_ = 0;
    std::uint32_t firstEnd_ = 0, end_ = 0;
    Rows met_, kept_;  ///< by position: nodes as bits
    std::size_t keptCount_ = 0;
    std::vector<std::uint16_t> order_;      ///< the nodes met, position by position
    std::vector<std::uint32_t> orderFrom_;  ///< by position
    std::vector<std::uint16_t> open_;       ///< met here and not passed yet
    std::vector<std::uint16_t> ahead_;      ///< met at the next position
    std::vector<std::uint16_t> skipped_;    ///< met behind the recovery
    std::vector<std::uint32_t> metAt_;      ///< by Call: where it was met first
    std::vector<std::uint32_t> endedAt_;    ///< by rule: where it ended last
    std::vector<std::uint8_t> returns_;     ///< by Call: something was kept behind it, further on
    std::vector<std::uint32_t> ends_;       ///< where the followed rule could end
};

}  // namespace zr::engine
