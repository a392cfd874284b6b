#include <bitset>
#include <vector>

#include "grammar/compiler/passes.h"

/// What can stand in front of the last token of a rule's text. A guard looks for the end of such a text:
/// where a call may do without what closes it, "( name" would be one everywhere if "(" alone were asked
/// about.
namespace zr::gc {
namespace {

constexpr std::size_t kClasses = 256;
using Classes = std::bitset<kClasses + 1>;
constexpr std::size_t kStart = kClasses;  ///< in front of the first token

/// The last two tokens of what was read up to a node: by the last one, those in front of it. Nothing was read
/// where only kStart has one.
class Pairs {
 public:
    bool join(const Pairs& other) {
        bool grows = false;
        for (std::size_t last = 0; last < before_.size(); ++last) grows |= join(last, other.before_[last]);
        return grows;
    }
    bool join(std::size_t last, const Classes& before) {
        const Classes now = before_[last] | before;
        if (now == before_[last]) return false;
        before_[last] = now;
        return true;
    }
    /// Which tokens can be last.
    Classes lasts() const {
        Classes found;
        for (std::size_t last = 0; last < before_.size(); ++last) found[last] = before_[last].any();
        return found;
    }
    const Classes& before(std::size_t last) const { return before_[last]; }

 private:
    std::vector<Classes> before_ = std::vector<Classes>(kClasses + 1);
};

class LastPairs {
 public:
    LastPairs(const Program& program, const Facts& facts)
        : p_(program),
          facts_(facts),
          upTo_(program.nodes.size()),
          ends_(program.entry.size()),
          callsOf_(program.entry.size()),
          isOpen_(program.nodes.size(), false) {
        Classes start;
        start.set(kStart);
        for (std::size_t i = 0; i < p_.nodes.size(); ++i)
            if (p_.nodes[i].op == Op::Call) callsOf_[index(p_.nodes[i].arg)].push_back(i);
        for (int entry : p_.entry) {
            upTo_[index(entry)].join(kStart, start);
            open(index(entry));
        }
        while (!open_.empty()) {
            const std::size_t node = open_.back();
            open_.pop_back();
            isOpen_[node] = false;
            pass(node);
        }
    }

    const Pairs& ends(int rule) const { return ends_[index(rule)]; }

 private:
    Classes classesOf(const Node& n) const {
        Classes found;
        if (n.op == Op::Set)
            for (int token : p_.sets[index(n.arg)]) found.set(index(p_.classOf[index(token)]));
        else
            found.set(index(p_.classOf[index(n.arg)]));
        return found;
    }

    void open(std::size_t node) {
        if (isOpen_[node]) return;
        isOpen_[node] = true;
        open_.push_back(node);
    }
    void openIf(bool grown, std::size_t node) {
        if (grown) open(node);
    }

    void take(const Pairs& from, const Classes& tokens, std::size_t to) {
        const Classes lasts = from.lasts();
        if (lasts.none()) return;
        for (std::size_t token = 0; token < kClasses; ++token)
            if (tokens[token]) openIf(upTo_[to].join(token, lasts), to);
    }

    void call(const Pairs& from, const Pairs& called, std::size_t to) {
        const Classes lasts = from.lasts();
        if (lasts.none()) return;
        for (std::size_t last = 0; last < kClasses; ++last) {
            Classes before = called.before(last);
            if (before[kStart]) before = before.reset(kStart) | lasts;
            if (before.any()) openIf(upTo_[to].join(last, before), to);
        }
    }

    void hand(std::size_t from, int to) { openIf(upTo_[index(to)].join(upTo_[from]), index(to)); }

    /// Hands what was read up to a node to those behind it.
    void pass(std::size_t i) {
        const Node& n = p_.nodes[i];
        switch (n.op) {
            case Op::Token:
            case Op::Set:
                return take(upTo_[i], classesOf(n), index(n.next));
            case Op::Soft:
            case Op::SoftStar:
                take(upTo_[i], classesOf(n), n.op == Op::Soft ? index(n.next) : i);
                return hand(i, n.next);
            case Op::Choice:
                for (int target : n.targets) hand(i, target);
                return;
            case Op::Call:
                call(upTo_[i], ends_[index(n.arg)], index(n.next));
                if (facts_.nullable[index(n.arg)]) hand(i, n.next);
                return;
            case Op::End:
                if (ends_[index(n.arg)].join(upTo_[i]))
                    for (const std::size_t caller : callsOf_[index(n.arg)]) open(caller);
                return;
            default:
                return hand(i, n.next);
        }
    }

    const Program& p_;
    const Facts& facts_;
    std::vector<Pairs> upTo_;  ///< by node
    std::vector<Pairs> ends_;  ///< by rule
    std::vector<std::vector<std::size_t>> callsOf_;
    std::vector<std::size_t> open_;  ///< nodes that have more to hand on
    std::vector<bool> isOpen_;
};

}  // namespace

void lastPairs(Program& program, const Facts& facts) {
    const LastPairs pairs(program, facts);
    for (Guard& guard : program.guards) {
        const Pairs& ends = pairs.ends(guard.rule);
        for (int last = 0; last < program.classes; ++last) {
            std::set<int> before;
            const Classes& found = ends.before(index(last));
            for (int c = 0; c < program.classes && !found[kStart]; ++c)
                if (found[index(c)]) before.insert(c);
            guard.before.push_back(std::move(before));
        }
    }
}

}  // namespace zr::gc
