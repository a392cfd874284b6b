#pragma once

#include <cstdint>
#include <optional>
#include <vector>

#include "grammar/engine/diagnostics.h"
#include "grammar/engine/options.h"
#include "grammar/engine/recogniser.h"
#include "grammar/engine/reports.h"
#include "grammar/engine/tables.h"
#include "grammar/engine/tree_builder.h"

/// From tokens to the tree of one rule, whatever the tree is made of.
namespace zr::engine {

/// The derivation of one rule from the first token on: with the start rule that of its statement, and where
/// nothing reads that, its mandatory part left to recovery.
class RuleDerivation {
 public:
    RuleDerivation(const ParserTable& table, const std::vector<std::uint16_t>& types, const Options& options,
                   std::uint16_t rule) {
        const bool isStart = rule == table.startRule;
        const std::uint16_t wanted = isStart ? table.statementRule : rule;
        recogniser_.emplace(table, types, options);
        result_ = recogniser_->run(wanted, 0);
        if (!result_.found && !result_.overLimit && isStart && table.recoverRule != kNone16) {
            recogniser_.emplace(table, types, options);
            result_ = recogniser_->recover(wanted, 0);
        }
        recogniser_->finish();
        if (result_.overBudget) zr::diagnose(u"the search for the furthest reading was cut short");
    }

    const Recogniser& recogniser() const { return *recogniser_; }
    const Recogniser::Result& result() const { return result_; }

 private:
    std::optional<Recogniser> recogniser_;
    Recogniser::Result result_;
};

template <class Node>
struct RuleTree {
    Node root;
    bool failed;        ///< at the first token: the error node is the tree, and nothing is taken
    std::uint32_t end;  ///< tokens that were taken
};

/// Reads `rule` from the first token on. Beyond what TreeBuilder asks, `Tree` has
///
///     end()                                   a node for the end of the text
///     list()                                  a node whose children are a list of trees
template <class Tree>
RuleTree<typename Tree::Node> readRule(const GrammarTable& grammar, const std::vector<std::uint16_t>& types,
                                       const Options& options, std::uint16_t rule, Tree& tree) {
    const ParserTable& table = *grammar.parser;
    if (types.size() > options.maxTokens) {
        reportTooLong();
        return {tree.error(0, 0), true, 0};
    }
    const RuleDerivation derivation(table, types, options, rule);
    const Recogniser::Result& result = derivation.result();
    if (!result.found) return {tree.error(0, 0), true, 0};

    TreeBuilder<Tree> builder(table, derivation.recogniser().derivation(), types, tree);
    std::vector<typename Tree::Node>& roots = builder.build();
    std::uint32_t end = result.high;
    if (rule == table.startRule) {
        const auto count = static_cast<std::uint32_t>(types.size());
        if (table.keepTail) {
            for (std::uint32_t i = end; i < count; ++i) roots.push_back(tree.token(i));
            roots.push_back(tree.end());
        }
        end = count;
    }
    // One root stands for itself, several go under a list.
    typename Tree::Node root = roots.size() == 1 ? roots[0] : tree.list();
    if (roots.size() != 1) tree.adopt(root, roots.data(), static_cast<std::uint32_t>(roots.size()));
    if (end != 0) tree.bound(root, 0, end);
    return {root, false, end};
}

}  // namespace zr::engine
