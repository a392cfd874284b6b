#include "grammar/engine/lexed_text.h"

#include <algorithm>
#include <numeric>

#include "grammar/engine/diagnostics.h"
#include "grammar/engine/lexer_match.h"
#include "grammar/engine/reports.h"

namespace zr::engine {

LexedText::LexedText(const LexerTable& table, std::u16string_view text, const Options& options)
    : table_(&table), text_(text) {
    if (text.size() <= options.maxUnits)
        read(options);
    else
        reportTooLong();
}

/// Up to here positions and indexes were the same.
void LexedText::startHidden() {
    hasHidden_ = true;
    seen_.reserve(types_.capacity());
    seen_.resize(count());
    std::iota(seen_.begin(), seen_.end(), 0u);
}

inline void LexedText::add(const LexedToken& token) {
    if (table_->rules[token.rule].hidden == 0) {
        if (hasHidden_) seen_.push_back(count());
        types_.push_back(token.type);
    } else if (!hasHidden_) {
        startHidden();
    }
    growSlowly(tokens_);
    tokens_.push_back(token);
}

void LexedText::read(const Options& options) {
    // A guess that text as people write it rarely exceeds.
    constexpr std::size_t kUnitsOfToken = 5;
    tokens_.reserve(text_.size() / kUnitsOfToken + 8);
    types_.reserve(tokens_.capacity());
    const LexerTable& table = *table_;
    const char16_t* const units = text_.data();
    const char16_t* const end = units + text_.size();
    const bool reports = zr::diagnosticsWanted();
    PlaceFinder places(text_);
    LexerDeadEnds deadEnds;
    const auto offset = [units](const char16_t* at) { return static_cast<std::uint32_t>(at - units); };
    for (const char16_t* start = units; start < end && types_.size() <= options.maxTokens;) {
        const LexerMatch match = longestMatch(table, start, end, deadEnds);
        if (match.rule == kNone16) {
            if (reports) reportDropped(places.at(offset(start)), *start);
            ++start;
            continue;
        }
        add({offset(start), offset(match.end), table.rules[match.rule].token, match.rule});
        start = match.end;
    }
}

std::u16string_view LexedText::textOf(std::uint32_t index) const {
    const std::u16string_view units = unitsOf(index);
    const LexRuleRow& rule = table_->rules[tokens_[index].rule];
    const std::size_t cut = std::min<std::size_t>(units.size(), rule.cutFront + rule.cutBack);
    return units.substr(std::min<std::size_t>(rule.cutFront, units.size()), units.size() - cut);
}

}  // namespace zr::engine
