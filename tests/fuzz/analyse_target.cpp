// Any text is analysed; the descriptor can be copied, analysed once more and destroyed in any order.

#include <memory>

#include "tests/analysis/analysed.h"
#include "tests/analysis/plain_descriptor.h"
#include "tests/fuzz/check.h"
#include "tests/fuzz/sql.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);

namespace {

DBTypes kindOf(std::string_view grammar) {
    if (grammar == "mssql") return DB_MSSQL;
    if (grammar == "mysql") return DB_MYSQL;
    if (grammar == "oracle") return DB_ORACLE;
    if (grammar == "postgresql") return DB_POSTGRESQL;
    zr::fuzz::require(grammar == "msaccess", "a grammar with an analysis");
    return DB_MSACCESS;
}

// A database in which some of the names that queries have stand for a table.
std::unique_ptr<TestDatabase> database() {
    auto made = std::make_unique<TestDatabase>();
    for (const char16_t* name : {u"t", u"a", u"orders"}) {
        auto* table = new TestTable(name);
        for (const char16_t* field : {u"a", u"b", u"id"}) table->Fields.AddTail(new TestField(field));
        made->Tables.AddTail(table);
    }
    return made;
}

}  // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using zr::fuzz::require;
    const CString text(zr::fuzz::unitsOf(data, size));
    const DBTypes kind = kindOf(zr::fuzz::grammarOfTarget().corpus);

    const std::unique_ptr<TestDatabase> known = database();
    auto query = std::make_unique<CZRQueryInfo>();
    query->SetDatabase(known.get());
    query->SetSQL(text);
    BuildQueryInfo(query.get(), kind);
    const std::string first = plainDescriptor(*query);

    TestDatabase none;
    CZRQueryInfo other;
    other.SetDatabase(&none);
    other.SetSQL(text);
    BuildQueryInfo(&other, kind);

    const std::unique_ptr<CZRQueryInfo> copy(query->Clone());
    require(plainDescriptor(*copy) == first, "a copy says the same");
    BuildQueryInfo(query.get(), kind);
    if (size % 2) query.reset();  // either of the two may go first
    require(plainDescriptor(*copy) == first, "a copy stands by itself");
    return 0;
}
