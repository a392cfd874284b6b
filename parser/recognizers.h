#pragma once

#include <antlr3.h>
#include <zrparsersql/recognizers/MSAccessSQL_v3.h>
#include <zrparsersql/recognizers/MSSQL.h>
#include <zrparsersql/recognizers/MySQLSelect.h>
#include <zrparsersql/recognizers/Oracle.h>
#include <zrparsersql/recognizers/PostgreSQL.h>

#include <type_traits>

namespace zr {

// The recognisers of one grammar as the pipeline calls them.
template <auto LexerNewSSD, auto ParserNewSSD, auto StartRule>
struct Recognizers {
    using Lexer =
        std::invoke_result_t<decltype(LexerNewSSD), pANTLR3_INPUT_STREAM, pANTLR3_RECOGNIZER_SHARED_STATE>;
    using Parser = std::invoke_result_t<decltype(ParserNewSSD), pANTLR3_COMMON_TOKEN_STREAM,
                                        pANTLR3_RECOGNIZER_SHARED_STATE>;

    static Lexer newLexer(pANTLR3_INPUT_STREAM input) { return LexerNewSSD(input, nullptr); }
    static Parser newParser(pANTLR3_COMMON_TOKEN_STREAM tokens) { return ParserNewSSD(tokens, nullptr); }
    static ZRRuleReturn run(Parser parser) { return (parser->*StartRule)(parser); }
};

// The grammar of each facade.
using MssqlRecognizers =
    Recognizers<MSSQLLexerNewSSD, MSSQLParserNewSSD, &MSSQLParser_Ctx_struct::start_rule>;
using MySqlRecognizers =
    Recognizers<MySQLSelectLexerNewSSD, MySQLSelectParserNewSSD, &MySQLSelectParser_Ctx_struct::start_rule>;
using OracleRecognizers =
    Recognizers<OracleLexerNewSSD, OracleParserNewSSD, &OracleParser_Ctx_struct::start_rule>;
using PostgreSqlRecognizers =
    Recognizers<PostgreSQLLexerNewSSD, PostgreSQLParserNewSSD, &PostgreSQLParser_Ctx_struct::start_rule>;
using MsAccessRecognizers = Recognizers<MSAccessSQL_v3LexerNewSSD, MSAccessSQL_v3ParserNewSSD,
                                        &MSAccessSQL_v3Parser_Ctx_struct::start_rule>;

}  // namespace zr
