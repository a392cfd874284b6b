#include "recogniser.h"

#include <algorithm>
#include <new>

#include "zrparsersql/input_stream.h"

namespace zr::tool {

namespace {

constexpr ANTLR3_UINT32 kSizeHint = 1025;

template <class Pointer>
Pointer made(Pointer pointer) {
    if (!pointer) throw std::bad_alloc();
    return pointer;
}

bool isVisible(const ANTLR3_COMMON_TOKEN& token) {
    return token.channel == ANTLR3_TOKEN_DEFAULT_CHANNEL && token.type != ANTLR3_TOKEN_EOF;
}

}  // namespace

Recogniser::Recogniser(const Grammar& grammar, std::u16string_view text)
    : grammar_(grammar),
      text_(text),
      input_(made(zrNewUtf16InPlaceStream(text.data(), static_cast<std::uint32_t>(text.size())))) {
    pANTLR3_TOKEN_SOURCE source = nullptr;
    lexer_ = grammar_.newLexer(input_.get(), source);
    stream_.reset(made(antlr3CommonTokenStreamSourceNew(kSizeHint, source)));
}

const std::vector<pANTLR3_COMMON_TOKEN>& Recogniser::tokens() {
    stream_->tstream->_LT(stream_->tstream, 1);  // the runtime fills its list when first asked for a token
    if (tokens_.empty()) {
        const pANTLR3_VECTOR list = stream_->tokens;
        for (ANTLR3_UINT32 at = 0; at < list->count; ++at) {
            auto* token = static_cast<pANTLR3_COMMON_TOKEN>(list->elements[at].element);
            if (isVisible(*token)) tokens_.push_back(token);
        }
    }
    return tokens_;
}

void* Recogniser::parser() {
    if (!parser_) parser_ = grammar_.newParser(stream_.get());
    return parser_.get();
}

pANTLR3_BASE_TREE Recogniser::parse() {
    return grammar_.runStartRule(parser());
}

ReadResult Recogniser::readQuery() {
    grammar_.runQueryRule(parser());
    const ANTLR3_MARKER stop = stream_->tstream->istream->index(stream_->tstream->istream);
    const auto& all = tokens();
    const auto firstLeft = std::partition_point(
        all.begin(), all.end(), [stop](pANTLR3_COMMON_TOKEN token) { return token->index < stop; });
    ReadResult result;
    result.taken = static_cast<std::size_t>(firstLeft - all.begin());
    result.all = all.size();
    result.stoppedAt = firstLeft == all.end() ? nullptr : *firstLeft;
    return result;
}

std::size_t Recogniser::offset(pANTLR3_COMMON_TOKEN token) const {
    // The runtime's places in an in-place stream are addresses.
    const auto start = reinterpret_cast<ANTLR3_MARKER>(text_.data());
    return static_cast<std::size_t>(token->start - start) / sizeof(char16_t);
}

std::u16string_view runtimeText(pANTLR3_STRING string) {
    // All strings come from factories over the UTF-16 input. Their encoding member says 8 bit all the same,
    // so it can't be asked.
    if (!string || string->len == 0) return {};
    return {reinterpret_cast<const char16_t*>(string->chars), string->len};
}

}  // namespace zr::tool
