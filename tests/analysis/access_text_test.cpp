// The preparation of MS Access text: bracketed names with a full stop in them.
#include <gtest/gtest.h>

#include <random>
#include <regex>
#include <string>
#include <vector>

#include "tests/analysis/analysed.h"
#include "tests/parser/small_stack.h"
#include "zrparsersql/diagnostics.h"
#include "zrparsersql/query_text.h"

namespace {

std::u16string prepared(std::u16string_view text) {
    return std::u16string(PrepareAccessQueryText(CString(text)).View());
}

TEST(AccessText, ABracketedTableAndColumnBecomesTwoNames) {
    EXPECT_EQ(prepared(u"SELECT [Orders.Total] FROM Orders"), u"SELECT [Orders].[Total] FROM Orders");
    EXPECT_EQ(prepared(u"[a.b]"), u"[a].[b]");
    EXPECT_EQ(prepared(u"[_1.2_]"), u"[_1].[2_]");
}

TEST(AccessText, TwoFullStopsStay) {
    EXPECT_EQ(prepared(u"[a.b.c]"), u"[a.b.c]");
}

TEST(AccessText, AFullStopWithoutAWordOnEitherSideStays) {
    for (const char16_t* text : {u"[a.]", u"[.b]", u"[.]", u"[a..b]", u"[a]", u"[]", u"[ab"})
        EXPECT_EQ(prepared(text), text);
}

TEST(AccessText, ANameWithAnotherCharacterStays) {
    for (const char16_t* text : {u"[Order Details.Total]", u"[Sum-Of.Total]", u"[a.b c]", u"[a .b]",
                                 u"[a.b ]", u"[a$.b]", u"(a.b)", u"[a,b]"})
        EXPECT_EQ(prepared(text), text);
}

TEST(AccessText, TwoNamesStay) {
    EXPECT_EQ(prepared(u"[a].[b]"), u"[a].[b]");
    EXPECT_EQ(prepared(prepared(u"[a.b]")), u"[a].[b]");
}

TEST(AccessText, StringsAreRewrittenAsWell) {
    EXPECT_EQ(prepared(u"SELECT '[a.b]' FROM t"), u"SELECT '[a].[b]' FROM t");
}

TEST(AccessText, SeveralNamesOnALineAreRewrittenEachInItsPlace) {
    EXPECT_EQ(prepared(u"[a.b]+[c.d]"), u"[a].[b]+[c].[d]");
    EXPECT_EQ(prepared(u"x[a.b][c.d]y[e f][g.h]"), u"x[a].[b][c].[d]y[e f][g].[h]");
}

TEST(AccessText, WorksAcrossLinesAndKeepsTheirEnds) {
    EXPECT_EQ(prepared(u"SELECT [a.b]\r\nFROM [c.d]\n"), u"SELECT [a].[b]\r\nFROM [c].[d]\n");
    EXPECT_EQ(prepared(u"[a.\nb] [a\r.b]"), u"[a.\nb] [a\r.b]");
}

TEST(AccessText, ABracketInFrontOfANameDoesNotHideIt) {
    EXPECT_EQ(prepared(u"[[a.b]]"), u"[[a].[b]]");
    EXPECT_EQ(prepared(u"[x[a.b]"), u"[x[a].[b]");
    EXPECT_EQ(prepared(u"[a.b[c.d]"), u"[a.b[c].[d]");
}

TEST(AccessText, EmptyAndPlainTextComesBackAsItIs) {
    EXPECT_EQ(prepared(u""), u"");
    EXPECT_EQ(prepared(u"SELECT a.b FROM a"), u"SELECT a.b FROM a");
    EXPECT_EQ(PrepareAccessQueryText(CString()).GetLength(), 0);
}

TEST(AccessText, UnitsThatAreNoCharactersStay) {
    const std::u16string text = u"[a\xD800.b] \xDC00 [c.d] \xFFFF";
    EXPECT_EQ(prepared(text), u"[a\xD800.b] \xDC00 [c].[d] \xFFFF");
}

TEST(AccessText, ANameOfAnyLengthNeedsNoMachineStack) {
    const std::u16string word(100'000, u'a');
    onSmallStack([&] { EXPECT_EQ(prepared(u"[" + word + u".b]"), u"[" + word + u"].[b]"); });
    const std::u16string brackets(100'000, u'[');
    EXPECT_EQ(prepared(brackets + u"a.b]"), brackets + u"a].[b]");
}

TEST(AccessText, TheTraceTellsEachNameAndTheResult) {
    std::vector<std::string> lines;
    PrepareAccessQueryText(u"x [a.b] [c.dd]", [&](const CString& line) { lines.push_back(line.toUtf8()); });
    EXPECT_EQ(lines, (std::vector<std::string>{"[a.b]", "2", "3", "[c.dd]", "8", "9",
                                               "Output = x [a].[b] [c].[dd]"}));
    lines.clear();
    PrepareAccessQueryText(u"", [&](const CString& line) { lines.push_back(line.toUtf8()); });
    EXPECT_EQ(lines, std::vector<std::string>{"Output = "});
}

// The same by the expressions themselves, one after the other.
std::wstring byExpressions(const std::wstring& source) {
    static const std::wregex outer(L"\\[([\\w]+\\.[\\w]+)\\]"), prefix(L"([\\w]+)\\."),
        suffix(L"\\.([\\w]+)");
    std::wstring result = source;
    std::size_t offset = 0;
    for (std::wsregex_iterator at(source.begin(), source.end(), outer), end; at != end; ++at) {
        std::wstring inner = (*at)[1].str();
        for (const std::wregex* part : {&prefix, &suffix}) {
            std::wstring rewritten = inner;
            for (std::wsregex_iterator word(inner.begin(), inner.end(), *part); word != end; ++word)
                rewritten.replace(static_cast<std::size_t>(word->position(1)),
                                  static_cast<std::size_t>(word->length(1)), L"[" + (*word)[1].str() + L"]");
            inner = rewritten;
        }
        result.replace(static_cast<std::size_t>(at->position()) + offset,
                       static_cast<std::size_t>(at->length()), inner);
        offset += inner.size() - static_cast<std::size_t>(at->length());
    }
    return result;
}

TEST(AccessText, IsWhatTheExpressionsOfTheStandardLibraryGive) {
    std::mt19937 random(1);
    constexpr std::u16string_view kUnits = u"[].a_\u00e9";
    int rewritten = 0;
    for (int i = 0; i < 20000; ++i) {
        std::u16string text;
        for (std::size_t length = random() % 16; length-- > 0;) text += kUnits[random() % kUnits.size()];
        const std::u16string found = prepared(text);
        ASSERT_EQ(std::wstring(found.begin(), found.end()),
                  byExpressions(std::wstring(text.begin(), text.end())));
        rewritten += found != text;
    }
    EXPECT_GT(rewritten, 50);
}

// ------------------------------------------------------------------------------------------- in the analysis

class Reports {
 public:
    Reports() {
        zrSetDiagnosticFunction(
            [](void* user, const char16_t* text, std::uint32_t length) {
                static_cast<Reports*>(user)->lines.push_back(
                    CString(std::u16string_view(text, length)).toUtf8());
            },
            this);
    }
    Reports(const Reports&) = delete;
    Reports& operator=(const Reports&) = delete;
    ~Reports() { zrSetDiagnosticFunction(nullptr, nullptr); }
    std::vector<std::string> lines;
};

TEST(AccessText, OnlyTheParserSeesThePreparedText) {
    const Analysed a(u"SELECT [Orders.Total] FROM Orders", DB_MSACCESS);
    EXPECT_EQ(a.query.GetSQL().toUtf8(), "SELECT [Orders.Total] FROM Orders");
    const auto& item = dynamic_cast<const SelectItemField&>(*a.query.m_selectItems.GetHead());
    EXPECT_EQ(item.m_sourceTable.toUtf8(), "Orders");
    EXPECT_EQ(item.m_sourceField.toUtf8(), "Total");
}

TEST(AccessText, TheTraceGoesToWhoeverAskedForReports) {
    const Reports reports;
    const Analysed a(u"SELECT [a.b] FROM a", DB_MSACCESS);
    EXPECT_EQ(reports.lines, (std::vector<std::string>{"[a.b]", "7", "8", "Output = SELECT [a].[b] FROM a"}));
}

TEST(AccessText, OtherDialectsHaveNoSuchStep) {
    const Reports reports;
    const Analysed a(u"SELECT a FROM [b.c]", DB_MSSQL);
    for (const std::string& line : reports.lines) EXPECT_EQ(line.find("Output"), std::string::npos) << line;
}

}  // namespace
