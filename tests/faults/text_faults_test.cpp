// Text between encodings with each allocation failing in turn, ICU's own as well: the whole text or an
// exception, and the whole text once there is memory again.
#include <gtest/gtest.h>

#include <clocale>
#include <new>
#include <optional>
#include <string>

#include "platform/code_pages.h"
#include "tests/faults/failing_heap.h"
#include "tests/faults/icu_heap.h"

namespace zr::faults {
namespace {

/// Runs a step with each allocation failing. A step gives a text; `expected` is what it is when nothing
/// fails.
template <class Text, class Step>
long failEachOf(const Text& expected, Step step) {
    return failEach([&](long successes) {
        EXPECT_TRUE(restartIcu());
        std::optional<Text> outcome;
        bool happened = false;
        {
            const Failure failing(successes);
            try {
                outcome = step();
            } catch (const std::bad_alloc&) {
            }
            happened = failing.happened();
        }
        if (outcome) {
            EXPECT_EQ(*outcome, expected) << successes;
        }
        if (!happened) {
            EXPECT_TRUE(outcome);
        }
        return happened && !testing::Test::HasFailure();
    });
}

class ExhaustedText : public testing::Test {
 protected:
    void TearDown() override { EXPECT_TRUE(restartIcu()); }
};

TEST_F(ExhaustedText, FromTheSystemsEncodingIsWholeOrThrows) {
    const std::string bytes(200, 'a');
    EXPECT_GT(failEachOf(std::u16string(200, u'a'), [&] { return systemToUtf16(bytes); }), 1);
}

TEST_F(ExhaustedText, ToTheSystemsEncodingIsWholeOrThrows) {
    const std::u16string units(200, u'a');
    EXPECT_GT(failEachOf(std::string(200, 'a'), [&] { return utf16ToSystem(units); }), 1);
}

struct Letter {
    int encoding;
    unsigned char byte;
    char16_t codePoint;
};

class ExhaustedTable : public testing::TestWithParam<Letter> {
 protected:
    void TearDown() override { EXPECT_TRUE(restartIcu()); }
};

// A table that was made without memory would stay wrong for the process's life.
TEST_P(ExhaustedTable, IsWholeOrMadeAnewLater) {
    const auto [encoding, byte, codePoint] = GetParam();
    EXPECT_GT(
        failEachOf(static_cast<char>(byte),
                   [&, c = codePoint, e = encoding] { return static_cast<char>(reverseCodeTable(e)[c]); }),
        1);
    EXPECT_EQ(codeTable(encoding)[byte], codePoint);
}

// ICU may remember for good that it couldn't open its data.
TEST_F(ExhaustedText, IsNeverWrongWhereICUStaysWithoutItsData) {
    EXPECT_TRUE(restartIcu());
    bool happened = false;
    {
        const Failure failing(0);
        EXPECT_THROW(codeTable(8), std::bad_alloc);
        happened = failing.happened();
    }
    EXPECT_TRUE(happened);
    EXPECT_THROW(codeTable(8), std::bad_alloc);
    EXPECT_TRUE(restartIcu());
    EXPECT_EQ(codeTable(8)[0x8A], u'Š');
}

INSTANTIATE_TEST_SUITE_P(Encodings, ExhaustedTable,
                         testing::Values(Letter{3, 0xA1, u'Ą'}, Letter{9, 0x80, u'Ђ'}, Letter{17, 0xE1, u'α'},
                                         Letter{23, 0x84, u'Ą'}, Letter{26, 0xA1, u'ก'}),
                         [](const auto& letter) { return "Number" + std::to_string(letter.param.encoding); });

}  // namespace
}  // namespace zr::faults
