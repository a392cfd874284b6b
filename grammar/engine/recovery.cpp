#include "grammar/engine/recovery.h"

#include <set>
#include <utility>
#include <vector>

namespace zr::engine {
namespace {

constexpr std::uint32_t kNone = 0xFFFFFFFF;

/// Goes through the rules that start where the statement does, and looks at what others read only for their
/// ends. Behind the recover rule it doesn't look: nobody needs to know what comes there.
class PlaceSeeker {
 public:
    PlaceSeeker(const ParserTable& table, TextIndex& text, const Options& options, FullSearch& search,
                std::uint32_t start)
        : table_(table), text_(text), options_(options), search_(search), start_(start) {}

    std::uint32_t seek(std::uint16_t rule) {
        enter(rule);
        while (!open_.empty()) {
            const auto [node, position] = open_.back();
            open_.pop_back();
            pass(node, position);
        }
        return place_;
    }

 private:
    using Place = std::pair<std::uint16_t, std::uint32_t>;  ///< node and position

    void meet(std::uint16_t node, std::uint32_t position) {
        if (met_.emplace(node, position).second) open_.emplace_back(node, position);
    }
    void enter(std::uint16_t rule) { meet(searchedFrom(table_, table_.rules[rule].entry), start_); }

    void pass(std::uint16_t at, std::uint32_t p) {
        const NodeRow& node = table_.nodes[at];
        switch (node.op) {
            case Op::Choice:
                // The part that recovery replaces starts with none of its tokens: look at every way to it.
                for (std::uint32_t i = 0; i < table_.choices[node.arg].branches; ++i)
                    meet(branchStop(table_, node, i), p);
                break;
            case Op::Soft:
            case Op::SoftStar:
                if (text_.isCloser(p)) meet(node.op == Op::Soft ? node.run : at, p + 1);
                meet(node.run, p);
                break;
            case Op::Call:
                call(at, p);
                break;
            case Op::End:
                ends_.emplace_back(node.arg, p);
                for (const std::uint16_t caller : callers_)
                    if (table_.nodes[caller].arg == node.arg) comeBack(caller, p);
                break;
            case Op::Hard:
                if (text_.isCloser(p)) meet(node.run, p + 1);
                break;
            case Op::Token:
            case Op::Set: {
                if (p >= text_.count()) break;
                const bool fits = node.op == Op::Token ? text_.type(p) == node.arg
                                                       : text_.inSet(node.arg, text_.classAt(p));
                if (fits) meet(node.run, p + 1);
                break;
            }
            case Op::Root:
            case Op::ScopeBegin:
            case Op::ScopeEnd:
                break;  // nobody stops there
        }
    }

    void call(std::uint16_t at, std::uint32_t p) {
        const NodeRow& node = table_.nodes[at];
        if (node.arg == table_.recoverRule) {
            if (place_ == kNone || p > place_) place_ = p;
        } else if (p == start_) {
            callers_.push_back(at);
            for (std::size_t i = 0; i < ends_.size(); ++i)
                if (ends_[i].first == node.arg) comeBack(at, ends_[i].second);
            enter(node.arg);
        } else {
            for (const std::uint32_t end : search_.allEnds(table_, text_, options_, node.arg, p))
                if (end != p || !(node.flags & kNonEmpty)) meet(node.run, end);
        }
    }

    void comeBack(std::uint16_t caller, std::uint32_t end) {
        const NodeRow& node = table_.nodes[caller];
        if (end != start_ || !(node.flags & kNonEmpty)) meet(node.run, end);
    }

    const ParserTable& table_;
    TextIndex& text_;
    const Options& options_;
    FullSearch& search_;
    const std::uint32_t start_;
    std::set<Place> met_;
    std::vector<Place> open_;
    std::vector<std::uint16_t> callers_;  ///< at the start
    std::vector<std::pair<std::uint16_t, std::uint32_t>>
        ends_;  ///< rules that started there, and where they end
    std::uint32_t place_ = kNone;
};

}  // namespace

std::uint32_t recoveryPlace(const ParserTable& table, TextIndex& text, const Options& options,
                            FullSearch& search, std::uint16_t rule, std::uint32_t start) {
    const std::uint32_t place = PlaceSeeker(table, text, options, search, start).seek(rule);
    if (place == kNone) return kNone;
    const bool readsItself = !search.allEnds(table, text, options, table.recoverRule, place).empty();
    return readsItself ? kNone : place;
}

std::uint32_t skippedTo(const ParserTable& table, const TextIndex& text, std::uint32_t position) {
    std::uint32_t depth = 0;
    for (; position < text.fullCount(); ++position) {
        const std::uint16_t type = text.type(position);
        if (depth == 0 && text.inSet(table.recoverFollowSet, table.classOf[type])) break;
        if (type == table.leftParen) ++depth;
        if (type == table.rightParen && depth > 0) --depth;
    }
    return position;
}

}  // namespace zr::engine
