// The input stream as whoever holds one uses it, through the runtime's own interface.

#include <gtest/gtest.h>
#include <zrparsersql/input_stream.h>

#include <memory>
#include <string>
#include <string_view>

namespace zr::test {
namespace {

struct Close {
    void operator()(pANTLR3_INPUT_STREAM stream) const { stream->close(stream); }
};
using Stream = std::unique_ptr<ANTLR3_INPUT_STREAM, Close>;

Stream open(std::u16string_view text) {
    return Stream(zrNewUtf16InPlaceStream(text.data(), static_cast<std::uint32_t>(text.size())));
}

ANTLR3_UINT32 ahead(const Stream& stream, ANTLR3_INT32 offset) {
    return stream->istream->_LA(stream->istream, offset);
}
void consume(const Stream& stream, int count) {
    for (int i = 0; i < count; ++i) stream->istream->consume(stream->istream);
}
ANTLR3_MARKER index(const Stream& stream) {
    return stream->istream->index(stream->istream);
}
void seek(const Stream& stream, ANTLR3_MARKER to) {
    stream->istream->seek(stream->istream, to);
}

/// The units between two places, as the runtime's string of them has them.
std::u16string substr(const Stream& stream, ANTLR3_MARKER start, ANTLR3_MARKER stop) {
    const pANTLR3_STRING text = stream->substr(stream.get(), start, stop);
    return {reinterpret_cast<const char16_t*>(text->chars), text->len};
}

TEST(Utf16Stream, LooksAheadAndBackWithinTheText) {
    const Stream stream = open(u"abc");
    EXPECT_EQ(stream->size(stream.get()), 3U);
    EXPECT_EQ(ahead(stream, 1), u'a');
    EXPECT_EQ(ahead(stream, 3), u'c');
    EXPECT_EQ(ahead(stream, 4), ANTLR3_CHARSTREAM_EOF);
    EXPECT_EQ(ahead(stream, 0), ANTLR3_CHARSTREAM_EOF);
    EXPECT_EQ(ahead(stream, -1), ANTLR3_CHARSTREAM_EOF);
    consume(stream, 2);
    EXPECT_EQ(ahead(stream, 1), u'c');
    EXPECT_EQ(ahead(stream, -1), u'b');
    EXPECT_EQ(ahead(stream, -2), u'a');
    EXPECT_EQ(ahead(stream, -3), ANTLR3_CHARSTREAM_EOF);
    EXPECT_EQ(reinterpret_cast<ANTLR3_MARKER>(stream->_LT(stream.get(), 1)), ANTLR3_MARKER{u'c'});
}

TEST(Utf16Stream, StaysAtTheEnd) {
    const Stream stream = open(u"a");
    consume(stream, 1);
    const ANTLR3_MARKER end = index(stream);
    consume(stream, 3);
    EXPECT_EQ(index(stream), end);
    EXPECT_EQ(ahead(stream, 1), ANTLR3_CHARSTREAM_EOF);
    EXPECT_EQ(ahead(stream, -1), u'a');
}

TEST(Utf16Stream, CountsLinesAndPlacesInThem) {
    const Stream stream = open(u"ab\n\nc");
    // The runtime itself says where its first line begins, at -1; all others begin at 0.
    const auto begin = static_cast<int>(stream->getCharPositionInLine(stream.get()));
    consume(stream, 2);
    EXPECT_EQ(stream->getLine(stream.get()), 1U);
    EXPECT_EQ(static_cast<int>(stream->getCharPositionInLine(stream.get())), begin + 2);
    consume(stream, 2);
    EXPECT_EQ(stream->getLine(stream.get()), 3U);
    EXPECT_EQ(stream->getCharPositionInLine(stream.get()), 0U);
}

TEST(Utf16Stream, SeeksBothWaysAndNotBeyondTheText) {
    const Stream stream = open(u"ab\ncd");
    const ANTLR3_MARKER start = index(stream);
    seek(stream, start + 4 * sizeof(char16_t));
    EXPECT_EQ(ahead(stream, 1), u'd');
    EXPECT_EQ(stream->getLine(stream.get()), 2U) << "what is passed is counted";
    seek(stream, start + 1 * sizeof(char16_t));
    EXPECT_EQ(ahead(stream, 1), u'b');
    seek(stream, start + 1000);
    EXPECT_EQ(ahead(stream, 1), ANTLR3_CHARSTREAM_EOF);
    EXPECT_EQ(ahead(stream, -1), u'd');
    seek(stream, start - 1000);
    EXPECT_EQ(index(stream), start);
}

TEST(Utf16Stream, ComesBackToAMark) {
    const Stream stream = open(u"abc");
    consume(stream, 1);
    const ANTLR3_MARKER mark = stream->istream->mark(stream->istream);
    consume(stream, 2);
    stream->istream->rewind(stream->istream, mark);
    EXPECT_EQ(ahead(stream, 1), u'b');
}

TEST(Utf16Stream, GivesTheTextBetweenTwoPlaces) {
    const std::u16string text = u"aä\xD83D€";
    const Stream stream = open(text);
    const ANTLR3_MARKER start = index(stream);
    EXPECT_EQ(substr(stream, start, start + 3 * sizeof(char16_t)), text);
    EXPECT_EQ(substr(stream, start + sizeof(char16_t), start + sizeof(char16_t)), u"ä");
    EXPECT_EQ(substr(stream, start + sizeof(char16_t), start), u"");
}

TEST(Utf16Stream, TakesUnitsAsTheyStand) {
    const std::u16string text = u"\xFEFF\xD83D\xDE00\xDC00";
    const Stream stream = open(text);
    for (std::size_t i = 0; i < text.size(); ++i) EXPECT_EQ(ahead(stream, static_cast<int>(i + 1)), text[i]);
}

TEST(Utf16Stream, TakesNullForNoText) {
    const Stream stream(zrNewUtf16InPlaceStream(nullptr, 5));
    EXPECT_EQ(stream->size(stream.get()), 0U);
    EXPECT_EQ(ahead(stream, 1), ANTLR3_CHARSTREAM_EOF);
}

}  // namespace
}  // namespace zr::test
