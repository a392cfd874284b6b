#include "json_line.h"

#include <gtest/gtest.h>

namespace zr::tool {
namespace {

TEST(JsonLine, GivesIdAndText) {
    const JsonLine line = readJsonLine(R"({"id": "q-1", "sql": "SELECT 1"})");
    EXPECT_EQ(line.id, R"("q-1")");
    EXPECT_EQ(line.sql, u"SELECT 1");
    EXPECT_EQ(line.error, "");
}

TEST(JsonLine, PassesOverOtherMembersInAnyOrder) {
    const JsonLine line = readJsonLine(
        R"( { "source" : {"a":[1,{"b":null}],"c":{}}, "sql" : "x" , "more":[[],[true]], "id":7 } )");
    EXPECT_EQ(line.id, "7");
    EXPECT_EQ(line.sql, u"x");
}

TEST(JsonLine, KeepsAnIdOfAnyKindWithoutBlanks) {
    EXPECT_EQ(readJsonLine(R"({"sql":"","id":[ 1.50, -2e+3, {"a" : "é"}, [ ], { } ]})").id,
              R"([1.50,-2e+3,{"a":"\u00e9"},[],{}])");
    EXPECT_EQ(readJsonLine(R"({"sql":"","id":true})").id, "true");
}

TEST(JsonLine, WithoutAnIdTheIdIsNull) {
    EXPECT_EQ(readJsonLine(R"({"sql":"x"})").id, "null");
}

TEST(JsonLine, ReadsAllEscapes) {
    EXPECT_EQ(readJsonLine(R"({"sql":"\"\\\/\b\f\n\r\t\u00E9"})").sql, u"\"\\/\b\f\n\r\té");
}

TEST(JsonLine, ReadsUtf8AndSurrogatePairs) {
    EXPECT_EQ(readJsonLine("{\"sql\":\"\xC3\xA9 \xF0\x9F\x98\x80 \\ud83d\\ude00\"}").sql,
              u"é \U0001F600 \U0001F600");
}

TEST(JsonLine, TakesUnpairedSurrogates) {
    const std::u16string expected = {u'a', 0xD800, u'b', 0xDC00};
    EXPECT_EQ(readJsonLine(R"({"sql":"a\ud800b\uDC00"})").sql, expected);
}

TEST(JsonLine, PassesOverAByteOrderMarkAndACarriageReturn) {
    EXPECT_EQ(readJsonLine("\xEF\xBB\xBF{\"sql\":\"x\"}\r").sql, u"x");
}

TEST(JsonLine, KeepsTheIdOfAnObjectWithoutText) {
    for (const char* text : {R"({"id":3})", R"({"id":3,"sql":4})", R"({"id":3,"sql":"x","sql":null})"}) {
        const JsonLine line = readJsonLine(text);
        EXPECT_EQ(line.id, "3") << text;
        EXPECT_FALSE(line.sql) << text;
        EXPECT_NE(line.error, "") << text;
    }
}

TEST(JsonLine, OfAMemberThatStandsTwiceTheLastCounts) {
    EXPECT_EQ(readJsonLine(R"({"sql":"a","sql":"b","id":1,"id":2})").sql, u"b");
    EXPECT_EQ(readJsonLine(R"({"sql":"a","sql":"b","id":1,"id":2})").id, "2");
}

class NoJsonLine : public testing::TestWithParam<const char*> {};

TEST_P(NoJsonLine, HasTheIdNullAndAnError) {
    const JsonLine line = readJsonLine(GetParam());
    EXPECT_EQ(line.id, "null");
    EXPECT_FALSE(line.sql);
    EXPECT_EQ(line.error.substr(0, 9), "no JSON: ");
}

INSTANTIATE_TEST_SUITE_P(Lines, NoJsonLine,
                         testing::Values("", " ", "x", "[]", "7", "\"a\"", "{", "{\"id\":1", "{\"id\":1,}",
                                         "{\"id\" 1}", "{\"id\":1} x", "{\"id\":[1,]}", "{\"id\":[1}",
                                         "{\"id\":{1:2}}", "{\"id\":01}", "{\"id\":1.}", "{\"id\":-}",
                                         "{\"id\":1e}", "{\"id\":nul}", "{\"sql\":\"a", "{\"sql\":\"a\\",
                                         "{\"sql\":\"\\x\"}", "{\"sql\":\"\\u12g4\"}", "{\"sql\":\"\\u12",
                                         "{\"sql\":\"a\tb\"}", "{\"id\":}", "{,}", "{\"a\":1 \"b\":2}"));

TEST(JsonLine, TakesValuesOfAnyDepth) {
    const std::string open(100000, '['), close(100000, ']');
    const JsonLine line = readJsonLine("{\"id\":" + open + close + ",\"sql\":\"x\"}");
    EXPECT_EQ(line.id, open + close);
    EXPECT_EQ(line.sql, u"x");
}

}  // namespace
}  // namespace zr::tool
