#include "dialects.h"

#include <zrparsersql/recognizers/MSAccessSQL_v3.h>
#include <zrparsersql/recognizers/MSAccessSQL_v3_tokens.h>
#include <zrparsersql/recognizers/MSSQL.h>
#include <zrparsersql/recognizers/MSSQL_tokens.h>
#include <zrparsersql/recognizers/MSSQLfrom.h>
#include <zrparsersql/recognizers/MSSQLfrom_tokens.h>
#include <zrparsersql/recognizers/MySQLSelect.h>
#include <zrparsersql/recognizers/MySQLSelect_tokens.h>
#include <zrparsersql/recognizers/Oracle.h>
#include <zrparsersql/recognizers/Oracle_tokens.h>
#include <zrparsersql/recognizers/PostgreSQL.h>
#include <zrparsersql/recognizers/PostgreSQL_tokens.h>

#include <new>
#include <type_traits>

#include "zrparsersql/query_text.h"

namespace zr::tool {

namespace {

template <class Context>
std::shared_ptr<void> keep(Context* context) {
    if (!context) throw std::bad_alloc();
    return {context, [](void* kept) {
                auto* typed = static_cast<Context*>(kept);
                typed->free(typed);
            }};
}

template <auto NewLexer, auto NewParser, auto StartRule, auto QueryRule, auto TokenName>
constexpr Grammar grammarOf() {
    using Parser = std::remove_pointer_t<decltype(NewParser(nullptr))>;
    return {
        [](pANTLR3_INPUT_STREAM input, pANTLR3_TOKEN_SOURCE& source) {
            auto* lexer = NewLexer(input);
            auto kept = keep(lexer);
            source = lexer->pLexer->rec->state->tokSource;
            return kept;
        },
        [](pANTLR3_COMMON_TOKEN_STREAM tokens) { return keep(NewParser(tokens)); },
        [](void* parser) -> pANTLR3_BASE_TREE {
            auto* typed = static_cast<Parser*>(parser);
            return (typed->*StartRule)(typed).tree;
        },
        [](void* parser) {
            auto* typed = static_cast<Parser*>(parser);
            (typed->*QueryRule)(typed);
        },
        TokenName,
    };
}

#define ZR_GRAMMAR(NAME, QUERY_RULE)                                                                \
    grammarOf<NAME##LexerNew, NAME##ParserNew, &std::remove_pointer_t<p##NAME##Parser>::start_rule, \
              &std::remove_pointer_t<p##NAME##Parser>::QUERY_RULE, NAME##_token_name>()

constexpr Grammar kMssql = ZR_GRAMMAR(MSSQL, all_sql_query);
constexpr Grammar kMssqlfrom = ZR_GRAMMAR(MSSQLfrom, node_from_list);
constexpr Grammar kMysql = ZR_GRAMMAR(MySQLSelect, all_sql_query);
constexpr Grammar kOracle = ZR_GRAMMAR(Oracle, all_sql_query);
constexpr Grammar kPostgresql = ZR_GRAMMAR(PostgreSQL, all_sql_query);
constexpr Grammar kMsAccess = ZR_GRAMMAR(MSAccessSQL_v3, all_sql_query);

#undef ZR_GRAMMAR

CString prepareAccess(const CString& text) {
    return PrepareAccessQueryText(text);
}

constexpr Dialect kDialects[] = {
    {"mssql", &kMssql, DB_MSSQL},
    {"mssqlfrom", &kMssqlfrom, DB_NONE},
    {"mysql", &kMysql, DB_MYSQL},
    {"oracle", &kOracle, DB_ORACLE},
    {"postgresql", &kPostgresql, DB_POSTGRESQL},
    {"msaccess", &kMsAccess, DB_MSACCESS, prepareAccess},
};

}  // namespace

const Dialect* findDialect(std::string_view name) {
    for (const Dialect& dialect : kDialects)
        if (dialect.name == name) return &dialect;
    return nullptr;
}

const Dialect* findDialect(DBTypes kind) {
    if (kind == DB_MSSQL_20) kind = DB_MSSQL;
    for (const Dialect& dialect : kDialects)
        if (kind != DB_NONE && dialect.kind == kind) return &dialect;
    return nullptr;
}

std::string dialectNames(bool withAnalysis) {
    std::string names;
    for (const Dialect& dialect : kDialects) {
        if (withAnalysis && dialect.kind == DB_NONE) continue;
        if (!names.empty()) names += ", ";
        names += dialect.name;
    }
    return names;
}

}  // namespace zr::tool
