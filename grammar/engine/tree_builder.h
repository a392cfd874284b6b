#pragma once

#include <antlr3.h>

#include <vector>

#include "grammar/engine/recogniser.h"

/// Builds the runtime's tree along the derivation that the recogniser chose, through the runtime's adaptor.
namespace zr::engine {

class TreeBuilder {
 public:
    /// `tokens` are the on-channel tokens that the recogniser saw, without end of file.
    TreeBuilder(const GrammarTable& grammar, const Recogniser& recogniser,
                const std::vector<pANTLR3_COMMON_TOKEN>& tokens, pANTLR3_BASE_TREE_ADAPTOR adaptor);
    ~TreeBuilder();
    TreeBuilder(const TreeBuilder&) = delete;
    TreeBuilder& operator=(const TreeBuilder&) = delete;

    /// What stands in the place of a part that was skipped; asked once for each such part.
    struct ErrorNodes {
        virtual pANTLR3_BASE_TREE errorNode(std::uint32_t from, std::uint32_t to) = 0;

     protected:
        ~ErrorNodes() = default;
    };

    /// The roots that the derivation yields, in order: one for a rule with a root, several for a list.
    const std::vector<pANTLR3_BASE_TREE>& build(const Recogniser::Result& result, ErrorNodes& errors);

 private:
    /// One element of a path with its exact place in the tokens.
    struct Step {
        std::uint16_t node;
        std::uint32_t low, high;  ///< possible positions ahead of it
        std::uint32_t at;         ///< the position it really starts at
        std::uint32_t child, childEnd;
    };

    struct Scope {
        Mark mark;
        std::uint32_t base;   ///< first value of this scope
        bool rooted;          ///< the first value is a root: what comes behind it are its children
        std::uint32_t start;  ///< first token
    };

    struct Frame {
        std::uint32_t nextStep, stepsEnd;  ///< into steps_
        std::uint32_t stepsBase;
    };

    /// The steps of a thread's last tree, kept for its next one like the vectors of a search.
    static std::vector<Step>& spareSteps();
    void expand(std::uint32_t entry, std::uint32_t endState, std::uint32_t exact);
    void locate(std::uint32_t from, std::uint32_t exact);
    void token(const Step& step);
    void openScope(Mark mark, std::uint32_t at);
    void closeScope(std::uint32_t at);
    void adoptAll(pANTLR3_BASE_TREE root, std::uint32_t base, std::uint32_t end);
    void becomeRoot(Scope& scope, std::uint32_t end, pANTLR3_BASE_TREE root);
    void bound(pANTLR3_BASE_TREE node, std::uint32_t start, std::uint32_t stop) const;

    const GrammarTable& grammar_;
    const ParserTable& table_;
    const Recogniser& recogniser_;
    const std::vector<pANTLR3_COMMON_TOKEN>& tokens_;
    pANTLR3_BASE_TREE_ADAPTOR adaptor_;
    std::vector<Step> steps_;
    std::vector<std::uint32_t> path_;
    std::vector<Frame> frames_;
    std::vector<Scope> scopes_;
    std::vector<pANTLR3_BASE_TREE> values_;
    std::uint32_t dropped_ = 0;  ///< scopes at work whose tree is left out
    std::uint32_t runEndOf(std::uint32_t position) const;
};

}  // namespace zr::engine
