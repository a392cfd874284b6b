// The table of what Oracle's grammar reads: each function family, join form, literal form, clause and word
// that it took over from SQL Server, at least once, with the nodes that it comes to. The text corpus shows
// the trees whole and the edges; this one is to be read at a glance.

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <sstream>
#include <string>
#include <string_view>
#include <vector>

#include "tests/grammar/json_string.h"
#include "tests/grammar/reading.h"

namespace zr::test {
namespace {

const Grammar& oracle() {
    return *std::find_if(kGrammars, kGrammars + kGrammarCount,
                         [](const Grammar& grammar) { return grammar.corpus == "oracle"; });
}

/// The names of a tree's nodes, parents first, with a blank in front of and behind each.
std::string nodeNames(const SyntaxDump& tree) {
    const std::string text = tree.flat();
    std::string names = " ";
    bool inText = false;
    for (std::size_t at = 0; at < text.size(); ++at) {
        if (text[at] == '\\') {
            ++at;
        } else if (text[at] == '"') {
            inText = !inText;
        } else if (text[at] == '(' && !inText) {
            names += oracle().tokenName(static_cast<int>(std::strtol(&text[at + 1], nullptr, 10)));
            names += ' ';
        }
    }
    return names;
}

/// The text is read to its end, and its tree has these nodes one behind the other.
void expectNodes(const std::u16string& text, const std::string& names) {
    const Reading reading = oracle().read(text);
    EXPECT_FALSE(reading.hasErrorNode) << quoteJson(text);
    EXPECT_EQ(reading.taken, reading.tokens.size()) << quoteJson(text);
    EXPECT_NE(nodeNames(reading.tree).find(' ' + names + ' '), std::string::npos)
        << quoteJson(text) << "\nhas no " << names << "\nbut" << nodeNames(reading.tree);
}

std::u16string wide(std::string_view text) {
    return {text.begin(), text.end()};
}

// ---------------------------------------------------------------------------------- functions, word by word

struct Family {
    const char* name;
    const char* words;  ///< with one "|" between them
};

constexpr Family kFamilies[] = {
    {"mathematical",
     "ABS|ACOS|ASIN|ATAN|ATN2|CEILING|COS|COT|DEGREES|EXP|FLOOR|ISNUMERIC|LOG|LOG10|PI|POWER|RADIANS|RAND|"
     "ROUND|"
     "SIGN|SIN|SQRT|TAN|dbms_random.value"},
    {"text",
     "ASCII|CHAR|CHARINDEX|COALESCE|DIFFERENCE|INSTR|LEFT|LEN|LOWER|LTRIM|NCHAR|PARINDEX|QUOTENAME|READTEXT|"
     "REPLACE|REPLICATE|REVERSE|RIGHT|RTRIM|SOUNDEX|SPACE|STR|STUFF|SUBSTR|TEXTVALID|UNICODE|UPDATETEXT|"
     "UPPER|VAR|"
     "WRITETEXT|SET TEXTSIZE"},
    {"date",
     "DATEADD|DATEDIFF|DATENAME|DATEPART|DAY|FROM_TZ|GETDATE|GETUTCDATE|HOUR|ISDATE|MINUTE|MONTH|MONTHS_"
     "BETWEEN|"
     "SECOND|TRUNC|WEEKDAY|YEAR"},
    {"Oracle", "ADD_MONTHS|BITAND|DECODE|MAKE_REF|NULLIF|NVL|SYS_CONTEXT|TO_CHAR|TO_DATE|USERENV"},
    {"aggregate", "AVG|BYNARY_CHECKSUM|CHECKSUM|COUNT|COUNT_BIG|GROUPING|MAX|MIN|STDEV|STDEVP|SUM|VAR|VARP"},
    {"system",
     "@@CONNECTION|@@DATEFIRST|@@DBTS|@@LANGID|@@LANGUAGE|@@LOCK_TIMEOUT|@@MAX_CONNECTIONS|@@MAX_PRECISION|"
     "@@NESTLEVEL|@@OPTIONS|@@REMSERVER|@@SERVERNAME|@@SERVICENAME|@@SPID|@@TEXTSIZE|@@VERSION"},
};

class OracleFunctions : public testing::TestWithParam<Family> {};

TEST_P(OracleFunctions, EveryWordIsACall) {
    std::istringstream words(GetParam().words);
    for (std::string word; std::getline(words, word, '|');) {
        const std::vector<TokenText> tokens = oracle().lex(wide(word));
        ASSERT_EQ(tokens.size(), 1U) << word;
        expectNodes(u"SELECT " + wide(word) + u"(a) x FROM t",
                    std::string("ALIAS FUNCTION ") + oracle().tokenName(tokens[0].type) +
                        " FUNC_PARAM COLUMN_SPECIFICATION COLUMN_NAME IDENTIFICATOR NEW_NAME");
    }
}

INSTANTIATE_TEST_SUITE_P(Families, OracleFunctions, testing::ValuesIn(kFamilies),
                         [](const auto& family) { return family.param.name; });

TEST(OracleTypes, EveryWordIsATypeAndAName) {
    std::istringstream words(
        "BIGINT|BIT|BYTE|CHAR|DATE|DECIMAL|FLOAT|INT|INTEGER|MONEY|NCHAR|NTEXT|NUMBER|NUMERIC|NVARCHAR|RAW|"
        "REAL|"
        "SMALLDATETIME|SMALLMONEY|TIMESTAMP|TINYINT|VARCHAR|VARCHAR2");
    for (std::string word; std::getline(words, word, '|');) {
        expectNodes(
            u"SELECT CAST(a AS " + wide(word) + u") x FROM t",
            "LITERAL_AS COLUMN_SPECIFICATION COLUMN_NAME IDENTIFICATOR DATATYPE " + word + " NEW_NAME");
        expectNodes(u"SELECT " + wide(word) + u" FROM t", "COLUMN_NAME " + word + " FROM_DEF_");
    }
}

// ------------------------------------------------------------------------------------------- everything else

struct Row {
    const char* theme;
    const char* what;
    const char* sql;
    const char* nodes;
};

#define COLUMN "COLUMN_SPECIFICATION COLUMN_NAME IDENTIFICATOR"
#define TABLE "TABLE_SPECIFICATION TABLE_NAME IDENTIFICATOR"
#define NUMBER_ "SQL_LITERAL NUMBER_LITERAL DIGIT"

constexpr Row kRows[] = {
    {"functions", "ROW_NUMBER", "SELECT ROW_NUMBER() OVER (PARTITION BY a ORDER BY b) FROM t",
     "FUNCTION ROW_NUMBER FUNC_PARAM FUNCTION OVER FUNC_PARAM PARTITION_BY " COLUMN " ORDER_BY " COLUMN},
    {"functions", "CASE", "SELECT CASE WHEN a = 1 THEN b ELSE c END FROM t",
     "FUNCTION CASE FUNC_PARAM FUNCTION WHEN FUNC_PARAM SEARCH_CONDITION EQ"},
    {"functions", "CAST", "SELECT CAST(a AS INT) x FROM t", "FUNCTION CAST FUNC_PARAM LITERAL_AS"},
    {"functions", "CONVERT", "SELECT CONVERT(INT, a) x FROM t",
     "FUNCTION CONVERT FUNC_PARAM DATATYPE INT " COLUMN},
    {"functions", "EXTRACT", "SELECT EXTRACT(YEAR FROM d) FROM t",
     "FUNCTION EXTRACT FUNC_PARAM FROM_KEYWORD SQL_LITERAL NUMBER_LITERAL YEAR " COLUMN},
    {"functions", "EXISTS", "SELECT a FROM t WHERE EXISTS (SELECT b FROM u)",
     "FUNCTION EXISTS FUNC_PARAM SELECT_QUERY_OR"},
    {"functions", "MULTISET", "SELECT MULTISET(SELECT b FROM u) FROM t",
     "FUNCTION MULTISET FUNC_PARAM SELECT_QUERY_OR"},
    {"functions", "CURRENT_DATE", "SELECT CURRENT_DATE FROM t", "FUNCTION CURRENT_DATE FROM_DEF_"},
    {"functions", "CURRENT_TIMESTAMP", "SELECT CURRENT_TIMESTAMP FROM t",
     "FUNCTION CURRENT_TIMESTAMP FROM_DEF_"},
    {"functions", "a user's", "SELECT f(1) FROM t", "USER_FUNCTION IDENTIFICATOR FUNC_PARAM " NUMBER_},
    {"functions", "a user's with owner", "SELECT p.f(1) FROM t",
     "USER_FUNCTION IDENTIFICATOR FUNC_PARAM " NUMBER_},
    {"functions", "an escape", "SELECT {fn HOUR(d) FROM t", "SELECT_LIST FUNCTION HOUR FUNC_PARAM"},

    {"joins", "inner", "SELECT a FROM t INNER JOIN u ON x = y",
     "JOIN_DEF JOIN_KEYWORD JOIN_PREFIX " TABLE " INNER_KEYWORD JOIN_POSTFIX " TABLE " ON_KEYWORD"},
    {"joins", "left", "SELECT a FROM t LEFT JOIN u ON x = y", TABLE " LEFT_KEYWORD JOIN_POSTFIX"},
    {"joins", "left outer", "SELECT a FROM t LEFT OUTER JOIN u ON x = y",
     TABLE " LEFT_KEYWORD OUTER_KEYWORD JOIN_POSTFIX"},
    {"joins", "right", "SELECT a FROM t RIGHT JOIN u ON x = y", TABLE " RIGHT_KEYWORD JOIN_POSTFIX"},
    {"joins", "right outer", "SELECT a FROM t RIGHT OUTER JOIN u ON x = y",
     TABLE " RIGHT_KEYWORD OUTER_KEYWORD JOIN_POSTFIX"},
    {"joins", "full", "SELECT a FROM t FULL JOIN u ON x = y", TABLE " FULL_KEYWORD JOIN_POSTFIX"},
    {"joins", "full outer", "SELECT a FROM t FULL OUTER JOIN u ON x = y",
     TABLE " FULL_KEYWORD OUTER_KEYWORD JOIN_POSTFIX"},
    {"joins", "cross", "SELECT a FROM t CROSS JOIN u", TABLE " CROSS_KEYWORD JOIN_POSTFIX " TABLE},
    {"joins", "bare", "SELECT a FROM t JOIN u ON x = y", "JOIN_PREFIX " TABLE " JOIN_POSTFIX"},
    {"joins", "nested", "SELECT a FROM t JOIN (u JOIN v ON x = y) ON z = w",
     "JOIN_POSTFIX JOIN_DEF JOIN_KEYWORD JOIN_PREFIX"},
    {"joins", "with a loop hint", "SELECT a FROM t LEFT LOOP JOIN u ON x = y",
     "LEFT_KEYWORD LOOP JOIN_POSTFIX"},
    {"joins", "with a hash hint", "SELECT a FROM t LEFT hash JOIN u ON x = y",
     "LEFT_KEYWORD HASH JOIN_POSTFIX"},
    {"joins", "with a merge hint", "SELECT a FROM t LEFT merge JOIN u ON x = y",
     "LEFT_KEYWORD MERGE JOIN_POSTFIX"},
    {"joins", "with a remote hint", "SELECT a FROM t LEFT REMOTE JOIN u ON x = y",
     "LEFT_KEYWORD REMOTE JOIN_POSTFIX"},
    {"joins", "by a mark", "SELECT a FROM t, u WHERE x = y (+)",
     "EQ " COLUMN " COLUMN_SPECIFICATION COLUMN_NAME IDENTIFICATOR"},
    {"joins", "by a comma", "SELECT a FROM t, u", "FROM_DEF_ COMMA " TABLE " " TABLE},

    {"literals", "a number", "SELECT 1 FROM t", NUMBER_ " FROM_DEF_"},
    {"literals", "a decimal", "SELECT 1.5 FROM t", NUMBER_ " DOT DIGIT FROM_DEF_"},
    {"literals", "a decimal from its point on", "SELECT .5 FROM t", "NUMBER_LITERAL DOT DIGIT FROM_DEF_"},
    {"literals", "an exponent", "SELECT 1e+5 FROM t", NUMBER_ " IDENTIFICATOR PLUS DIGIT FROM_DEF_"},
    {"literals", "a signed number", "SELECT a - -1 FROM t", "NUMBER_LITERAL MINUS DIGIT FROM_DEF_"},
    {"literals", "NULL", "SELECT NULL FROM t", "NUMBER_LITERAL NULL_KEYWORD FROM_DEF_"},
    {"literals", "NOT NULL", "SELECT NOT NULL FROM t", "NUMBER_LITERAL NOT_KEYWORD NULL_KEYWORD FROM_DEF_"},
    {"literals", "a string", "SELECT 'a b' FROM t", "SQL_LITERAL SQL_STRING QUOTE_ATTRITION FROM_DEF_"},

    {"names", "in double quotes", "SELECT \"a b\" FROM t", "COLUMN_NAME MY_QUOTE_ATTRITION FROM_DEF_"},
    {"names", "in brackets", "SELECT [a b] FROM t", "COLUMN_NAME COL_PAREN_ATTRITION FROM_DEF_"},
    {"names", "of three parts", "SELECT s.t.a FROM s.t",
     "COLUMN_SPECIFICATION DB_NAME IDENTIFICATOR TABLE_NAME IDENTIFICATOR COLUMN_NAME IDENTIFICATOR "
     "FROM_DEF_ "
     "TABLE_SPECIFICATION DB_NAME IDENTIFICATOR TABLE_NAME IDENTIFICATOR"},
    {"names", "date parts", "SELECT mi, mm, wk, yy, yyyy FROM t",
     "COLUMN_NAME 'mi' COLUMN_SPECIFICATION COLUMN_NAME 'mm' COLUMN_SPECIFICATION COLUMN_NAME 'wk' "
     "COLUMN_SPECIFICATION COLUMN_NAME 'yy' COLUMN_SPECIFICATION COLUMN_NAME 'yyyy'"},

    {"conditions", "NOT", "SELECT a FROM t WHERE NOT b = 1", "NOT_CONDITION SEARCH_CONDITION EQ"},
    {"conditions", "BETWEEN", "SELECT a FROM t WHERE b BETWEEN 1 AND 2",
     "BETWEEN_KEYWORD " COLUMN " AND_KEYWORD " NUMBER_ " " NUMBER_},
    {"conditions", "IN", "SELECT a FROM t WHERE b NOT IN (1, 2)",
     "IN_KEYWORD NOT_KEYWORD " COLUMN " " NUMBER_},
    {"conditions", "LIKE", "SELECT a FROM t WHERE b LIKE 'x'", "LIKE_KEYWORD " COLUMN},
    {"conditions", "IS", "SELECT a FROM t WHERE b IS NULL", "IS_KEYWORD " COLUMN},
    {"conditions", "concatenation", "SELECT a || b FROM t", "OR_KEYWORD2 " COLUMN " " COLUMN},

    {"clauses", "DISTINCT", "SELECT DISTINCT a FROM t", "PREDICATE DISTINCT_KEYWORD SELECT_LIST"},
    {"clauses", "ALL", "SELECT ALL a FROM t", "PREDICATE ALL_KEYWORD SELECT_LIST"},
    {"clauses", "WHERE", "SELECT a FROM t WHERE b = 1", "WHERE_CONDITION SEARCH_CONDITION EQ"},
    {"clauses", "GROUP BY", "SELECT a FROM t GROUP BY ALL a", "GROUP_BY ALL_KEYWORD " COLUMN},
    {"clauses", "HAVING", "SELECT a FROM t HAVING a = 1", "HAVING SEARCH_CONDITION EQ"},
    {"clauses", "ORDER BY", "SELECT a FROM t ORDER BY a ASC, b DESC",
     "ORDER_BY " COLUMN " ASC_KEYWORD " COLUMN " DESC_KEYWORD"},
    {"clauses", "UNION", "SELECT a FROM t UNION SELECT b FROM u", "UNION SELECT_QUERY_OR"},
    {"clauses", "UNION ALL", "SELECT a FROM t UNION ALL SELECT b FROM u",
     "UNION ALL_KEYWORD SELECT_QUERY_OR"},

    {"residue", "TOP", "SELECT TOP 5 PERCENT WITHTIES a FROM t",
     "PREDICATE TOP_KEYWORD NUMBER_LITERAL DIGIT PERCENT_KEYWORD WITHTIES_KEYWORD SELECT_LIST"},
    {"residue", "COMPUTE", "SELECT a FROM t COMPUTE SUM(a) BY a", "COMPUTE FUNCTION SUM FUNC_PARAM"},
    {"residue", "COMPUTE BY", "SELECT a FROM t COMPUTE SUM(a) BY b", COLUMN " BY " COLUMN},
    {"residue", "FOR BROWSE", "SELECT a FROM t FOR BROWSE", "FOR 'BROWSE'"},
    {"residue", "FOR XML RAW", "SELECT a FROM t FOR XML RAW", "FOR 'XML' RAW"},
    {"residue", "FOR XML AUTO", "SELECT a FROM t FOR XML AUTO.XMLDATA", "FOR 'XML' 'AUTO' DOT 'XMLDATA'"},
    {"residue", "FOR XML EXPLICIT", "SELECT a FROM t FOR XML EXPLICIT.ELEMENTS.BYNATY base64",
     "FOR 'XML' 'EXPLICIT' DOT 'ELEMENTS' DOT 'BYNATY base64'"},
    {"residue", "GROUP BY with CUBE", "SELECT a FROM t GROUP BY a with CUBE",
     "GROUP_BY " COLUMN " WITH_KEYWORD CUBE_KEYWORD"},
    {"residue", "GROUP BY with ROLLUP", "SELECT a FROM t GROUP BY a with ROLLUP",
     "GROUP_BY " COLUMN " WITH_KEYWORD ROLLUP_KEYWORD"},
    {"residue", "OPTION",
     "SELECT a FROM t OPTION ORDER GROUP, HASH GROUP, CONCAT UNION, HASH UNION, MERGE UNION",
     "OPTION ORDER_KEYWORD GROUP_KEYWORD 'HASH' GROUP_KEYWORD CONCAT UNION_KEYWORD_ 'HASH' UNION_KEYWORD_ "
     "'MERGE' UNION_KEYWORD_"},
    {"residue", "more of OPTION",
     "SELECT a FROM t OPTION FAST 1, FORCE ORDER, MAXDOP 2, KEEP PLAN, KEEPFIXED PLAN, ROBUST PLAN, EXPAND "
     "VIEWS",
     "OPTION 'FAST' NUMBER_LITERAL DIGIT 'FORCE' ORDER_KEYWORD 'MAXDOP' NUMBER_LITERAL DIGIT 'KEEP' 'PLAN' "
     "'KEEPFIXED' 'PLAN' 'ROBUST' 'PLAN' 'EXPAND VIEWS'"},
    {"residue", "table hints",
     "SELECT a FROM t WITH with (INDEX 1, FASTFIRSTROW, HOLDLOCK, NOLOCK, PAGLOCK, READCOMMITTED, READPAST, "
     "READUNCOMMITTED, REPEATABLEREAD, ROWLOCK, SERIALIZABLE, TABLOCK, TABLOCKX, UPDLOCK, XLOCK)",
     "'WITH' 'INDEX' NUMBER_LITERAL DIGIT 'FASTFIRSTROW' 'HOLDLOCK' 'NOLOCK' 'PAGLOCK' 'READCOMMITTED' "
     "'READPAST' "
     "'READUNCOMMITTED' 'REPEATABLEREAD' 'ROWLOCK' 'SERIALIZABLE' 'TABLOCK' 'TABLOCKX' 'UPDLOCK' 'XLOCK'"},
    {"residue", "row columns", "SELECT IDENTIFYCOL, ROWGUIDCOL FROM t",
     "SELECT_LIST 'IDENTIFYCOL' 'ROWGUIDCOL'"},
    {"residue", "variables", "SELECT a FROM t WHERE b = @x", "EQ " COLUMN " '@' IDENTIFICATOR"},
    {"residue", "temporary tables", "SELECT a AS #x, b AS ##y FROM t",
     "NEW_NAME '#' IDENTIFICATOR ALIAS " COLUMN " NEW_NAME '##' IDENTIFICATOR"},
    {"residue", "old outer joins", "SELECT a FROM t, u WHERE x *= y AND z =* w",
     "AND_KEYWORD SEARCH_CONDITION LOJ " COLUMN " " COLUMN " SEARCH_CONDITION GOJ"},
    {"residue", "the other logical operators", "SELECT a FROM t WHERE b IN (1) && c = 2 || d = 3",
     "OR_KEYWORD2 AND_KEYWORD2 SEARCH_CONDITION"},
    {"residue", "date parts", "SELECT DATEADD(yyyy, 1, a) FROM t", "FUNC_PARAM DATE_PART 'yyyy' " NUMBER_},
    {"residue", "a style", "SELECT CONVERT(VARCHAR(10), a, 103) FROM t",
     "DATATYPE VARCHAR NUMBER_LITERAL DIGIT " COLUMN " STYLE DIGIT"},
};

#undef COLUMN
#undef TABLE
#undef NUMBER_

TEST(OracleTable, EveryFormComesToItsNodes) {
    for (const Row& row : kRows) {
        SCOPED_TRACE(std::string(row.theme) + ": " + row.what);
        expectNodes(wide(row.sql), row.nodes);
    }
}

}  // namespace
}  // namespace zr::test
