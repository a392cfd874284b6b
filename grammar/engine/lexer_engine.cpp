#include "grammar/engine/lexer_engine.h"

#include <algorithm>
#include <new>
#include <vector>

#include "grammar/engine/diagnostics.h"
#include "grammar/engine/lexer_match.h"
#include "grammar/engine/reports.h"
#include "grammar/engine/runtime_place.h"

namespace zr::engine {
namespace {

constexpr std::uint32_t kHiddenChannel = 99;

const char16_t* position(pANTLR3_INPUT_STREAM in) {
    return static_cast<const char16_t*>(in->nextChar);
}
const char16_t* endOf(pANTLR3_INPUT_STREAM in) {
    return static_cast<const char16_t*>(in->data) + in->sizeBuf / sizeof(char16_t);
}

std::size_t size(pANTLR3_INPUT_STREAM in) {
    return in->sizeBuf / sizeof(char16_t);
}

/// Moves the stream over `count` units with the line counting that the runtime's consume does.
void advance(pANTLR3_INPUT_STREAM in, std::size_t count) {
    const char16_t* from = position(in);
    const char16_t* to = from + count;
    in->charPositionInLine += static_cast<ANTLR3_INT32>(count);
    for (; from < to; ++from) {
        if (*from != static_cast<char16_t>(in->newlineChar)) continue;
        ++in->line;
        in->charPositionInLine = static_cast<ANTLR3_INT32>(to - from - 1);
        in->currentLine = const_cast<char16_t*>(from + 1);
    }
    in->nextChar = const_cast<char16_t*>(to);
}

void dropUnit(pANTLR3_LEXER lexer) {
    ++lexer->rec->state->errorCount;
    const pANTLR3_INPUT_STREAM in = lexer->input;
    if (zr::diagnosticsWanted()) reportDropped(placeOf(in->line, in->charPositionInLine), *position(in));
    advance(in, 1);
}

/// The token of `length` units at the stream's position goes to the lexer's state, as the runtime's emit
/// would put it.
void emit(const LexRuleRow& rule, pANTLR3_LEXER lexer, std::size_t length) {
    const pANTLR3_RECOGNIZER_SHARED_STATE state = lexer->rec->state;
    const pANTLR3_INPUT_STREAM in = lexer->input;
    const char16_t* start = position(in);
    const pANTLR3_COMMON_TOKEN token =
        state->tokFactory ? state->tokFactory->newToken(state->tokFactory) : nullptr;
    if (token == nullptr) return;
    state->type = rule.token;
    state->channel = rule.hidden ? kHiddenChannel : ANTLR3_TOKEN_DEFAULT_CHANNEL;
    token->type = rule.token;
    token->channel = state->channel;
    token->start = reinterpret_cast<ANTLR3_MARKER>(start);
    token->stop = reinterpret_cast<ANTLR3_MARKER>(start + length - 1);
    token->line = in->line;
    token->charPosition = in->charPositionInLine;
    token->lineStart = in->currentLine;
    if (rule.cutFront != 0 || rule.cutBack != 0) {
        const std::size_t cut = std::min<std::size_t>(length, rule.cutFront + rule.cutBack);
        token->tokText.text = in->strFactory->newPtr(
            in->strFactory, reinterpret_cast<pANTLR3_UINT8>(const_cast<char16_t*>(start + rule.cutFront)),
            static_cast<ANTLR3_UINT32>(length - cut));
        token->textState = ANTLR3_TEXT_STRING;
    }
    advance(in, length);
    state->token = token;
}

/// Where the longest token of a rule from `start` on ends; null where there is none.
const char16_t* longestMatchOf(const LexerTable& table, std::uint32_t rule, const char16_t* start,
                               const char16_t* end) {
    const char16_t* best = start;
    // All ways at once, unit by unit: the rule's own program has no more than a few hundred instructions.
    std::vector<std::int32_t> now, next;
    std::vector<std::uint32_t> mark(table.codeCount, 0);
    std::uint32_t generation = 0;
    const auto add = [&](std::vector<std::int32_t>& to, std::int32_t entry) {
        std::vector<std::int32_t> work{entry};
        while (!work.empty()) {
            const std::int32_t i = work.back();
            work.pop_back();
            if (mark[static_cast<std::size_t>(i)] == generation) continue;
            mark[static_cast<std::size_t>(i)] = generation;
            const LexInstructionRow& row = table.code[i];
            if (row.op == LexInstructionRow::Split) {
                work.push_back(row.other);
                work.push_back(row.next);
            } else {
                to.push_back(i);
            }
        }
    };
    ++generation;
    if (table.rules[rule].entry >= 0) add(now, table.rules[rule].entry);
    for (const char16_t* at = start; !now.empty(); ++at) {
        ++generation;
        next.clear();
        for (const std::int32_t i : now) {
            const LexInstructionRow& row = table.code[i];
            if (row.op == LexInstructionRow::Accept)
                best = at;
            else if (at < end && row.low <= *at && *at <= row.high)
                add(next, row.next);
        }
        if (at >= end) break;
        now.swap(next);
    }
    return best > start ? best : nullptr;
}

}  // namespace

void nextToken(LexerState& holder, pANTLR3_LEXER lexer) {
    const pANTLR3_RECOGNIZER_SHARED_STATE state = lexer->rec->state;
    const pANTLR3_INPUT_STREAM in = lexer->input;
    const char16_t* const end = endOf(in);
    if (position(in) == in->data) {
        holder.tokens = 0;
        holder.deadEnds = {};
    }
    if (size(in) > holder.options.maxUnits || holder.tokens > holder.options.maxTokens) {
        ++lexer->rec->state->errorCount;
        reportTooLong();
        in->nextChar = const_cast<char16_t*>(end);
    }
    for (;;) {
        const char16_t* const start = position(in);
        if (start >= end) {
            // Only dropped characters were left; the runtime asks again and finds the end.
            state->token = &state->tokSource->skipToken;
            return;
        }
        const LexerMatch match = longestMatch(*holder.table, start, end, holder.deadEnds);
        if (match.rule != kNone16) {
            state->tokenStartCharIndex = reinterpret_cast<ANTLR3_MARKER>(start);
            const LexRuleRow& rule = holder.table->rules[match.rule];
            if (!rule.hidden) ++holder.tokens;
            emit(rule, lexer, static_cast<std::size_t>(match.end - start));
            return;
        }
        dropUnit(lexer);
    }
}

void matchRule(const LexerTable& table, std::uint32_t rule, pANTLR3_LEXER lexer) {
    const char16_t* const start = position(lexer->input);
    const char16_t* match = nullptr;
    try {
        match = longestMatchOf(table, rule, start, endOf(lexer->input));
    } catch (const std::bad_alloc&) {
        // The contexts are C: no exception goes through them.
    }
    if (match != nullptr) return emit(table.rules[rule], lexer, static_cast<std::size_t>(match - start));
    lexer->rec->exConstruct(lexer->rec);
    lexer->rec->state->error = ANTLR3_TRUE;
    lexer->rec->state->failed = ANTLR3_TRUE;
}

}  // namespace zr::engine
