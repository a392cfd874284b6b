#pragma once

#include <cstdint>
#include <vector>

#include "grammar/engine/derivation.h"
#include "grammar/engine/options.h"
#include "grammar/engine/tables.h"
#include "grammar/engine/text_index.h"

/// The search that never turns back, for texts on which the lazy one (recogniser.h) asks for too much.
///
/// It first finds, for every (rule, position) that it comes to, the set of all ends, whatever their order;
/// then it walks down once from the whole, and at every choice takes the first branch that still leads to an
/// end that is wanted there. So a text with many readings costs what its sets of ends cost and not what
/// trying them in order would. On text with few readings it does more than needed, which is why it doesn't
/// come first.
namespace zr::engine {

class FullSearch {
 public:
    static constexpr std::uint32_t kNone = 0xFFFFFFFF;

    /// Where a part that can't be read may stand for anything, see Recogniser::recover().
    struct Recovery {
        bool on = false;
        std::uint32_t start = 0;      ///< where the statement starts
        std::uint32_t place = kNone;  ///< where the recover rule may stand for anything
    };

    enum class Outcome { Found, NotFound, TooDeep, OverBudget };

    /// The table and the index must outlive this object.
    FullSearch(const ParserTable& table, TextIndex& text, const Options& options, const Recovery& recovery);

    /// Reads `rule` from `position` as far as any derivation reaches.
    Outcome run(std::uint16_t rule, std::uint32_t position);

    /// The derivation that was found, and where it ends.
    Derivation& derivation() { return derivation_; }
    std::uint32_t reached() const { return reached_; }
    std::uint64_t steps() const { return steps_; }
    /// The last place where the statement asked for the recover rule, or kNone.
    std::uint32_t askedAt() const { return askedAt_; }

 private:
    /// A place that a search has come to: an interval, since closers are settled later, and the tail loops
    /// that stopped there although a round could start.
    struct Place {
        std::uint32_t low, high;
        std::uint8_t stopped;
        bool operator==(const Place&) const = default;
        bool operator<(const Place& other) const {
            if (high != other.high) return high < other.high;
            if (low != other.low) return low < other.low;
            return stopped < other.stopped;
        }
    };

    struct Item {
        Place place;
        std::uint16_t node;
    };

    /// Places in ascending order, each once. Entries that share all ends share the memory.
    struct Slice {
        std::uint32_t first = 0, count = 0;
        bool operator==(const Slice&) const = default;
    };

    struct Entry {
        std::uint32_t position;
        std::uint32_t nextHere;
        Slice ends;
        std::uint16_t rule;
        bool done = false, mayRecover = false, recovered = false;
    };

    /// An entry whose ends are being found: what it has put on the three stacks starts at these places.
    struct Work {
        std::uint32_t entry;
        std::uint32_t items, ends, slices, arrivals;
        bool waiting;  ///< for the ends of the call on top of the items
    };

    /// The plain places at which one entry has come to one node: calls that have many ends each lead to the
    /// same ones over and over.
    struct Arrivals {
        std::uint16_t node;
        std::uint32_t from;  ///< position of the first bits
        std::vector<std::uint64_t> bits;
    };

    /// A point where several ways go on from, in the search for one that leads to a wanted end.
    struct Trial {
        Item item;
        std::uint32_t branch;
    };

    /// An entry whose path is being written down.
    struct Walk {
        std::uint32_t entry;
        std::uint32_t part;
        Slice wanted;  ///< in wanted_
        Item at;
        std::uint32_t state;
        std::uint32_t memo;  ///< number of this walk in the memo
    };

    /// How the rest of a rule behind a call can end without a token more.
    enum class Rest : std::uint8_t {
        Unknown,
        Open,   ///< not at all
        Plain,  ///< and the place stays what it is
        Other   ///< past optional closers or tail loops
    };

    std::uint32_t entryFor(std::uint16_t rule, std::uint32_t position);
    std::uint32_t entryAt(std::uint16_t rule, std::uint32_t position) const;
    bool entersOnce(std::uint32_t entry, const Item& item);
    std::uint16_t target(const NodeRow& choice, std::uint32_t branch) const;
    bool take(const NodeRow& node, Place& place) const;
    std::uint32_t branchMask(std::uint32_t entry, const Item& item) const;
    Item afterBranch(const Item& item, std::uint32_t branch) const;
    bool mayCall(std::uint32_t entry, Item& item);
    bool goesOn(std::uint32_t entry, const NodeRow& call, const Place& place) const;
    Rest restBehind(const NodeRow& call);
    bool comesBack(const Item& call, const Entry& called, const Place& end, Item& next) const;
    Place endOf(std::uint32_t entry, Place place);
    bool isStart(std::uint32_t entry) const {
        return recovery_.on && entries_[entry].position == recovery_.start;
    }

    /// As Options::maxMemo counts it; the words of bits are smaller than all else.
    std::size_t remembered() const {
        return entries_.size() + pool_.size() + items_.size() + ends_.size() + memo_.size() +
               arrivalWords_ / 4;
    }
    Outcome findEnds(std::uint32_t root);
    bool follow(std::uint32_t entry, Item item, bool returned, std::uint32_t& child);
    void spread(std::uint32_t entry, const Item& call, const Entry& called);
    Arrivals& arrivalsAt(std::uint16_t node, std::uint32_t from);
    void finishEntry(const Work& work);
    void gather(const Work& work);
    void recover(Entry& entry);

    void writeDown(std::uint32_t root);
    void startWalk(std::uint32_t entry, Slice wanted);
    bool walkOn(std::size_t index);
    void comeBack(Walk& walk, std::uint32_t part, const Place& end, std::uint32_t state);
    std::uint32_t addState(std::uint16_t node, const Place& place, std::uint32_t before, std::uint32_t part,
                           std::uint32_t end);
    bool isWanted(const Walk& walk, const Place& place);
    std::uint32_t branchCount(const Item& item) const;
    bool branch(const Walk& walk, const Item& item, std::uint32_t index, Item& next);
    bool leadsOn(const Walk& walk, const Item& item);

    const ParserTable& table_;
    TextIndex& text_;
    const Options& options_;
    const Recovery recovery_;

    std::vector<Entry> entries_;
    std::vector<std::uint32_t> entriesAt_;
    std::vector<Place> pool_;  ///< ends of all entries
    std::vector<Work> works_;
    std::vector<Item> items_;
    std::vector<Place> ends_;
    std::vector<Slice> slices_;
    std::vector<Arrivals> arrivals_;
    std::size_t arrivalWords_ = 0;
    std::vector<std::uint64_t> marks_;
    std::vector<Rest> rests_;  ///< by node behind a call
    std::uint64_t steps_ = 0;
    std::uint32_t reached_ = 0;
    std::uint32_t askedAt_ = kNone;

    /// Open addressing: by (entry or walk, item); whether it was entered or, in walks, whether it leads on.
    struct Memo {
        enum Value : std::uint8_t { No, Yes, Unknown };
        std::uint32_t owner;
        Item item;
        Value value;
    };
    Memo& memo(std::uint32_t owner, const Item& item);
    std::vector<Memo> memo_;
    std::size_t memoUsed_ = 0;

    std::vector<Walk> walks_;
    std::vector<Place> wanted_;
    std::vector<Trial> trials_;
    std::uint32_t memos_ = 0;
    Derivation derivation_;
};

}  // namespace zr::engine
