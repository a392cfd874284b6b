#include "platform/guid.h"

#include <gtest/gtest.h>

#include <set>

#include "tests/platform/print_string.h"

namespace {

TEST(Guid, IsABracedTextOf38Units) {
    CString text;
    ASSERT_EQ(zr::createGuidText(text), 0);
    ASSERT_EQ(text.GetLength(), 38);
    for (int at = 0; at < 38; ++at) {
        const char16_t unit = text[at];
        if (at == 0)
            EXPECT_EQ(unit, u'{');
        else if (at == 37)
            EXPECT_EQ(unit, u'}');
        else if (at == 9 || at == 14 || at == 19 || at == 24)
            EXPECT_EQ(unit, u'-');
        else
            EXPECT_TRUE((unit >= u'0' && unit <= u'9') || (unit >= u'A' && unit <= u'F')) << at;
    }
}

TEST(Guid, IsNewEachTime) {
    std::set<CString> texts;
    for (int round = 0; round < 1000; ++round) {
        CString text;
        zr::createGuidText(text);
        texts.insert(text);
    }
    EXPECT_EQ(texts.size(), 1000u);
}

}  // namespace
