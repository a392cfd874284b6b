#include <cstddef>
#include <map>
#include <vector>

#include "grammar/compiler/passes.h"

/// Small rules of a recursion, such as the levels of an expression, become part of the rules that call them:
/// a call costs a search and the builder more than the nodes do. A call that asks for what must follow it
/// stays.
namespace zr::gc {
namespace {

/// Larger rules save little and make the tables large.
constexpr std::size_t kSmallRule = 40;
/// Nodes that a rule may come to in all places that call it.
constexpr std::size_t kCopiedNodes = 1000;

class Inlining {
 public:
    Inlining(Program& program, const ParserGrammar& grammar, const Facts& facts)
        : p_(program), facts_(facts), guarded_(guardedCalls(program, facts)), keeps_(grammar.rules.size()) {
        for (int rule : {grammar.recoverRule, grammar.statement, grammar.islandRule, grammar.start})
            if (rule >= 0) keeps_[index(rule)] = true;
    }

    void run() {
        for (;;) {
            const int rule = smallest();
            if (rule < 0) return;
            keeps_[index(rule)] = true;
            const std::vector<int> body = bodyOf(rule);
            for (std::size_t i = p_.nodes.size(); i-- > 0;)
                if (isCallOf(static_cast<int>(i), rule)) replace(static_cast<int>(i), body);
        }
    }

 private:
    bool isCallOf(int node, int rule) const {
        const Node& n = p_.nodes[index(node)];
        return n.op == Op::Call && n.arg == rule && !guarded_[index(node)];
    }

    /// The nodes that a rule can come to.
    std::vector<int> bodyOf(int rule) const {
        std::vector<int> body, open{p_.entry[index(rule)]};
        std::vector<bool> met(p_.nodes.size(), false);
        while (!open.empty()) {
            const int at = open.back();
            open.pop_back();
            if (at < 0 || met[index(at)]) continue;
            met[index(at)] = true;
            body.push_back(at);
            const Node& n = p_.nodes[index(at)];
            open.insert(open.end(), n.targets.begin(), n.targets.end());
            open.push_back(n.next);
        }
        return body;
    }

    /// The smallest rule that can be inlined, or -1.
    int smallest() const {
        int best = -1;
        std::size_t least = kSmallRule + 1;
        for (std::size_t r = 0; r < keeps_.size(); ++r) {
            const int rule = static_cast<int>(r);
            if (keeps_[r] || facts_.nullable[r]) continue;
            const std::vector<int> body = bodyOf(rule);
            if (body.size() >= least) continue;
            std::size_t own = 0, calls = 0;
            for (int i : body) own += isCallOf(i, rule);
            for (std::size_t i = 0; i < p_.nodes.size(); ++i) calls += isCallOf(static_cast<int>(i), rule);
            if (own != 0 || calls == 0 || calls * body.size() > kCopiedNodes) continue;
            best = rule;
            least = body.size();
        }
        return best;
    }

    /// Puts a copy of a rule in the place of a call of it.
    void replace(int call, const std::vector<int>& body) {
        std::map<int, int> copyOf;
        for (int i : body) {
            copyOf[i] = static_cast<int>(p_.nodes.size());
            const Node copy = p_.nodes[index(i)];  // since the vector moves
            p_.nodes.push_back(copy);
            guarded_.push_back(guarded_[index(i)]);
        }
        for (int i : body) {
            Node& copy = p_.nodes[index(copyOf[i])];
            for (int& target : copy.targets) target = copyOf[target];
            if (copy.next >= 0) copy.next = copyOf[copy.next];
            if (copy.op != Op::End) continue;
            copy.op = Op::ScopeEnd;
            copy.arg = 0;
            copy.next = p_.nodes[index(call)].next;
        }
        Node& begin = p_.nodes[index(call)];
        begin.op = Op::ScopeBegin;
        begin.next = copyOf[p_.entry[index(begin.arg)]];
        begin.arg = 0;
        begin.nonEmpty = false;
    }

    Program& p_;
    const Facts& facts_;
    std::vector<bool> guarded_;  ///< by node
    std::vector<bool> keeps_;    ///< by rule: stays a rule where it is called
};

}  // namespace

void inlineCalls(Program& program, const ParserGrammar& grammar, const Facts& facts) {
    Inlining(program, grammar, facts).run();
}

}  // namespace zr::gc
