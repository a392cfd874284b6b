#include "analysis/oracle_state.h"

#include <zrparsersql/recognizers/Oracle_tokens.h>

#include <utility>
#include <vector>

#include "parser/node_text.h"

namespace {

constexpr zr::TokenTable kTokens(
    {
        {Oracle_SELECT_QUERY_OR, zr::Role::SelectQuery},
        {Oracle_PREDICATE, zr::Role::Predicate},
        {Oracle_SELECT_LIST, zr::Role::SelectList},
        {Oracle_FROM_DEF_, zr::Role::FromDef},
        {Oracle_WHERE_CONDITION, zr::Role::WhereCondition},
        {Oracle_GROUP_BY, zr::Role::GroupBy},
        {Oracle_HAVING, zr::Role::Having},
        {Oracle_ORDER_BY, zr::Role::OrderBy},
        {Oracle_UNION, zr::Role::Union},
        {Oracle_COLUMN_SPECIFICATION, zr::Role::ColumnSpecification},
        {Oracle_TABLE_SPECIFICATION, zr::Role::TableSpecification},
        {Oracle_DB_NAME, zr::Role::DbName},
        {Oracle_TABLE_NAME, zr::Role::TableName},
        {Oracle_COLUMN_NAME, zr::Role::ColumnName},
        {Oracle_NEW_NAME, zr::Role::NewName},
        {Oracle_ALIAS, zr::Role::Alias},
        {Oracle_IDENTIFICATOR, zr::Role::Identificator},
        {Oracle_JOIN_DEF, zr::Role::JoinDef},
        {Oracle_JOIN_PREFIX, zr::Role::JoinPrefix},
        {Oracle_JOIN_POSTFIX, zr::Role::JoinPostfix},
        {Oracle_NESTED_JOIN, zr::Role::NestedJoin},
        {Oracle_INNER_KEYWORD, zr::Role::InnerKeyword},
        {Oracle_LEFT_KEYWORD, zr::Role::LeftKeyword},
        {Oracle_RIGHT_KEYWORD, zr::Role::RightKeyword},
        {Oracle_CROSS_KEYWORD, zr::Role::CrossKeyword},
        {Oracle_OUTER_KEYWORD, zr::Role::OuterKeyword},
        {Oracle_FUNCTION, zr::Role::Function},
        {Oracle_GROUP_FUNCTION, zr::Role::GroupFunction},
        {Oracle_CONVERT_FUNCTION, zr::Role::ConvertFunction},
        {Oracle_USER_FUNCTION, zr::Role::UserFunction},
        {Oracle_SEARCH_CONDITION, zr::Role::SearchCondition},
        {Oracle_BETWEEN_KEYWORD, zr::Role::BetweenKeyword},
        {Oracle_RIGHT_PAREN, zr::Role::RightParen},
        {Oracle_SQL_LITERAL, zr::Role::SqlLiteral},
        {Oracle_NUMBER_LITERAL, zr::Role::NumberLiteral},
        {Oracle_SQL_STRING, zr::Role::SqlString},
        {Oracle_DATE, zr::Role::Date},
        {Oracle_DATE_PART, zr::Role::DatePart},
        {Oracle_STYLE, zr::Role::Style},
        {Oracle_DATATYPE, zr::Role::DataType},
        {Oracle_ASTERISK_, zr::Role::Asterisk},
        {Oracle_ALL_KEYWORD, zr::Role::AllKeyword},
        {Oracle_DISTINCT_KEYWORD, zr::Role::DistinctKeyword},
        {Oracle_TOP_KEYWORD, zr::Role::TopKeyword},
        {Oracle_ASC_KEYWORD, zr::Role::AscKeyword},
        {Oracle_DESC_KEYWORD, zr::Role::DescKeyword},
    },
    // MOD is no operator here, which is intended.
    {
        Oracle_ALIAS,
        Oracle_AND,
        Oracle_LITERAL_AS,
        Oracle_JOIN_KEYWORD,
        Oracle_ON_KEYWORD,
        Oracle_UNION_KEYWORD_,
        Oracle_AND_KEYWORD,
        Oracle_AND_KEYWORD2,
        Oracle_OR_KEYWORD,
        Oracle_OR_KEYWORD2,
        Oracle_BETWEEN_KEYWORD,
        Oracle_LIKE_KEYWORD,
        Oracle_IS_KEYWORD,
        Oracle_IN_KEYWORD,
        Oracle_COMMA,
        Oracle_ASTERISK,
        Oracle_PLUS,
        Oracle_MINUS,
        Oracle_EQ,
        Oracle_L_T,
        Oracle_GT,
        Oracle_NOT_EQ,
        Oracle_LE,
        Oracle_GE,
        Oracle_LOJ,
        Oracle_GOJ,
        Oracle_DIVIDE,
        Oracle_AMPERSAND,
        Oracle_FROM_KEYWORD,
    });

// Nested descriptors bear the number of SQL Server, which is intended: hosts know them by it.
constexpr zr::Dialect kDialect{.tokens = kTokens,
                               .nestedDataType = DB_MSSQL,
                               .quoteOpen = u'[',
                               .quoteClose = u']',
                               .literalsAreNoItems = true,
                               .topIsAlwaysALimit = true,
                               .fillsMissingJoinPrefix = true};

}  // namespace

OracleStateSelectQuery::OracleStateSelectQuery(CZRSQLTree* selectNode)
    : SelectState(selectNode, kDialect, nullptr) {}

OracleStateSelectQuery::OracleStateSelectQuery(CZRSQLTree* selectNode, SelectState& outer)
    : SelectState(selectNode, kDialect, &outer) {}

bool OracleStateSelectQuery::isSelectNode(unsigned int token) {
    return token == Oracle_SELECT_QUERY_OR;
}

std::unique_ptr<zr::SelectState> OracleStateSelectQuery::makeNested(CZRSQLTree* selectNode) {
    return std::unique_ptr<SelectState>(new OracleStateSelectQuery(selectNode, *this));
}

CString OracleStateSelectQuery::GetNodeText(CZRSQLTree* node) {
    // Quoted names are single tokens that keep their quotes.
    CString name = zr::concatenatedText(*node);
    if (name.GetAt(0) == u'"')
        name.Trim(u"\"");
    else
        name = unquoted(std::move(name));
    return name.Trim();
}

CString OracleStateSelectQuery::newNameText(CZRSQLTree* node) {
    return node->GetChild(0)->GetText().TrimLeft();  // with its quotes: intended
}

SelectItem& OracleStateSelectQuery::appendJoinPart(zr::ItemList* list) {
    SelectItem& item = SelectState::appendJoinPart(list);
    item.m_nested = 1;
    return item;
}

void OracleStateSelectQuery::CollectAliases(CZRSQLTree* node) {
    if (!node) return;
    struct Place {
        CZRSQLTree* node;
        bool isInFrom;
    };
    std::vector<Place> pending{{node, false}};
    while (!pending.empty()) {
        auto [at, isInFrom] = pending.back();
        pending.pop_back();
        switch (roleOf(at)) {
            case zr::Role::SelectQuery:
                isInFrom = false;
                break;
            case zr::Role::FromDef:
                isInFrom = true;
                break;
            case zr::Role::Alias:
                enterAliasOf(at, isInFrom ? kTable : kField);
                break;
            default:
                break;
        }
        for (unsigned int index = at->GetChildCount(); index-- > 0;)
            pending.push_back({at->GetChild(index), isInFrom});
    }
}

void OracleStateSelectQuery::enterAliasOf(CZRSQLTree* node, std::u16string_view suffix) {
    const CString shown = GetNodeText(node->GetChild(node->GetChildCount() - 1));
    CString key = shown;
    key.MakeLower() += suffix;
    CZRAliasInfo* const alias = enterAlias(key, shown);
    if (!alias) return;
    CZRSQLTree* const source = node->GetChild(0);
    const zr::Role role = roleOf(source);
    if (role != zr::Role::TableSpecification && role != zr::Role::ColumnSpecification) return;
    const unsigned int count = source->GetChildCount();
    for (unsigned int index = 0; index < count; ++index) {
        CZRSQLTree* const part = source->GetChild(index);
        if (roleOf(part) == zr::Role::TableName) alias->AliasTable = GetNodeText(part);
        if (roleOf(part) == zr::Role::ColumnName) alias->AliasField = GetNodeText(part);
    }
}

std::unique_ptr<CFieldObject> OracleStateSelectQuery::MakeFieldObject(CZRSQLTree* node) {
    auto field = std::make_unique<CFieldObject>();
    unsigned int at = roleOf(node->GetChild(0)) == zr::Role::DbName ? 1 : 0;
    bool isQualified = at > 0;
    if (roleOf(node->GetChild(at)) == zr::Role::TableName) {
        field->m_table = GetAliasTable(GetNodeText(node->GetChild(at)));
        field->m_hasTable = 1;
        isQualified = true;
        ++at;
    }
    if (roleOf(node->GetChild(at)) == zr::Role::ColumnName) {
        const CString column = GetNodeText(node->GetChild(at));
        field->m_field = isQualified || !isColumnAlias(column) ? column : GetAliasField(column);
    }
    return field;
}

bool OracleStateSelectQuery::IsKnownAliasOf(const CString& name, std::u16string_view suffix) {
    return aliasNames().contains(name + suffix) || aliasNames().contains(name);
}

bool OracleStateSelectQuery::IsKnownField(const CString& name) const {
    for (const auto& entry : m_query->m_fields)
        if (entry.value && entry.value->m_field.EqualsNoCase(name)) return true;
    return false;
}

bool OracleStateSelectQuery::IsKnownTable(const CString& name) const {
    for (const auto& entry : m_query->m_sourceTables)
        if (entry.key.EqualsNoCase(name)) return true;
    return false;
}

CString OracleStateSelectQuery::GetAliasField(const CString& name) {
    const CZRAliasInfo* const alias = findAlias(name, kField);
    return alias ? alias->AliasField : name;
}

CString OracleStateSelectQuery::GetAliasTable(const CString& name) {
    if (aliasNames().contains(name)) return CString();
    const CZRAliasInfo* const alias = findAlias(name, kTable);
    return alias ? alias->AliasTable : name;
}

const CZRAliasInfo* OracleStateSelectQuery::findAlias(const CString& name, std::u16string_view suffix) const {
    CString key = name;
    key.MakeLower() += suffix;
    CZRAliasInfo* const* const found = m_query->m_aliases.Find(key);
    return found ? *found : nullptr;
}
