#include "platform/message_box.h"

#include <gtest/gtest.h>

#include <string>

namespace {

struct Shown {
    void* owner;
    std::u16string text;
    std::u16string caption;
    unsigned style;
};
Shown shown;

int remember(void* owner, const char16_t* text, const char16_t* caption, unsigned style) {
    shown = {owner, text, caption, style};
    return 7;
}

TEST(MessageBox, GoesToTheHandler) {
    int window = 0;
    const zr::MessageBoxHandler before = zr::setMessageBoxHandler(remember);
    EXPECT_EQ(zr::showMessageBox(&window, u"text", u"caption", 16), 7);
    EXPECT_EQ(shown.owner, &window);
    EXPECT_EQ(shown.text, u"text");
    EXPECT_EQ(shown.caption, u"caption");
    EXPECT_EQ(shown.style, 16u);
    EXPECT_EQ(zr::setMessageBoxHandler(before), remember);
}

#if !defined(_WIN32)
TEST(MessageBox, ShowsNothingWithoutAHandler) {
    const zr::MessageBoxHandler before = zr::setMessageBoxHandler(nullptr);
    EXPECT_EQ(zr::showMessageBox(nullptr, u"", u"", 16), 0);
    zr::setMessageBoxHandler(before);
}
#endif

}  // namespace
