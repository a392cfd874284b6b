#include "analysis/mssql_state.h"

#include <zrparsersql/recognizers/MSSQL_tokens.h>

namespace {

constexpr zr::TokenTable kTokens(
    {
        {MSSQL_SELECT_QUERY_, zr::Role::SelectQuery},
        {MSSQL_PREDICATE, zr::Role::Predicate},
        {MSSQL_SELECT_LIST, zr::Role::SelectList},
        {MSSQL_FROM_DEF_, zr::Role::FromDef},
        {MSSQL_WHERE_CONDITION, zr::Role::WhereCondition},
        {MSSQL_GROUP_BY, zr::Role::GroupBy},
        {MSSQL_HAVING, zr::Role::Having},
        {MSSQL_ORDER_BY, zr::Role::OrderBy},
        {MSSQL_UNION, zr::Role::Union},
        {MSSQL_COLUMN_SPECIFICATION, zr::Role::ColumnSpecification},
        {MSSQL_TABLE_SPECIFICATION, zr::Role::TableSpecification},
        {MSSQL_DB_NAME, zr::Role::DbName},
        {MSSQL_TABLE_NAME, zr::Role::TableName},
        {MSSQL_COLUMN_NAME, zr::Role::ColumnName},
        {MSSQL_NEW_NAME, zr::Role::NewName},
        {MSSQL_ALIAS, zr::Role::Alias},
        {MSSQL_IDENTIFICATOR, zr::Role::Identificator},
        {MSSQL_JOIN_DEF, zr::Role::JoinDef},
        {MSSQL_JOIN_PREFIX, zr::Role::JoinPrefix},
        {MSSQL_JOIN_POSTFIX, zr::Role::JoinPostfix},
        {MSSQL_NESTED_JOIN, zr::Role::NestedJoin},
        {MSSQL_INNER_KEYWORD, zr::Role::InnerKeyword},
        {MSSQL_LEFT_KEYWORD, zr::Role::LeftKeyword},
        {MSSQL_RIGHT_KEYWORD, zr::Role::RightKeyword},
        {MSSQL_CROSS_KEYWORD, zr::Role::CrossKeyword},
        {MSSQL_OUTER_KEYWORD, zr::Role::OuterKeyword},
        {MSSQL_FUNCTION, zr::Role::Function},
        {MSSQL_GROUP_FUNCTION, zr::Role::GroupFunction},
        {MSSQL_CONVERT_FUNCTION, zr::Role::ConvertFunction},
        {MSSQL_USER_FUNCTION, zr::Role::UserFunction},
        {MSSQL_SEARCH_CONDITION, zr::Role::SearchCondition},
        {MSSQL_BETWEEN_KEYWORD, zr::Role::BetweenKeyword},
        {MSSQL_RIGHT_PAREN, zr::Role::RightParen},
        {MSSQL_SQL_LITERAL, zr::Role::SqlLiteral},
        {MSSQL_NUMBER_LITERAL, zr::Role::NumberLiteral},
        {MSSQL_SQL_STRING, zr::Role::SqlString},
        {MSSQL_DATE, zr::Role::Date},
        {MSSQL_DATE_PART, zr::Role::DatePart},
        {MSSQL_STYLE, zr::Role::Style},
        {MSSQL_DATATYPE, zr::Role::DataType},
        {MSSQL_ASTERISK_, zr::Role::Asterisk},
        {MSSQL_ALL_KEYWORD, zr::Role::AllKeyword},
        {MSSQL_DISTINCT_KEYWORD, zr::Role::DistinctKeyword},
        {MSSQL_TOP_KEYWORD, zr::Role::TopKeyword},
        {MSSQL_ASC_KEYWORD, zr::Role::AscKeyword},
        {MSSQL_DESC_KEYWORD, zr::Role::DescKeyword},
    },
    // MOD is no operator here, which is intended.
    {
        MSSQL_ALIAS,
        MSSQL_AND,
        MSSQL_LITERAL_AS,
        MSSQL_JOIN_KEYWORD,
        MSSQL_ON_KEYWORD,
        MSSQL_UNION_KEYWORD_,
        MSSQL_AND_KEYWORD,
        MSSQL_AND_KEYWORD2,
        MSSQL_OR_KEYWORD,
        MSSQL_OR_KEYWORD2,
        MSSQL_BETWEEN_KEYWORD,
        MSSQL_LIKE_KEYWORD,
        MSSQL_IS_KEYWORD,
        MSSQL_IN_KEYWORD,
        MSSQL_COMMA,
        MSSQL_ASTERISK,
        MSSQL_PLUS,
        MSSQL_MINUS,
        MSSQL_EQ,
        MSSQL_L_T,
        MSSQL_GT,
        MSSQL_NOT_EQ,
        MSSQL_LE,
        MSSQL_GE,
        MSSQL_LOJ,
        MSSQL_GOJ,
        MSSQL_DIVIDE,
        MSSQL_AMPERSAND,
    });

constexpr zr::Dialect kDialect{kTokens, DB_MSSQL, u'[', u']'};

}  // namespace

MSSQLStateSelectQuery::MSSQLStateSelectQuery(CZRSQLTree* selectNode)
    : SelectState(selectNode, kDialect, nullptr) {}

MSSQLStateSelectQuery::MSSQLStateSelectQuery(CZRSQLTree* selectNode, SelectState& outer)
    : SelectState(selectNode, kDialect, &outer) {}

bool MSSQLStateSelectQuery::isSelectNode(unsigned int token) {
    return token == MSSQL_SELECT_QUERY_;
}

std::unique_ptr<zr::SelectState> MSSQLStateSelectQuery::makeNested(CZRSQLTree* selectNode) {
    return std::unique_ptr<SelectState>(new MSSQLStateSelectQuery(selectNode, *this));
}
