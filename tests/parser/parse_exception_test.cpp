#include "zrparsersql/parse_exception.h"

#include <gtest/gtest.h>
#include <zrparsersql/diagnostics.h>

#include <string>

namespace {

TEST(ParseSqlException, MadeFromANumberHasCodeMinusOne) {
    CZRParseSQLException exception(7);
    EXPECT_EQ(exception.GetErrCode(), -1);
    EXPECT_EQ(exception.GetErrNumber(), 7);
    EXPECT_EQ(exception.GetErrString(), u"");
    EXPECT_EQ(exception.GetErrMessage(), u"");
}

TEST(ParseSqlException, MadeFromTextAndCodeHasNumberZero) {
    CZRParseSQLException exception(u"x", 3);
    EXPECT_EQ(exception.GetErrCode(), 3);
    EXPECT_EQ(exception.GetErrNumber(), 0);
    EXPECT_EQ(exception.GetErrString(), u"x");
    EXPECT_EQ(exception.GetErrMessage(), u"");
}

TEST(ParseSqlException, MadeFromNothingTakesAllByAssignment) {
    CZRParseSQLException target;
    EXPECT_EQ(target.GetErrString(), u"");
    CZRParseSQLException source(u"x", 3);
    EXPECT_EQ(&(target = source), &target);
    EXPECT_EQ(target.GetErrCode(), 3);
    EXPECT_EQ(target.GetErrNumber(), 0);
    EXPECT_EQ(target.GetErrString(), u"x");
}

TEST(ParseSqlException, CopiesAllThree) {
    CZRParseSQLException source(u"x", 3);
    CZRParseSQLException copy(source);
    EXPECT_EQ(copy.GetErrCode(), 3);
    EXPECT_EQ(copy.GetErrNumber(), 0);
    EXPECT_EQ(copy.GetErrString(), u"x");
}

TEST(ParseSqlException, IsThrownAndCaughtAsItsBase) {
    try {
        throw CZRParseSQLException(7);
    } catch (CZRException& exception) {
        EXPECT_EQ(exception.GetErrNumber(), 7);
        return;
    }
    FAIL();
}

struct Box {
    void* owner = nullptr;
    std::u16string text = u"unset", caption = u"unset";
    std::uint32_t style = 0;
    int shown = 0;
};
Box box;

TEST(ParseSqlException, ShowsABlankErrorBoxWhateverItHolds) {
    box = Box();
    const ZRMessageBoxFunction before = zrSetMessageBoxFunction(
        [](void* owner, const char16_t* text, const char16_t* caption, std::uint32_t style) {
            box = {owner, text, caption, style, box.shown + 1};
            return 1;
        });
    int window = 0;
    CZRParseSQLException(u"x", 3).DoMessageBox(reinterpret_cast<HWND>(&window));
    zrSetMessageBoxFunction(before);
    EXPECT_EQ(box.shown, 1);
    EXPECT_EQ(box.owner, &window);
    EXPECT_EQ(box.text, u"");
    EXPECT_EQ(box.caption, u"");
    EXPECT_EQ(box.style, 16u);
}

}  // namespace
