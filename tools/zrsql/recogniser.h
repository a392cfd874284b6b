#pragma once

#include <antlr3.h>

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string_view>
#include <vector>

namespace zr::tool {

// What the program calls of one grammar's generated interface. The contexts are handed around as what they
// are to the program: something to keep, to pass back and to let go of.
struct Grammar {
    std::shared_ptr<void> (*newLexer)(pANTLR3_INPUT_STREAM input, pANTLR3_TOKEN_SOURCE& source);
    std::shared_ptr<void> (*newParser)(pANTLR3_COMMON_TOKEN_STREAM tokens);
    pANTLR3_BASE_TREE (*runStartRule)(void* parser);
    void (*runQueryRule)(void* parser);  // the start rule's first rule
    const char* (*tokenName)(int type);
};

// Where the reading of a text came to its end.
struct ReadResult {
    std::size_t taken = 0;                     // tokens that the query took
    std::size_t all = 0;                       // tokens of the text
    pANTLR3_COMMON_TOKEN stoppedAt = nullptr;  // the first token not taken; null when all were
};

// One grammar's lexer and parser over one text, which has to outlive it. parse() or readQuery() may be
// called, and once; tree and tokens live as long as the object.
class Recogniser {
 public:
    Recogniser(const Grammar& grammar, std::u16string_view text);

    // The tokens that the parser gets to see, without the end of the text.
    const std::vector<pANTLR3_COMMON_TOKEN>& tokens();

    // The tree of the grammar's start rule.
    pANTLR3_BASE_TREE parse();
    // Runs the start rule's first rule alone and tells how far it came.
    ReadResult readQuery();

    // Place of a token's first unit in the text, from 0.
    std::size_t offset(pANTLR3_COMMON_TOKEN token) const;

 private:
    struct Closer {
        void operator()(pANTLR3_INPUT_STREAM stream) const { stream->close(stream); }
        void operator()(pANTLR3_COMMON_TOKEN_STREAM stream) const { stream->free(stream); }
    };

    void* parser();

    // Freed from the last to the first: a parser refers to its tokens, they to their lexer and the input.
    const Grammar& grammar_;
    std::u16string_view text_;
    std::unique_ptr<ANTLR3_INPUT_STREAM, Closer> input_;
    std::shared_ptr<void> lexer_;
    std::unique_ptr<ANTLR3_COMMON_TOKEN_STREAM, Closer> stream_;
    std::shared_ptr<void> parser_;
    std::vector<pANTLR3_COMMON_TOKEN> tokens_;
};

// A token number as people write it: -1 for the end of the text.
inline std::int32_t tokenNumber(ANTLR3_UINT32 type) {
    return static_cast<std::int32_t>(type);
}

// The units of a string of the runtime, which lives as long as the recogniser that it came from.
std::u16string_view runtimeText(pANTLR3_STRING string);

}  // namespace zr::tool
