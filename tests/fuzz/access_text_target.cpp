// Text preparation: every bracketed name of two words grows by the brackets between them, all else stays.

#include <algorithm>

#include "tests/fuzz/check.h"
#include "tests/fuzz/sql.h"
#include "zrparsersql/query_text.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using zr::fuzz::require;
    const CString text(zr::fuzz::unitsOf(data, size));
    std::size_t lines = 0;
    const CString prepared = PrepareAccessQueryText(text, [&lines](const CString&) { ++lines; });
    require(PrepareAccessQueryText(text) == prepared, "tracing changes nothing");
    require(lines % 3 == 1, "three lines a name and one with the result");
    const std::size_t names = lines / 3;
    require(static_cast<std::size_t>(prepared.GetLength()) ==
                static_cast<std::size_t>(text.GetLength()) + 2 * names,
            "two units more for each name");
    std::size_t again = 0;
    require(PrepareAccessQueryText(prepared, [&again](const CString&) { ++again; }) == prepared && again == 1,
            "what is prepared stays as it is");
    return 0;
}
