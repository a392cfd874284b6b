#include "analysis/msaccess_state.h"

#include <zrparsersql/recognizers/MSAccessSQL_v3_tokens.h>

#include <algorithm>
#include <array>
#include <string_view>
#include <utility>
#include <vector>

#include "parser/node_text.h"
#include "zrparsersql/db_types.h"
#include "zrparsersql/table_info.h"

namespace {

constexpr zr::TokenTable kTokens(
    {
        {MSAccessSQL_v3_SELECT_QUERY, zr::Role::SelectQuery},
        {MSAccessSQL_v3_PREDICATE, zr::Role::Predicate},
        {MSAccessSQL_v3_SELECT_LIST, zr::Role::SelectList},
        {MSAccessSQL_v3_FROM_DEF_, zr::Role::FromDef},
        {MSAccessSQL_v3_WHERE_CONDITION, zr::Role::WhereCondition},
        {MSAccessSQL_v3_GROUP_BY, zr::Role::GroupBy},
        {MSAccessSQL_v3_HAVING, zr::Role::Having},
        {MSAccessSQL_v3_ORDER_BY, zr::Role::OrderBy},
        {MSAccessSQL_v3_UNION, zr::Role::Union},
        {MSAccessSQL_v3_COLUMN_SPECIFICATION, zr::Role::ColumnSpecification},
        {MSAccessSQL_v3_TABLE_SPECIFICATION, zr::Role::TableSpecification},
        {MSAccessSQL_v3_QUERY_NAME, zr::Role::DbName},
        {MSAccessSQL_v3_TABLE_NAME, zr::Role::TableName},
        {MSAccessSQL_v3_COLUMN_NAME, zr::Role::ColumnName},
        {MSAccessSQL_v3_NEW_NAME, zr::Role::NewName},
        // An alias of a source, and one of an expression.
        {MSAccessSQL_v3_ALIAS, zr::Role::Alias},
        {MSAccessSQL_v3_LITERAL_AS, zr::Role::Alias},
        {MSAccessSQL_v3_IDENTIFICATOR, zr::Role::Identificator},
        {MSAccessSQL_v3_JOIN_DEF, zr::Role::JoinDef},
        {MSAccessSQL_v3_JOIN_PREFIX, zr::Role::JoinPrefix},
        {MSAccessSQL_v3_JOIN_POSTFIX, zr::Role::JoinPostfix},
        {MSAccessSQL_v3_NESTED_JOIN, zr::Role::NestedJoin},
        {MSAccessSQL_v3_INNER_KEYWORD, zr::Role::InnerKeyword},
        {MSAccessSQL_v3_LEFT_KEYWORD, zr::Role::LeftKeyword},
        {MSAccessSQL_v3_RIGHT_KEYWORD, zr::Role::RightKeyword},
        {MSAccessSQL_v3_CROSS_KEYWORD, zr::Role::CrossKeyword},
        {MSAccessSQL_v3_OUTER_KEYWORD, zr::Role::OuterKeyword},
        {MSAccessSQL_v3_FUNCTION, zr::Role::Function},
        {MSAccessSQL_v3_GROUP_FUNCTION, zr::Role::GroupFunction},
        {MSAccessSQL_v3_CONVERT_FUNCTION, zr::Role::ConvertFunction},
        {MSAccessSQL_v3_USER_FUNCTION, zr::Role::UserFunction},
        {MSAccessSQL_v3_SEARCH_CONDITION, zr::Role::SearchCondition},
        {MSAccessSQL_v3_BETWEEN_KEYWORD, zr::Role::BetweenKeyword},
        {MSAccessSQL_v3_LIKE_KEYWORD, zr::Role::LikeKeyword},
        {MSAccessSQL_v3_RIGHT_PAREN, zr::Role::RightParen},
        {MSAccessSQL_v3_SQL_LITERAL, zr::Role::SqlLiteral},
        {MSAccessSQL_v3_NUMBER_LITERAL, zr::Role::NumberLiteral},
        {MSAccessSQL_v3_SQL_STRING, zr::Role::SqlString},
        {MSAccessSQL_v3_DATE, zr::Role::Date},
        {MSAccessSQL_v3_DATE_PART, zr::Role::DatePart},
        {MSAccessSQL_v3_STYLE, zr::Role::Style},
        {MSAccessSQL_v3_DATATYPE, zr::Role::DataType},
        {MSAccessSQL_v3_ASTERISK_, zr::Role::Asterisk},
        {MSAccessSQL_v3_ALL_KEYWORD, zr::Role::AllKeyword},
        {MSAccessSQL_v3_DISTINCT_KEYWORD, zr::Role::DistinctKeyword},
        {MSAccessSQL_v3_TOP_KEYWORD, zr::Role::TopKeyword},
        {MSAccessSQL_v3_ASC_KEYWORD, zr::Role::AscKeyword},
        {MSAccessSQL_v3_DESC_KEYWORD, zr::Role::DescKeyword},
    },
    // None of the three remainders is an operator here, which is intended.
    {
        MSAccessSQL_v3_ALIAS,
        MSAccessSQL_v3_AND,
        MSAccessSQL_v3_LITERAL_AS,
        MSAccessSQL_v3_JOIN_KEYWORD,
        MSAccessSQL_v3_ON_KEYWORD,
        MSAccessSQL_v3_UNION_KEYWORD,
        MSAccessSQL_v3_AND_KEYWORD,
        MSAccessSQL_v3_AND_KEYWORD2,
        MSAccessSQL_v3_OR_KEYWORD,
        MSAccessSQL_v3_OR_KEYWORD2,
        MSAccessSQL_v3_BETWEEN_KEYWORD,
        MSAccessSQL_v3_LIKE_KEYWORD,
        MSAccessSQL_v3_IS_KEYWORD,
        MSAccessSQL_v3_IN_KEYWORD,
        MSAccessSQL_v3_COMMA,
        MSAccessSQL_v3_ASTERISK,
        MSAccessSQL_v3_PLUS,
        MSAccessSQL_v3_MINUS,
        MSAccessSQL_v3_EQ,
        MSAccessSQL_v3_L_T,
        MSAccessSQL_v3_GT,
        MSAccessSQL_v3_NOT_EQ,
        MSAccessSQL_v3_LE,
        MSAccessSQL_v3_GE,
        MSAccessSQL_v3_LOJ,
        MSAccessSQL_v3_GOJ,
        MSAccessSQL_v3_DIVIDE,
        MSAccessSQL_v3_AMPERSAND,
    });

constexpr zr::Dialect kDialect{
    .tokens = kTokens,
    .nestedDataType = DB_MSACCESS,
    .quoteOpen = u'`',
    .quoteClose = u'`',
    .functionsArePlain = true,
    .fillsMissingJoinPrefix = true,
    .nestedSelectEndsAnalysis = false,
};

// The name without the quotes that the lexer leaves: it cuts brackets itself.
CString plainText(CZRSQLTree* node) {
    return zr::concatenatedText(*node).Trim();
}

// The arguments of a call hang below its opening parenthesis.
CZRSQLTree* parametersIn(CZRSQLTree* node) {
    if (node->GetType() != MSAccessSQL_v3_FUNC_PARAM) return node;
    CZRSQLTree* const first = node->GetChild(0);
    if (first->GetType() != MSAccessSQL_v3_LEFT_PAREN) return node;
    // So of IIF((a), b, c), whose arguments stand beside each other, the first alone is taken: intended.
    return first->GetChildCount() ? first : node->GetChild(1);
}

}  // namespace

MSAccessSQL_v3StateSelectQuery::MSAccessSQL_v3StateSelectQuery(CZRSQLTree* selectNode)
    : SelectState(selectNode, kDialect, nullptr), ownShared_(new Shared), shared_(ownShared_.get()) {}

MSAccessSQL_v3StateSelectQuery::MSAccessSQL_v3StateSelectQuery(CZRSQLTree* selectNode,
                                                               MSAccessSQL_v3StateSelectQuery& outer)
    : SelectState(selectNode, kDialect, &outer), shared_(outer.shared_) {}

bool MSAccessSQL_v3StateSelectQuery::isSelectNode(unsigned int token) {
    return token == MSAccessSQL_v3_SELECT_QUERY;
}

std::unique_ptr<zr::SelectState> MSAccessSQL_v3StateSelectQuery::makeNested(CZRSQLTree* selectNode) {
    return std::unique_ptr<SelectState>(new MSAccessSQL_v3StateSelectQuery(selectNode, *this));
}

void MSAccessSQL_v3StateSelectQuery::setCopyLimit(std::size_t items) {
    shared_->budget = zr::CopyBudget(items);
}

CString MSAccessSQL_v3StateSelectQuery::GetNodeText(CZRSQLTree* node) {
    return unquoted(plainText(node));
}

// ---------------------------------------------------------------------------------------------------- passes

void MSAccessSQL_v3StateSelectQuery::collectAlias(CZRSQLTree* node) {
    const CString shown = plainText(node->GetChild(node->GetChildCount() - 1));
    const CString key = unquoted(shown).MakeLower();
    if (m_query->m_aliases.Contains(key)) return;
    auto expression = std::make_unique<SelectItem>();
    if (!shared_->budget.isSpent()) {
        const std::size_t before = itemsLeft();
        m_inAliasExpression = 1;
        shared_->inAliasExpression = true;
        ProcessExpression(node, &expression->m_items, nullptr);
        finish();
        shared_->inAliasExpression = false;
        m_inAliasExpression = 0;
        shared_->budget.take(before - itemsLeft());
    }
    // Entered behind its expression: in "a AS a" the column is no reference to the alias yet.
    enterAlias(key, shown, std::move(expression));
}

void MSAccessSQL_v3StateSelectQuery::collectTable(CZRSQLTree* node) {
    if (roleOf(node) != zr::Role::TableName) return;
    if (const CString name = GetNodeText(node); !IsKnownAlias(name)) enterTable(name);
}

CString MSAccessSQL_v3StateSelectQuery::fieldKey(const CFieldObject& field) const {
    // A column may stand twice: as what an AS names, and plain.
    const std::u16string_view suffix = field.m_aliasTarget ? u"_1" : u"_0";
    const std::u16string_view table = field.m_table.View(), name = field.m_field.View();
    // Every column comes here twice: one string is made of the three, not two.
    std::array<char16_t, 128> units;
    if (table.size() + name.size() + suffix.size() > units.size())
        return field.m_table + field.m_field + suffix;
    char16_t* end = units.data();
    for (const std::u16string_view each : {table, name, suffix})
        end = std::copy(each.begin(), each.end(), end);
    return CString(std::u16string_view(units.data(), static_cast<std::size_t>(end - units.data())));
}

// --------------------------------------------------------------------------------------------------- clauses

void MSAccessSQL_v3StateSelectQuery::ProcessPredicate(CZRSQLTree* node) {
    // A TOP leaves no trace, which is intended.
    switch (node->GetType()) {
        case MSAccessSQL_v3_ALL_KEYWORD:
            m_query->m_predicate = 1;
            break;
        case MSAccessSQL_v3_DISTINCT_KEYWORD:
            m_query->m_predicate = 2;
            break;
        case MSAccessSQL_v3_DISTINCTROW_KEYWORD:
            m_query->m_predicate = 3;
            break;
        default:
            m_query->m_predicate = 0;
            break;
    }
}

void MSAccessSQL_v3StateSelectQuery::ProcessFromItem(CZRSQLTree* node, zr::ItemList* list,
                                                     CZRSQLTree* parent) {
    if (IsOperator(node) || roleOf(node) != zr::Role::JoinDef)
        return SelectState::ProcessFromItem(node, list, parent);
    // A join in parentheses is no item of it, which is intended: its tables stand in m_sourceTables.
    SelectItem& join = append(list, newItem<SelectItem>());
    join.m_name = u"DEF_JOIN";
    join.m_kind = SIK_FUNCTION;
    join.m_isOperator = 1;
    work().forEachChild(*this, &SelectState::ProcessFromItem, node, &join.m_items, parent);
}

// ----------------------------------------------------------------------------------------------- expressions

std::unique_ptr<SelectItem> MSAccessSQL_v3StateSelectQuery::tableOperand(CZRSQLTree* node) {
    // Of "query.table" this is the query, which is intended.
    auto item = newItem<SelectItemField>();
    item->m_sourceTable = GetNodeText(node->GetChild(0));
    return item;
}

bool MSAccessSQL_v3StateSelectQuery::takeExpression(CZRSQLTree* node, zr::ItemList* list,
                                                    CZRSQLTree* parent) {
    switch (node->GetType()) {
        case MSAccessSQL_v3_JOIN_DEF:
            ProcessFromItem(node, list, parent);
            return true;
        case MSAccessSQL_v3_JOIN_TYPE:
            // Of LEFT OUTER and NATURAL LEFT the first word counts.
            ProcessKeyword(node->GetChild(0), list);
            return true;
        case MSAccessSQL_v3_INNER_KEYWORD:
        case MSAccessSQL_v3_LEFT_KEYWORD:
        case MSAccessSQL_v3_RIGHT_KEYWORD:
        case MSAccessSQL_v3_CROSS_KEYWORD:
            return false;
        default:
            return SelectState::takeExpression(node, list, parent);
    }
}

void MSAccessSQL_v3StateSelectQuery::ProcessOperator(CZRSQLTree* node, zr::ItemList* list,
                                                     CZRSQLTree* parent) {
    work().once(*this, static_cast<zr::WorkStack::Step>(&MSAccessSQL_v3StateSelectQuery::endOperatorStep),
                nullptr, nullptr, nullptr);
    m_lastOperator = static_cast<int>(node->GetType());
    SelectState::ProcessOperator(node, list, parent);
}

void MSAccessSQL_v3StateSelectQuery::ProcessParams(zr::ItemList* list, CZRSQLTree* node) {
    SelectState::ProcessParams(list, parametersIn(node));
}

int MSAccessSQL_v3StateSelectQuery::parameterCount(CZRSQLTree* node) {
    return static_cast<int>(parametersIn(node->GetChild(1))->GetChildCount());
}

void MSAccessSQL_v3StateSelectQuery::ProcessLiteral(CZRSQLTree* node, zr::ItemList* list) {
    while (roleOf(node) == zr::Role::SqlLiteral) node = node->GetChild(0);
    SelectItem& item = append(list, newItem<SelectItem>());
    switch (roleOf(node)) {
        case zr::Role::DataType:
            item.m_kind = SIK_NUMBER;
            item.m_text = zr::concatenatedText(*node);
            break;
        case zr::Role::Date:
            item.m_kind = SIK_DATE;
            item.m_text = node->GetChildCount() ? zr::concatenatedText(*node) : u" ";
            break;
        case zr::Role::NumberLiteral:
            item.m_kind = SIK_NUMBER;
            // Sign and number, and so of 1.5 as much as "1.", which is intended.
            item.m_text = node->GetChild(0)->GetText();
            if (node->GetChildCount() > 1) item.m_text += node->GetChild(1)->GetText();
            break;
        case zr::Role::SqlString:
            item.m_kind = SIK_STRING;
            item.m_text = node->GetChildCount() ? zr::concatenatedText(*node) : u" ";
            break;
        default:
            item.m_text = unquoted(node->GetText());
            break;
    }
}

// --------------------------------------------------------------------------------------------------- columns

void MSAccessSQL_v3StateSelectQuery::ProcessColumn(CZRSQLTree* node, zr::ItemList* list) {
    auto item = newItem<SelectItemField>();
    const auto takeQualifier = [&](CZRSQLTree* nameNode) {
        const CString name = GetNodeText(nameNode);
        (IsKnownAlias(name) ? item->m_tableAlias : item->m_sourceTable) = name;
    };
    unsigned int at = 0;
    if (roleOf(node->GetChild(at)) == zr::Role::DbName) takeQualifier(node->GetChild(at++));
    // Further ones don't count, which is intended.
    while (roleOf(node->GetChild(at)) == zr::Role::DbName) ++at;
    if (roleOf(node->GetChild(at)) == zr::Role::TableName) takeQualifier(node->GetChild(at++));
    if (roleOf(node->GetChild(at)) == zr::Role::ColumnName) {
        CString column = GetNodeText(node->GetChild(at));
        if (column == u"*") {
            if (const CZRTableInfo* table = findTable(item->m_sourceTable)) return ExpandStar(*table, list);
        } else if (const int stop = column.Find(u'.'); stop >= 0) {
            // A bracketed name with a full stop in it. What stands in front is dropped unless it is an alias.
            if (const CString table = column.Left(stop); IsKnownAlias(table)) item->m_tableAlias = table;
            column.Delete(0, stop + 1);
        }
        item->m_sourceField = column;
    }
    if (isAliasReference(*item)) followAlias(*item);
    noteField(append(list, std::move(item)));
}

void MSAccessSQL_v3StateSelectQuery::noteField(const SelectItemField& item) {
    if (m_inAliasExpression || (item.m_sourceTable.IsEmpty() && item.m_sourceField.IsEmpty())) return;
    auto field = std::make_unique<CFieldObject>();
    field->m_table = item.m_sourceTable;
    field->m_field = item.m_sourceField;
    field->m_aliasText = item.m_tableAlias;
    field->m_aliasTarget = m_lastOperator == MSAccessSQL_v3_LITERAL_AS;
    enterField(std::move(field));
}

const CZRTableInfo* MSAccessSQL_v3StateSelectQuery::findTable(const CString& name) const {
    return name.IsEmpty() ? nullptr : dynamic_cast<const CZRTableInfo*>(m_query->FindSource(name));
}

void MSAccessSQL_v3StateSelectQuery::ExpandStar(const CZRTableInfo& table, zr::ItemList* list) {
    for (const CZRFieldInfo* column : table.Fields) {
        if (!column) continue;
        SelectItemField& item = append(list, newItem<SelectItemField>());
        item.m_sourceTable = table.GetSrcName();
        item.m_sourceField = column->GetSrcName();
        noteField(item);
    }
}

bool MSAccessSQL_v3StateSelectQuery::isAliasReference(const SelectItemField& item) {
    return item.m_kind == SIK_FIELD && item.m_sourceTable.IsEmpty() && item.m_tableAlias.IsEmpty() &&
           IsKnownAlias(item.m_sourceField);
}

SelectItem* MSAccessSQL_v3StateSelectQuery::firstOfExpression(const CString& alias) const {
    CString key = alias;
    CZRAliasInfo* const* const found = m_query->m_aliases.Find(key.MakeLower());
    if (!found || !*found || !(*found)->Expression || (*found)->Expression->m_items.IsEmpty()) return nullptr;
    return (*found)->Expression->m_items.GetHead();
}

// The expression of an alias may refer to aliases that were not known when it was built: it is looked through
// each time before it is copied. A reference is marked before what it stands for is looked at, so aliases
// that lead to each other come to an end, and no copy holds a reference that is still to be followed.
void MSAccessSQL_v3StateSelectQuery::followAlias(SelectItemField& reference) {
    struct Work {
        SelectItem* item;           // to look through, or to copy
        SelectItemField* copyInto;  // null: look through
    };
    std::vector<Work> pending;
    const auto follow = [&](SelectItemField& at) {
        at.m_kind = SIK_FIELD_LIKE;
        SelectItem* const first = shared_->budget.isSpent() ? nullptr : firstOfExpression(at.m_sourceField);
        if (!first) return;
        pending.push_back({first, &at});
        pending.push_back({first, nullptr});
    };
    follow(reference);
    while (!pending.empty()) {
        const Work next = pending.back();
        pending.pop_back();
        if (next.copyInto) {
            if (shared_->budget.takeCopyOf(*next.item))
                append(&next.copyInto->m_items, std::unique_ptr<SelectItem>(next.item->Clone()));
            continue;
        }
        for (SelectItem* below : next.item->m_items) pending.push_back({below, nullptr});
        std::reverse(pending.end() - next.item->m_items.GetCount(), pending.end());
        auto* const field = dynamic_cast<SelectItemField*>(next.item);
        if (field && isAliasReference(*field)) follow(*field);
    }
}

// ------------------------------------------------------------------------------------------- nested queries

void MSAccessSQL_v3StateSelectQuery::ProcessSubQuery(CZRSQLTree* node, zr::ItemList* list) {
    auto item = newItem<SelectItemSubQuery>();
    item->m_name = u"SUB_QUERY";
    CZRQueryInfo& query = newNestedQuery(item->m_query);
    append(list, std::move(item));
    // Every alias around it comes with descriptors of its own for what is nested in it.
    query.SetDatabase(m_query->m_database);
    if (shared_->inAliasExpression && !shared_->budget.takeQuery()) return;
    CopyOuterContext(query);
    walkNested(node, query);
}

void MSAccessSQL_v3StateSelectQuery::CopyOuterContext(CZRQueryInfo& target) {
    for (const auto& entry : m_query->m_aliases) {
        if (!entry.value || !shared_->budget.takeCopyOf(*entry.value)) continue;
        std::unique_ptr<CZRAliasInfo> alias(entry.value->Clone());
        target.ReplaceAlias(entry.key, alias.get());
        static_cast<void>(alias.release());
    }
    copyTablesAndFields(target);
}

CZRQueryInfo* MSAccessSQL_v3StateSelectQuery::ProcessUnion(CZRSQLTree* node, zr::ItemList* list) {
    auto item = newItem<SelectItemUnion>();
    item->m_name = u"UNION";
    CZRQueryInfo& query = newNestedQuery(item->m_query);
    append(list, std::move(item));
    CZRSQLTree* branch = node->GetChild(0);
    if (roleOf(branch) == zr::Role::AllKeyword) {
        // Takes a DISTINCT away from the outer query, which is intended: hosts know ALL by that.
        ProcessPredicate(branch);
        branch = node->GetChild(1);
    }
    // A branch knows no names of the query in front of it.
    walkNested(branch, query, OuterNames::Unknown);
    return &query;
}

void MSAccessSQL_v3StateSelectQuery::ProcessTail(CZRSQLTree* root) {
    CZRQueryInfo* target = m_query;
    const unsigned int count = root->GetChildCount();
    for (unsigned int index = 1; index < count; ++index) {
        CZRSQLTree* const node = root->GetChild(index);
        if (roleOf(node) != zr::Role::Union) return;
        target = ProcessUnion(node, &target->m_unionItems);
        finish();
    }
}
