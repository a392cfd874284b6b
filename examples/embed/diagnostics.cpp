// Collects what the library would otherwise keep to itself: the places of a text that could not be read.
// Wrong SQL is no failure; what could be read of it stands in the descriptor.
#include <zrparsersql/analysis.h>
#include <zrparsersql/diagnostics.h>
#include <zrparsersql/query_info.h>

#include <cstdio>
#include <string_view>
#include <vector>

int main() {
    std::vector<CString> reports;
    zrSetDiagnosticFunction(
        [](void* user, const char16_t* text, std::uint32_t length) {
            static_cast<std::vector<CString>*>(user)->emplace_back(std::u16string_view(text, length));
        },
        &reports);

    CZRQueryInfo query;
    query.SetSQL(u"SELECT FROM orders WHERE price = ?");
    BuildQueryInfo(&query, DB_ORACLE);
    zrSetDiagnosticFunction(nullptr,
                            nullptr);  // reports goes out of scope: nothing may be sent there any more

    std::printf("%d columns, %d sources\n", query.m_selectItems.GetCount(), query.m_sourceTables.GetCount());
    for (const CString& report : reports) std::printf("%s\n", report.toUtf8().c_str());
}
