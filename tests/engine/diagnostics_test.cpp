// Where the reports of lexer and parser go, and that nothing depends on whether somebody listens.

#include <gtest/gtest.h>
#include <zrparsersql/diagnostics.h>

#include <string>
#include <vector>

#include "tests/engine/contexts.h"

namespace zr::test {
namespace {

using Reports = std::vector<std::u16string>;

void keep(void* user, const char16_t* text, std::uint32_t length) {
    static_cast<Reports*>(user)->emplace_back(text, length);
}

class Diagnostics : public testing::Test {
 protected:
    ~Diagnostics() override { zrSetDiagnosticFunction(nullptr, nullptr); }

    struct Counts {
        std::uint32_t lexer, parser;
        bool operator==(const Counts&) const = default;
    };
    static Counts read(std::u16string_view text) {
        Contexts c(text);
        c.start();
        return {c.lexerErrors(), c.parserErrors()};
    }

    /// What lands on both standard streams while `text` is read.
    static std::string printed(std::u16string_view text) {
        testing::internal::CaptureStderr();
        testing::internal::CaptureStdout();
        read(text);
        return testing::internal::GetCapturedStdout() + testing::internal::GetCapturedStderr();
    }

    static Reports reportsOf(std::u16string_view text) {
        Reports reports;
        zrSetDiagnosticFunction(&keep, &reports);
        read(text);
        zrSetDiagnosticFunction(nullptr, nullptr);
        return reports;
    }
};

constexpr std::u16string_view kWrong = u"SELECT FROM t ;";

TEST_F(Diagnostics, NothingIsPrintedByDefault) {
    EXPECT_EQ(printed(kWrong), "");
    EXPECT_EQ(printed(u"hello"), "");
}

TEST_F(Diagnostics, EveryDroppedCharacterIsReportedWithItsPlace) {
    EXPECT_EQ(reportsOf(u"SELECT\n;a:"), (Reports{reportsOf(u"SELECT\n")[0], u"2:0: no token starts with ';'",
                                                  u"2:2: no token starts with ':'"}));
}

TEST_F(Diagnostics, PlacesOnTheFirstLineCountFromZeroToo) {
    // The runtime counts the first line from -1 and every other one from 0.
    EXPECT_EQ(reportsOf(u";")[0], u"1:0: no token starts with ';'");
    EXPECT_EQ(reportsOf(u"hello"), (Reports{u"1:0: no way to read on at 'hello'"}));
}

TEST_F(Diagnostics, ATextWithoutAStatementIsReportedWithItsFirstToken) {
    const Reports reports = reportsOf(u"\nhello");
    ASSERT_EQ(reports.size(), 2U);
    EXPECT_EQ(reports[1], u"2:0: no way to read on at 'hello'");
}

TEST_F(Diagnostics, AnEmptyTextIsReportedAtItsEnd) {
    const Reports reports = reportsOf(u"");
    ASSERT_EQ(reports.size(), 1U);
    EXPECT_TRUE(reports[0].ends_with(u": no way to read on at the end of the text"));
}

TEST_F(Diagnostics, ASelectListThatDoesNotParseIsReportedWhereItShouldStart) {
    const Reports reports = reportsOf(u"\nSELECT,FROM\nt");
    ASSERT_EQ(reports.size(), 3U);
    EXPECT_EQ(reports[2], u"2:6: no way to read on at ','");
}

TEST_F(Diagnostics, AQueryThatIsReadReportsNothingOfTheParser) {
    EXPECT_EQ(reportsOf(u"SELECT(a)FROM(t)").size(), 0U);
}

TEST_F(Diagnostics, ThereAreAsManyReportsAsCountedErrors) {
    for (const std::u16string_view text :
         {kWrong, std::u16string_view(u"hello \u00e4"), std::u16string_view(u"")}) {
        const Counts counts = read(text);
        EXPECT_EQ(reportsOf(text).size(), counts.lexer + counts.parser);
        EXPECT_GT(counts.parser, 0U);
    }
}

TEST_F(Diagnostics, ErrorsAreCountedTheSameWhetherSomebodyListensOrNot) {
    for (const std::u16string_view text :
         {kWrong, std::u16string_view(u"hello"), std::u16string_view(u" ; ")}) {
        const Counts silent = read(text);
        Reports reports;
        zrSetDiagnosticFunction(&keep, &reports);
        EXPECT_EQ(read(text), silent);
        EXPECT_FALSE(reports.empty());
        zrSetDiagnosticFunction(nullptr, nullptr);
        EXPECT_EQ(read(text), silent);
    }
}

TEST_F(Diagnostics, StandardErrorGetsOneLineOfUtf8AReport) {
    zrDiagnosticsToStandardError(1);
    const std::string lines = printed(u"\n\u00e4\u20ac");
    EXPECT_NE(lines.find("\n2:0: no token starts with '\xc3\xa4'\n"
                         "2:1: no token starts with '\xe2\x82\xac'\n"
                         "2:0: no way to read on at the end of the text\n"),
              std::string::npos)
        << lines;
    zrDiagnosticsToStandardError(0);
    EXPECT_EQ(printed(u"\u00e4"), "");
}

TEST_F(Diagnostics, HalfOfASurrogatePairIsPrintedAsTheReplacementCharacter) {
    zrDiagnosticsToStandardError(1);
    EXPECT_NE(printed(std::u16string(1, char16_t{0xD83D})).find("'\xef\xbf\xbd'"), std::string::npos);
}

TEST_F(Diagnostics, TheSwitchForStandardErrorReplacesAFunction) {
    Reports reports;
    zrSetDiagnosticFunction(&keep, &reports);
    zrDiagnosticsToStandardError(1);
    EXPECT_NE(printed(u"hello"), "");
    EXPECT_TRUE(reports.empty());
    zrSetDiagnosticFunction(&keep, &reports);
    EXPECT_EQ(printed(u"hello"), "");
    EXPECT_EQ(reports.size(), 1U);
}

}  // namespace
}  // namespace zr::test
