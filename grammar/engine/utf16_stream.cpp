#include "grammar/engine/utf16_stream.h"

#include <algorithm>
#include <cstring>

/// Debian's runtime (3.4) has streams for UTF-16 that join surrogate pairs; this one gives the runtime plain
/// units. It starts from the runtime's own string stream, so that everything not told here is the runtime's.
namespace {

pANTLR3_INPUT_STREAM input(pANTLR3_INT_STREAM is) {
    return static_cast<pANTLR3_INPUT_STREAM>(is->super);
}

const char16_t* at(pANTLR3_INPUT_STREAM in) {
    return static_cast<const char16_t*>(in->nextChar);
}
const char16_t* begin(pANTLR3_INPUT_STREAM in) {
    return static_cast<const char16_t*>(in->data);
}
const char16_t* end(pANTLR3_INPUT_STREAM in) {
    return begin(in) + in->sizeBuf / sizeof(char16_t);
}

void* address(const char16_t* unit) {
    return const_cast<char16_t*>(unit);
}

void consume(pANTLR3_INT_STREAM is) {
    const pANTLR3_INPUT_STREAM in = input(is);
    if (at(in) >= end(in)) return;
    ++in->charPositionInLine;
    const char16_t unit = *at(in);
    in->nextChar = address(at(in) + 1);
    if (unit == static_cast<char16_t>(in->newlineChar)) {
        ++in->line;
        in->charPositionInLine = 0;
        in->currentLine = in->nextChar;
    }
}

ANTLR3_UINT32 lookAhead(pANTLR3_INT_STREAM is, ANTLR3_INT32 offset) {
    const pANTLR3_INPUT_STREAM in = input(is);
    const char16_t* unit = offset > 0 ? at(in) + (offset - 1) : at(in) + offset;
    if (offset == 0 || unit < begin(in) || unit >= end(in)) return ANTLR3_CHARSTREAM_EOF;
    return *unit;
}

void* lookAheadAddress(pANTLR3_INPUT_STREAM in, ANTLR3_INT32 offset) {
    return reinterpret_cast<void*>(static_cast<ANTLR3_MARKER>(lookAhead(in->istream, offset)));
}

ANTLR3_MARKER index(pANTLR3_INT_STREAM is) {
    return reinterpret_cast<ANTLR3_MARKER>(input(is)->nextChar);
}

void seek(pANTLR3_INT_STREAM is, ANTLR3_MARKER to) {
    const pANTLR3_INPUT_STREAM in = input(is);
    const auto* target = std::clamp(reinterpret_cast<const char16_t*>(to), begin(in), end(in));
    if (target <= at(in)) {
        in->nextChar = address(target);
        return;
    }
    while (at(in) < target) consume(is);
}

ANTLR3_UINT32 size(pANTLR3_INPUT_STREAM in) {
    return in->sizeBuf / sizeof(char16_t);
}

/// `start` and `stop` are the addresses of the first and the last unit.
pANTLR3_STRING substr(pANTLR3_INPUT_STREAM in, ANTLR3_MARKER start, ANTLR3_MARKER stop) {
    const auto length = stop < start ? 0 : (stop - start) / sizeof(char16_t) + 1;
    return in->strFactory->newPtr(in->strFactory, reinterpret_cast<pANTLR3_UINT8>(start),
                                  static_cast<ANTLR3_UINT32>(length));
}

constexpr char16_t kNothing[1] = {0};

}  // namespace

pANTLR3_INPUT_STREAM zrNewUtf16InPlaceStream(const char16_t* units, uint32_t length) {
    if (units == nullptr) {
        units = kNothing;
        length = 0;
    }
    static const char name[] = "";
    const pANTLR3_INPUT_STREAM in =
        antlr3StringStreamNew(reinterpret_cast<pANTLR3_UINT8>(const_cast<char16_t*>(units)), ANTLR3_ENC_UTF16,
                              static_cast<ANTLR3_UINT32>(length * sizeof(char16_t)),
                              reinterpret_cast<pANTLR3_UINT8>(const_cast<char*>(name)));
    if (in == nullptr) return nullptr;
    // The runtime skips a byte order mark when it sets up the stream; here every unit is part of the text.
    in->nextChar = address(units);
    in->data = address(units);
    in->sizeBuf = static_cast<ANTLR3_UINT32>(length * sizeof(char16_t));
    in->charByteSize = sizeof(char16_t);
    in->newlineChar = u'\n';
    in->istream->consume = consume;
    in->istream->_LA = lookAhead;
    in->istream->index = index;
    in->istream->seek = seek;
    in->_LT = lookAheadAddress;
    in->size = size;
    in->substr = substr;
    return in;
}
