#include "analysis/postgresql_state.h"

#include <zrparsersql/recognizers/PostgreSQL_tokens.h>

#include <utility>

#include "parser/node_text.h"

namespace {

constexpr zr::TokenTable kTokens(
    {
        {PostgreSQL_SELECT_QUERY_POST, zr::Role::SelectQuery},
        {PostgreSQL_PREDICATE, zr::Role::Predicate},
        {PostgreSQL_SELECT_LIST, zr::Role::SelectList},
        {PostgreSQL_FROM_DEF_, zr::Role::FromDef},
        {PostgreSQL_WHERE_CONDITION, zr::Role::WhereCondition},
        {PostgreSQL_GROUP_BY, zr::Role::GroupBy},
        {PostgreSQL_HAVING, zr::Role::Having},
        {PostgreSQL_ORDER_BY, zr::Role::OrderBy},
        {PostgreSQL_UNION, zr::Role::Union},
        {PostgreSQL_COLUMN_SPECIFICATION, zr::Role::ColumnSpecification},
        {PostgreSQL_TABLE_SPECIFICATION, zr::Role::TableSpecification},
        {PostgreSQL_DB_NAME, zr::Role::DbName},
        {PostgreSQL_SCHEMA_NAME, zr::Role::SchemaName},
        {PostgreSQL_TABLE_NAME, zr::Role::TableName},
        {PostgreSQL_COLUMN_NAME, zr::Role::ColumnName},
        {PostgreSQL_NEW_NAME, zr::Role::NewName},
        {PostgreSQL_ALIAS, zr::Role::Alias},
        {PostgreSQL_JOIN_DEF, zr::Role::JoinDef},
        {PostgreSQL_JOIN_PREFIX, zr::Role::JoinPrefix},
        {PostgreSQL_JOIN_POSTFIX, zr::Role::JoinPostfix},
        {PostgreSQL_NESTED_JOIN, zr::Role::NestedJoin},
        {PostgreSQL_INNER_KEYWORD, zr::Role::InnerKeyword},
        {PostgreSQL_LEFT_KEYWORD, zr::Role::LeftKeyword},
        {PostgreSQL_RIGHT_KEYWORD, zr::Role::RightKeyword},
        {PostgreSQL_CROSS_KEYWORD, zr::Role::CrossKeyword},
        {PostgreSQL_OUTER_KEYWORD, zr::Role::OuterKeyword},
        {PostgreSQL_FUNCTION, zr::Role::Function},
        {PostgreSQL_GROUP_FUNCTION, zr::Role::GroupFunction},
        {PostgreSQL_CONVERT_FUNCTION, zr::Role::ConvertFunction},
        {PostgreSQL_USER_FUNCTION, zr::Role::UserFunction},
        {PostgreSQL_SEARCH_CONDITION, zr::Role::SearchCondition},
        {PostgreSQL_BETWEEN_KEYWORD, zr::Role::BetweenKeyword},
        {PostgreSQL_LIKE_KEYWORD, zr::Role::LikeKeyword},
        {PostgreSQL_NOT_LIKE_KEYWORD, zr::Role::LikeKeyword},
        {PostgreSQL_IDENTIFICATOR, zr::Role::Identificator},
        {PostgreSQL_RIGHT_PAREN, zr::Role::RightParen},
        {PostgreSQL_CAST, zr::Role::Cast},
        {PostgreSQL_SQL_LITERAL, zr::Role::SqlLiteral},
        {PostgreSQL_NUMBER_LITERAL, zr::Role::NumberLiteral},
        {PostgreSQL_SQL_STRING, zr::Role::SqlString},
        {PostgreSQL_DATE, zr::Role::Date},
        {PostgreSQL_DATE_PART, zr::Role::DatePart},
        {PostgreSQL_STYLE, zr::Role::Style},
        {PostgreSQL_DATATYPE, zr::Role::DataType},
        {PostgreSQL_ALL_KEYWORD, zr::Role::AllKeyword},
        {PostgreSQL_DISTINCT_KEYWORD, zr::Role::DistinctKeyword},
        {PostgreSQL_ASC_KEYWORD, zr::Role::AscKeyword},
        {PostgreSQL_DESC_KEYWORD, zr::Role::DescKeyword},
    },
    // COMMA, MOD1 and CONCAT_PIPES are no operators here, which is intended.
    {
        PostgreSQL_ALIAS,
        PostgreSQL_AS,
        PostgreSQL_AND,
        PostgreSQL_JOIN_KEYWORD,
        PostgreSQL_ON_KEYWORD,
        PostgreSQL_UNION_KEYWORD,
        PostgreSQL_AND_KEYWORD,
        PostgreSQL_OR_KEYWORD,
        PostgreSQL_BETWEEN_KEYWORD,
        PostgreSQL_IN_KEYWORD,
        PostgreSQL_NOT_IN_KEYWORD,
        PostgreSQL_AND_KEYWORD2,
        PostgreSQL_IS_KEYWORD,
        PostgreSQL_LIKE_KEYWORD,
        PostgreSQL_NOT_LIKE_KEYWORD,
        PostgreSQL_ASTERISK,
        PostgreSQL_EQ,
        PostgreSQL_PLUS,
        PostgreSQL_MINUS,
        PostgreSQL_L_T,
        PostgreSQL_GT,
        PostgreSQL_NOT_EQ,
        PostgreSQL_LE,
        PostgreSQL_GE,
        PostgreSQL_LOJ,
        PostgreSQL_GOJ,
        PostgreSQL_DIVIDE,
        PostgreSQL_AMPERSAND,
    });

constexpr zr::Dialect kDialect{
    .tokens = kTokens,
    .nestedDataType = DB_POSTGRESQL,
    // The lexer drops back-quotes, so there is hardly one to take off: the step is kept for the names that
    // have one.
    .quoteOpen = u'`',
    .quoteClose = u'`',
    .functionsArePlain = true,
    .fillsMissingJoinPrefix = true,
    .leavesAreNoOperands = true,
};

// Of a name of several tokens the first one counts here, which is intended.
CString firstText(CZRSQLTree* name) {
    return name->GetChild(0)->GetText();
}

}  // namespace

PostgreStateSelectQuery::PostgreStateSelectQuery(CZRSQLTree* selectNode)
    : SelectState(selectNode, kDialect, nullptr) {}

PostgreStateSelectQuery::PostgreStateSelectQuery(CZRSQLTree* selectNode, SelectState& outer)
    : SelectState(selectNode, kDialect, &outer) {}

bool PostgreStateSelectQuery::isSelectNode(unsigned int token) {
    return token == PostgreSQL_SELECT_QUERY_POST || token == PostgreSQL_INSERT_QUERY;
}

std::unique_ptr<zr::SelectState> PostgreStateSelectQuery::makeNested(CZRSQLTree* selectNode) {
    return std::unique_ptr<SelectState>(new PostgreStateSelectQuery(selectNode, *this));
}

void PostgreStateSelectQuery::ProcessClause(CZRSQLTree* node) {
    switch (node->GetType()) {
        case PostgreSQL_ALL_KEYWORD:
        case PostgreSQL_ALL:
        case PostgreSQL_DISTINCT_KEYWORD:
        case PostgreSQL_DISTINCT:
        case PostgreSQL_DISTINCTROW:
            return ProcessPredicate(node);
        default:
            return SelectState::ProcessClause(node);
    }
}

void PostgreStateSelectQuery::ProcessPredicate(CZRSQLTree* node) {
    switch (node->GetType()) {
        case PostgreSQL_ALL_KEYWORD:
        case PostgreSQL_ALL:
            m_query->m_predicate = 1;
            break;
        case PostgreSQL_DISTINCT_KEYWORD:
        case PostgreSQL_DISTINCT:
            m_query->m_predicate = 2;
            break;
        case PostgreSQL_DISTINCTROW:
            m_query->m_predicate = 3;
            break;
        case PostgreSQL_ASTERISK:
            m_query->m_predicate = 5;
            break;
        default:
            m_query->m_predicate = 0;
            break;
    }
}

void PostgreStateSelectQuery::ProcessSelectItem(CZRSQLTree* node, zr::ItemList* list) {
    while (!IsOperator(node)) {
        switch (node->GetType()) {
            case PostgreSQL_SELECT_QUERY_POST:
            case PostgreSQL_TABLE_NAME:
                return;
            case PostgreSQL_COLUMN_SPECIFICATION:
                return ProcessColumn(node, list);
            case PostgreSQL_FUNCTION:
            case PostgreSQL_SEARCH_CONDITION:
            case PostgreSQL_INLINE_CONCAT:
                return ProcessFunction(node, list);
            case PostgreSQL_SQL_LITERAL:
                return ProcessLiteral(node->GetChild(0), list);
            case PostgreSQL_ASC_KEYWORD:
            case PostgreSQL_DESC_KEYWORD:
                return ProcessOrder(node, list);
            default:
                // A user's function is among these, so a list that it stands in by itself has no item for it:
                // intended.
                if (!node->GetChildCount()) return;
                node = node->GetChild(0);
        }
    }
    ProcessOperator(node, list, nullptr);
}

void PostgreStateSelectQuery::ProcessLiteral(CZRSQLTree* node, zr::ItemList* list) {
    switch (roleOf(node)) {
        case zr::Role::NumberLiteral: {
            // Of three and more tokens the first two count: 1.5 is stored as "1.", which hosts rely on.
            CString text = firstText(node);
            if (node->GetChildCount() > 1) text += node->GetChild(1)->GetText();
            appendText(list, text, SIK_NUMBER);
            break;
        }
        case zr::Role::DataType:
            // Not a data type of its own kind, and its length is no item: intended.
            appendText(list, zr::concatenatedText(*node), SIK_NUMBER);
            break;
        case zr::Role::Date:
            appendText(list, node->GetChildCount() ? zr::concatenatedText(*node) : CString(u" "), SIK_DATE);
            break;
        case zr::Role::SqlString:
            SelectState::ProcessLiteral(node, list);
            break;
        default:
            appendText(list, GetNodeText(node), SIK_VALUE);
            break;
    }
}

void PostgreStateSelectQuery::ProcessOrder(CZRSQLTree*, zr::ItemList* list) {
    // An item without a word, and at the first item of the clause: intended, hosts read it there.
    append(&list->GetHead()->m_items, newItem<SelectItem>());
}

void PostgreStateSelectQuery::FillField(CZRSQLTree* node, SelectItemField& item) {
    auto field = std::make_unique<CFieldObject>();
    unsigned int at = 0;
    if (roleOf(node->GetChild(at)) == zr::Role::DbName) item.m_dbName = firstText(node->GetChild(at++));
    if (roleOf(node->GetChild(at)) == zr::Role::SchemaName)
        item.m_schemaName = firstText(node->GetChild(at++));
    bool isQualified = false;
    if (roleOf(node->GetChild(at)) == zr::Role::TableName) {
        const CString table = GetNodeText(node->GetChild(at++));
        isQualified = true;
        if (isTableAlias(table)) {
            item.m_tableAlias = table;
            item.m_text = table;
        } else {
            field->m_table = table;
            item.m_sourceTable = table;
        }
        // It is the column node's own text that is asked, not that of the asterisk in it, so "t.*" stays a
        // table without a field: intended, hosts read it so.
        if (node->GetText() == u"*") {
            field->m_field = u"*";
            appendText(&item.m_items, u"*", SIK_VALUE);
        }
    }
    if (roleOf(node->GetChild(at)) == zr::Role::ColumnName) {
        const CString column = GetNodeText(node->GetChild(at));
        // A bare name stays a field even where an alias has it, which is intended.
        if (!isQualified || column != u"*") {
            field->m_field = column;
            item.m_sourceField = column;
        }
    }
    if (!field->m_table.IsEmpty() || !field->m_field.IsEmpty()) enterField(std::move(field));
}

std::unique_ptr<CFieldObject> PostgreStateSelectQuery::MakeFieldObject(CZRSQLTree* node) {
    // A column with a schema gives none, which is intended.
    auto field = std::make_unique<CFieldObject>();
    unsigned int at = 0;
    if (roleOf(node->GetChild(at)) == zr::Role::TableName) {
        const CString table = GetNodeText(node->GetChild(at++));
        if (!isTableAlias(table)) {
            field->m_table = table;
            field->m_hasTable = 1;
        }
    }
    if (roleOf(node->GetChild(at)) == zr::Role::ColumnName) field->m_field = GetNodeText(node->GetChild(at));
    return field;
}

std::unique_ptr<SelectItem> PostgreStateSelectQuery::MakeTableItem(CZRSQLTree* node) {
    auto item = newItem<SelectItemField>();
    CString table;
    switch (roleOf(node->GetChild(0))) {
        case zr::Role::DbName:
            item->m_dbName = firstText(node->GetChild(0));
            item->m_schemaName = firstText(node->GetChild(1));
            table = firstText(node->GetChild(2));
            break;
        case zr::Role::SchemaName:
            item->m_schemaName = firstText(node->GetChild(0));
            table = firstText(node->GetChild(1));
            break;
        case zr::Role::TableName:
            table = GetNodeText(node->GetChild(0));
            break;
        default:
            table = GetNodeText(node);
            break;
    }
    item->m_sourceTable = unquoted(std::move(table));
    return item;
}

std::unique_ptr<SelectItem> PostgreStateSelectQuery::tableOperand(CZRSQLTree* node) {
    // Behind a schema the schema's name stands for the table, which is intended: hosts rely on it.
    CZRSQLTree* const first = node->GetChild(0);
    return MakeTableItem(roleOf(first) == zr::Role::DbName ? node : first);
}

void PostgreStateSelectQuery::collectTable(CZRSQLTree* node) {
    if (roleOf(node) != zr::Role::TableName) return;
    const CString name = GetNodeText(node);
    if (!isTableAlias(name)) enterTable(name);
}

CZRSQLTree* PostgreStateSelectQuery::functionParameters(CZRSQLTree* node) {
    switch (node->GetChild(0)->GetType()) {
        case PostgreSQL_INLINE_CONCAT:
            return node->GetChild(0);
        case PostgreSQL_CONCAT_ARG:
            // A concatenation: its parts are its parameters.
            return node;
        default:
            return SelectState::functionParameters(node);
    }
}
