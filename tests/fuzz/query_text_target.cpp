// The functions on raw text, on any text.

#include <string>

#include "tests/analysis/analysed.h"
#include "tests/fuzz/check.h"
#include "tests/fuzz/sql.h"
#include "zrparsersql/query_text.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using zr::fuzz::require;
    const CString text(zr::fuzz::unitsOf(data, size));
    const std::u16string_view whole = text.View();

    const CString part = FindJoinPart(text);
    require(whole.find(part.View()) != whole.npos, "a piece of the text");
    require(part.View().find(u',') == whole.npos, "a piece between commas");

    const int from = FindFromPosition(text);
    require(from >= -1 && from < text.GetLength(), "a place in the text");
    if (from >= 0)
        require(whole.substr(static_cast<std::size_t>(from), 4) == u"FROM", "the place of the word");
    require(whole.find(GetFromClauseText(text).View()) != whole.npos, "a clause of the text");

    const std::string bytes(reinterpret_cast<const char*>(data), size);
    require(Utf8ToWide(bytes.c_str()) == CString::fromUtf8(bytes.c_str()), "the text of the bytes");

    TestDatabase database;
    CZRQueryInfo query;
    query.SetDatabase(&database);
    query.SetSQL(text);
    SplitUnions(text, &query);
    require(query.m_unions.IsEmpty() == (whole.find(u"UNION") == whole.npos),
            "branches where there is a union");
    ResolveKnownSources(&query);
    return 0;
}
