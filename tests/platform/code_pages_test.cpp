#include "platform/code_pages.h"

#include <gtest/gtest.h>

#include <thread>
#include <vector>

namespace {

struct Sample {
    int encoding;
    unsigned char byte;
    char16_t codePoint;
};

TEST(CodePages, HoldTheNamedTables) {
    const Sample samples[] = {
        {3, 0xA1, u'Ą'},  {4, 0xFD, u'ı'},  {5, 0xA8, u'Ø'},  {8, 0x8A, u'Š'},    {9, 0x80, u'Ђ'},
        {10, 0xC7, u'ا'}, {11, 0xE0, u'ą'}, {12, 0x81, u'ü'}, {13, 0x85, u'ů'},   {14, 0x80, u'А'},
        {17, 0xE1, u'α'}, {18, 0xE0, u'א'}, {19, 0xC8, u'à'}, {21, 0xC1, u'а'},   {22, 0xC1, u'а'},
        {23, 0x84, u'Ą'}, {24, 0x80, u'Ä'}, {26, 0xA1, u'ก'}, {1001, 0xE4, u'ä'}, {0, 0xE4, u'ä'},
        {-5, 0xE4, u'ä'},
    };
    for (const Sample& sample : samples) {
        EXPECT_EQ(zr::codeTable(sample.encoding)[sample.byte], sample.codePoint) << sample.encoding;
        EXPECT_EQ(zr::reverseCodeTable(sample.encoding)[sample.codePoint], sample.byte) << sample.encoding;
    }
}

TEST(CodePages, KeepAsciiInEveryTable) {
    for (int encoding = 3; encoding <= 27; ++encoding)
        for (unsigned byte = 0; byte < 128; ++byte)
            EXPECT_EQ(zr::codeTable(encoding)[byte], byte) << encoding;
}

TEST(CodePages, ReverseEveryCodePointOfATable) {
    for (int encoding = 3; encoding <= 27; ++encoding) {
        const zr::CodeTable& table = zr::codeTable(encoding);
        const zr::ReverseCodeTable& reverse = zr::reverseCodeTable(encoding);
        for (unsigned byte = 1; byte < 256; ++byte) {
            if (table[byte]) {
                EXPECT_EQ(table[reverse[table[byte]]], table[byte]) << encoding;
            }
        }
    }
}

TEST(CodePages, MarkCodePointsWithoutAByte) {
    EXPECT_EQ(zr::reverseCodeTable(9)[u'€'], 0x88);
    EXPECT_EQ(zr::reverseCodeTable(3)[u'€'], '?');
    EXPECT_EQ(zr::reverseCodeTable(7)[u'ä'], '?');
    EXPECT_EQ(zr::reverseCodeTable(3)[0], '?');
}

TEST(CodePages, HaveNoCodePointForSomeBytes) {
    EXPECT_EQ(zr::codeTable(7)[0x80], 0);
    EXPECT_EQ(zr::codeTable(17)[0xFF], 0);
}

TEST(CodePages, ServeManyThreadsAtOnce) {
    std::vector<std::thread> threads;
    for (int thread = 0; thread < 8; ++thread)
        threads.emplace_back([] {
            for (int encoding = 3; encoding <= 27; ++encoding)
                ASSERT_EQ(zr::reverseCodeTable(encoding)[u'x'], 'x');
        });
    for (std::thread& thread : threads) thread.join();
}

TEST(CodePages, SystemEncodingHoldsAscii) {
    EXPECT_EQ(zr::utf16ToSystem(u"abc 123"), "abc 123");
    EXPECT_EQ(zr::systemToUtf16("abc 123"), u"abc 123");
    EXPECT_EQ(zr::systemToUtf16(""), u"");
}

}  // namespace
