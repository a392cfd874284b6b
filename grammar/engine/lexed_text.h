#pragma once

#include <cstdint>
#include <string_view>
#include <vector>

#include "grammar/engine/grow.h"
#include "grammar/engine/options.h"
#include "grammar/engine/tables.h"

/// A text as a row of small tokens, for whoever needs no token of the runtime.
namespace zr::engine {

/// A token as it stands in the text.
struct LexedToken {
    std::uint32_t from, to;  ///< units that it covers
    std::uint16_t type;
    std::uint16_t rule;  ///< of the lexer; tells what its text lacks at both ends and whether it is hidden
};

/// All tokens of a text, the same as the runtime's token source would hand out one by one. The text is read
/// in place and must outlive this object. Of a text with more units than the options allow there are none,
/// and one with more tokens ends with the first that is too many.
class LexedText {
 public:
    LexedText(const LexerTable& table, std::u16string_view text, const Options& options = {});

    std::u16string_view text() const { return text_; }
    std::uint32_t count() const { return static_cast<std::uint32_t>(tokens_.size()); }
    const LexedToken& token(std::uint32_t index) const { return tokens_[index]; }
    /// The token's text, without what its rule cuts.
    std::u16string_view textOf(std::uint32_t index) const;
    /// What the token covers.
    std::u16string_view unitsOf(std::uint32_t index) const {
        const LexedToken& token = tokens_[index];
        return text_.substr(token.from, token.to - token.from);
    }
    bool isHidden(std::uint32_t index) const { return table_->rules[tokens_[index].rule].hidden != 0; }

    /// The token numbers of those that are not hidden: what a parser sees.
    const std::vector<std::uint16_t>& types() const { return types_; }
    std::uint32_t seenCount() const { return static_cast<std::uint32_t>(types_.size()); }
    /// Which of all tokens the one at a parser's position is.
    std::uint32_t indexOf(std::uint32_t position) const { return hasHidden_ ? seen_[position] : position; }
    /// Gives back the memory of what only a parser asks.
    void dropTypes() { giveBack(types_); }

 private:
    void read(const Options& options);
    void add(const LexedToken& token);
    void startHidden();

    const LexerTable* table_;
    std::u16string_view text_;
    std::vector<LexedToken> tokens_;
    std::vector<std::uint16_t> types_;
    std::vector<std::uint32_t> seen_;  ///< by position; not kept while no token is hidden
    bool hasHidden_ = false;
};

}  // namespace zr::engine
