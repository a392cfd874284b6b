// Uses every part of an installed package once, the way a host does, and writes what it found.
#include <zrparsersql/analysis.h>
#include <zrparsersql/database_info.h>
#include <zrparsersql/diagnostics.h>
#include <zrparsersql/input_stream.h>
#include <zrparsersql/parse_exception.h>
#include <zrparsersql/query_info.h>
#include <zrparsersql/recognizers/MSSQLfrom.h>
#include <zrparsersql/sql_parsers.h>
#include <zrparsersql/table_info.h>

#include <cstdio>
#include <memory>
#include <string_view>

namespace {

class HostTable : public CZRTableInfo {
 public:
    explicit HostTable(const CString& name) {
        SetName(name);
        SetSrcName(name);
    }
    HostTable(const HostTable& other, int selectedOnly) : CZRTableInfo(other, selectedOnly) {}
    HostTable* Clone(int selectedOnly = 0) const override { return new HostTable(*this, selectedOnly); }
};

class HostDatabase : public CZRDatabaseInfo {
 public:
    HostDatabase() = default;
    HostDatabase(const HostDatabase& other, int selectedOnly) : CZRDatabaseInfo(other, selectedOnly) {}
    HostDatabase* Clone(int selectedOnly = 0) const override { return new HostDatabase(*this, selectedOnly); }
};

class HostError : public CZRParseSQLException {
 public:
    using CZRParseSQLException::CZRParseSQLException;
};

void tree() {
    CString text = u"SELECT a FROM t";
    std::unique_ptr<CZRSQLParser> parser(new CZRMSSQLParser);
    auto& facade = dynamic_cast<CZRMSSQLParser&>(*parser);
    facade.SetSQL(text);
    facade.ParseSQL();
    CZRSQLTree* root = nullptr;
    facade.GetSQLTree(&root);
    std::printf("tree: %s with %u parts\n", root->GetText().toUtf8().c_str(), root->GetChildCount());
    delete root;
}

void analysis() {
    HostDatabase database;
    auto* table = new HostTable(u"orders");
    database.Tables.AddTail(table);
    table->SetDatabase(&database);

    CZRQueryInfo query;
    query.SetDatabase(&database);
    query.SetSQL(u"SELECT id, dbo.f(price) AS cost FROM orders");
    BuildQueryInfo(&query, DB_MSSQL);
    for (const SelectItem* item : query.m_selectItems)
        if (const auto* field = dynamic_cast<const SelectItemField*>(item))
            std::printf("column: %s\n", field->m_sourceField.toUtf8().c_str());
        else
            std::printf("item: %s\n", item->m_name.toUtf8().c_str());
    for (const auto& source : query.m_sourceTables)
        std::printf("source: %s is %s\n", source.key.toUtf8().c_str(),
                    source.value == table->GetID() ? "a table of the host" : "unknown");
    std::printf("user functions: %d\n", database.UserFunctions.GetCount());
}

void exception() {
    zrSetMessageBoxFunction([](void*, const char16_t*, const char16_t*, std::uint32_t style) {
        return std::printf("box of style %u\n", static_cast<unsigned>(style));
    });
    try {
        throw HostError(u"no such query", 3);
    } catch (CZRException& error) {
        error.DoMessageBox(nullptr);
        std::printf("error %d: %s\n", error.GetErrCode(), error.GetErrString().toUtf8().c_str());
    }
    zrSetMessageBoxFunction(nullptr);
}

void recognisers() {
    int reports = 0;
    zrSetDiagnosticFunction([](void* user, const char16_t*, std::uint32_t) { ++*static_cast<int*>(user); },
                            &reports);
    constexpr std::u16string_view text = u"a JOIN b";
    pANTLR3_INPUT_STREAM input =
        zrNewUtf16InPlaceStream(text.data(), static_cast<std::uint32_t>(text.size()));
    pMSSQLfromLexer lexer = MSSQLfromLexerNew(input);
    pANTLR3_COMMON_TOKEN_STREAM tokens =
        antlr3CommonTokenStreamSourceNew(ANTLR3_SIZE_HINT, lexer->pLexer->rec->state->tokSource);
    pMSSQLfromParser parser = MSSQLfromParserNew(tokens);
    pANTLR3_BASE_TREE list = parser->start_rule(parser).tree;
    std::printf("list: %s, %d reports\n", MSSQLfrom_token_name(static_cast<int>(list->getType(list))),
                reports);
    parser->free(parser);
    tokens->free(tokens);
    lexer->free(lexer);
    input->close(input);
    zrSetDiagnosticFunction(nullptr, nullptr);
}

}  // namespace

int main() {
    tree();
    analysis();
    exception();
    recognisers();
}
