#include "analysis/mysql_state.h"

#include <zrparsersql/recognizers/MySQLSelect_tokens.h>

namespace {

constexpr zr::TokenTable kTokens(
    {
        {MySQLSelect_SELECT_QUERY_MY, zr::Role::SelectQuery},
        {MySQLSelect_PREDICATE, zr::Role::Predicate},
        {MySQLSelect_SELECT_LIST, zr::Role::SelectList},
        {MySQLSelect_FROM_DEF_, zr::Role::FromDef},
        {MySQLSelect_WHERE_CONDITION, zr::Role::WhereCondition},
        {MySQLSelect_GROUP_BY, zr::Role::GroupBy},
        {MySQLSelect_HAVING, zr::Role::Having},
        {MySQLSelect_ORDER_BY, zr::Role::OrderBy},
        {MySQLSelect_UNION, zr::Role::Union},
        {MySQLSelect_COLUMN_SPECIFICATION, zr::Role::ColumnSpecification},
        {MySQLSelect_TABLE_SPECIFICATION, zr::Role::TableSpecification},
        {MySQLSelect_DB_NAME, zr::Role::DbName},
        {MySQLSelect_TABLE_NAME, zr::Role::TableName},
        {MySQLSelect_COLUMN_NAME, zr::Role::ColumnName},
        {MySQLSelect_NEW_NAME, zr::Role::NewName},
        {MySQLSelect_ALIAS, zr::Role::Alias},
        {MySQLSelect_IDENTIFICATOR, zr::Role::Identificator},
        {MySQLSelect_JOIN_DEF, zr::Role::JoinDef},
        {MySQLSelect_JOIN_PREFIX, zr::Role::JoinPrefix},
        {MySQLSelect_JOIN_POSTFIX, zr::Role::JoinPostfix},
        {MySQLSelect_NESTED_JOIN, zr::Role::NestedJoin},
        {MySQLSelect_INNER_KEYWORD, zr::Role::InnerKeyword},
        {MySQLSelect_LEFT_KEYWORD, zr::Role::LeftKeyword},
        {MySQLSelect_RIGHT_KEYWORD, zr::Role::RightKeyword},
        {MySQLSelect_CROSS_KEYWORD, zr::Role::CrossKeyword},
        {MySQLSelect_OUTER_KEYWORD, zr::Role::OuterKeyword},
        {MySQLSelect_FUNCTION_MY, zr::Role::Function},
        {MySQLSelect_USER_FUNCTION, zr::Role::UserFunction},
        {MySQLSelect_SEARCH_CONDITION, zr::Role::SearchCondition},
        {MySQLSelect_BETWEEN_KEYWORD, zr::Role::BetweenKeyword},
        {MySQLSelect_LIKE_KEYWORD, zr::Role::LikeKeyword},
        {MySQLSelect_RIGHT_PAREN, zr::Role::RightParen},
        {MySQLSelect_SQL_LITERAL, zr::Role::SqlLiteral},
        {MySQLSelect_NUMBER_LITERAL, zr::Role::NumberLiteral},
        {MySQLSelect_SQL_STRING, zr::Role::SqlString},
        {MySQLSelect_DATE, zr::Role::Date},
        {MySQLSelect_DATE_PART, zr::Role::DatePart},
        {MySQLSelect_STYLE, zr::Role::Style},
        {MySQLSelect_DATATYPE, zr::Role::DataType},
        {MySQLSelect_ASTERISK_, zr::Role::Asterisk},
        {MySQLSelect_ALL_KEYWORD, zr::Role::AllKeyword},
        {MySQLSelect_DISTINCT_KEYWORD, zr::Role::DistinctKeyword},
        {MySQLSelect_TOP_KEYWORD, zr::Role::TopKeyword},
        {MySQLSelect_ASC_KEYWORD, zr::Role::AscKeyword},
        {MySQLSelect_DESC_KEYWORD, zr::Role::DescKeyword},
    },
    // NOT IN, MOD1 and the AS of a CAST are no operators here, which is intended.
    {
        MySQLSelect_ALIAS,
        MySQLSelect_AND,
        MySQLSelect_LITERAL_AS,
        MySQLSelect_JOIN_KEYWORD,
        MySQLSelect_ON_KEYWORD,
        MySQLSelect_UNION_KEYWORD,
        MySQLSelect_AND_KEYWORD,
        MySQLSelect_AND_KEYWORD2,
        MySQLSelect_OR_KEYWORD,
        MySQLSelect_OR_KEYWORD2,
        MySQLSelect_BETWEEN_KEYWORD,
        MySQLSelect_LIKE_KEYWORD,
        MySQLSelect_IS_KEYWORD,
        MySQLSelect_IN_KEYWORD,
        MySQLSelect_COMMA,
        MySQLSelect_ASTERISK,
        MySQLSelect_PLUS,
        MySQLSelect_MINUS,
        MySQLSelect_EQ,
        MySQLSelect_L_T,
        MySQLSelect_GT,
        MySQLSelect_NOT_EQ,
        MySQLSelect_LE,
        MySQLSelect_GE,
        MySQLSelect_LOJ,
        MySQLSelect_GOJ,
        MySQLSelect_DIVIDE,
        MySQLSelect_AMPERSAND,
    });

constexpr zr::Dialect kDialect{
    .tokens = kTokens,
    // Nested descriptors of MySQL say SQL Server: intended, stored projects hold them so.
    .nestedDataType = DB_MSSQL,
    .quoteOpen = u'`',
    .quoteClose = u'`',
    .functionsArePlain = true,
};

}  // namespace

MySQLStateSelectQuery::MySQLStateSelectQuery(CZRSQLTree* selectNode)
    : SelectState(selectNode, kDialect, nullptr) {}

MySQLStateSelectQuery::MySQLStateSelectQuery(CZRSQLTree* selectNode, SelectState& outer)
    : SelectState(selectNode, kDialect, &outer) {}

bool MySQLStateSelectQuery::isSelectNode(unsigned int token) {
    return token == MySQLSelect_SELECT_QUERY_MY;
}

std::unique_ptr<zr::SelectState> MySQLStateSelectQuery::makeNested(CZRSQLTree* selectNode) {
    return std::unique_ptr<SelectState>(new MySQLStateSelectQuery(selectNode, *this));
}

void MySQLStateSelectQuery::ProcessPredicate(CZRSQLTree* node) {
    switch (node->GetType()) {
        case MySQLSelect_ALL_KEYWORD:
            m_query->m_predicate = 1;
            break;
        case MySQLSelect_DISTINCT_KEYWORD:
            m_query->m_predicate = 2;
            break;
        case MySQLSelect_DISTINCTROW:
            m_query->m_predicate = 3;
            break;
        default:
            m_query->m_predicate = 0;
            break;
    }
}

void MySQLStateSelectQuery::FillField(CZRSQLTree* node, SelectItemField& item) {
    SelectState::FillField(node, item);
    // It is the column node's own text that is asked, not that of the asterisk in it, so "t.*" stays a table
    // without a column: intended, hosts read it so.
    const bool hasTable = !item.m_sourceTable.IsEmpty() || !item.m_tableAlias.IsEmpty();
    if (!hasTable || node->GetText() != u"*") return;
    item.m_sourceField = u"*";
    appendText(&item.m_items, u"*", SIK_VALUE);
}

std::unique_ptr<CFieldObject> MySQLStateSelectQuery::MakeFieldObject(CZRSQLTree* node) {
    auto field = std::make_unique<CFieldObject>();
    unsigned int at = roleOf(node->GetChild(0)) == zr::Role::DbName ? 1 : 0;
    if (roleOf(node->GetChild(at)) == zr::Role::TableName) {
        const CString table = GetNodeText(node->GetChild(at++));
        if (!m_query->m_aliases.Contains(table)) {
            field->m_table = table;
            field->m_hasTable = 1;
        }
    }
    if (roleOf(node->GetChild(at)) == zr::Role::ColumnName) field->m_field = GetNodeText(node->GetChild(at));
    return field;
}
