#include "platform/message_box.h"

#include <gtest/gtest.h>

#include <string>

namespace {

struct Shown {
    void* owner;
    std::u16string text;
    std::u16string caption;
    std::uint32_t style;
};
Shown shown;

int remember(void* owner, const char16_t* text, const char16_t* caption, std::uint32_t style) {
    shown = {owner, text, caption, style};
    return 7;
}

TEST(MessageBox, GoesToTheFunctionThatIsSet) {
    int window = 0;
    const ZRMessageBoxFunction before = zr::exchangeMessageBox(remember);
    EXPECT_EQ(zr::showMessageBox(&window, u"text", u"caption", 16), 7);
    EXPECT_EQ(shown.owner, &window);
    EXPECT_EQ(shown.text, u"text");
    EXPECT_EQ(shown.caption, u"caption");
    EXPECT_EQ(shown.style, 16u);
    EXPECT_EQ(zr::exchangeMessageBox(before), remember);
}

#if !defined(_WIN32)
TEST(MessageBox, ShowsNothingWithoutAFunction) {
    const ZRMessageBoxFunction before = zr::exchangeMessageBox(nullptr);
    EXPECT_EQ(zr::showMessageBox(nullptr, u"", u"", 16), 0);
    zr::exchangeMessageBox(before);
}
#endif

}  // namespace
