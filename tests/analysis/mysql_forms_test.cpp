// Every form that MySQL text can take and what the walk makes of it: the words of each function family,
// joins, literals, clauses, and the words that are no MySQL but are read all the same.
#include <gtest/gtest.h>
#include <zrparsersql/recognizers/MySQLSelect_tokens.h>

#include <iterator>
#include <string>
#include <string_view>

#include "tests/analysis/analysed.h"
#include "tests/analysis/descriptor_text.h"

namespace {

// ---- functions

struct Word {
    const char* spelling;
    int token;
};

constexpr Word kMathematical[] = {
    {"ABS", MySQLSelect_ABS},
    {"ACOS", MySQLSelect_ACOS},
    {"ASIN", MySQLSelect_ASIN},
    {"ATAN2", MySQLSelect_ATAN2},
    {"ATAN", MySQLSelect_ATAN},
    {"CEILING", MySQLSelect_CEILING},
    {"CEIL", MySQLSelect_CEIL},
    {"COS", MySQLSelect_COS},
    {"COT", MySQLSelect_COT},
    {"CRC32", MySQLSelect_CRC32},
    {"DEGREES", MySQLSelect_DEGREES},
    {"EXP", MySQLSelect_EXP},
    {"FLOOR", MySQLSelect_FLOOR},
    {"LN", MySQLSelect_LN},
    {"LOG10", MySQLSelect_LOG10},
    {"LOG2", MySQLSelect_LOG2},
    {"LOG", MySQLSelect_LOG},
    {"MOD", MySQLSelect_MOD},
    {"PI", MySQLSelect_PI},
    {"POW", MySQLSelect_POW},
    {"POWER", MySQLSelect_POWER},
    {"RADIANS", MySQLSelect_RADIANS},
    {"RAND", MySQLSelect_RAND},
    {"ROUND", MySQLSelect_ROUND},
    {"SIGN", MySQLSelect_SIGN},
    {"SIN", MySQLSelect_SIN},
    {"SQRT", MySQLSelect_SQRT},
    {"TAN", MySQLSelect_TAN},
    {"TRUNCATE", MySQLSelect_TRUNCATE},
};
constexpr Word kDateAndTime[] = {
    {"ADDDATE", MySQLSelect_ADDDATE},
    {"ADDTIME", MySQLSelect_ADDTIME},
    {"CONVERT_TZ", MySQLSelect_CONVERTTZ},
    {"CURDATE", MySQLSelect_CURDATE},
    {"CURRENT_DATE", MySQLSelect_CURRENTDATE},
    {"CURRENT_TIME", MySQLSelect_CURRENTTIME},
    {"CURRENT_TIMESTAMP", MySQLSelect_CURRENTTIMESTAMP},
    {"CURTIME", MySQLSelect_CURTIME},
    {"DATE_ADD", MySQLSelect_DATEADD},
    {"DATE_FORMAT", MySQLSelect_DATEFORMAT},
    {"DATE_SUB", MySQLSelect_DATESUB},
    {"DATEDIFF", MySQLSelect_DATEDIFF},
    {"DAY", MySQLSelect_DAY},
    {"DAYNAME", MySQLSelect_DAYNAME},
    {"DAYOFMONTH", MySQLSelect_DAYOFMONTH},
    {"DAYOFWEEK", MySQLSelect_DAYOFWEEK},
    {"DAYOFYEAR", MySQLSelect_DAYOFYEAR},
    {"EXTRACT", MySQLSelect_EXTRACT},
    {"FROM_DAYS", MySQLSelect_FROMDAYS},
    {"FROM_UNIXTIME", MySQLSelect_FROMUNIXTIME},
    {"GET_FORMAT", MySQLSelect_GETFORMAT},
    {"HOUR", MySQLSelect_HOUR},
    {"LAST_DAY", MySQLSelect_LASTDAY},
    {"LOCALTIME", MySQLSelect_LOCALTIME},
    {"LOCALTIMESTAMP", MySQLSelect_LOCALTIMESTAMP},
    {"MAKEDATE", MySQLSelect_MAKEDATE},
    {"MAKETME", MySQLSelect_MAKETME},
    {"MICROSECOND", MySQLSelect_MICROSECOND},
    {"MINUTE", MySQLSelect_MINUTE},
    {"MONTH", MySQLSelect_MONTH},
    {"MONTHNAME", MySQLSelect_MONTHNAME},
    {"NOW", MySQLSelect_NOW},
    {"PERIOD_ADD", MySQLSelect_PERIODADD},
    {"PEDIOD_DIFF", MySQLSelect_PEDIODDIFF},
    {"QUARTER", MySQLSelect_QUARTER},
    {"SEC_TO_TIME", MySQLSelect_SECTOTIME},
    {"SECOND", MySQLSelect_SECOND},
    {"STR_TO_DATE", MySQLSelect_STRTODATE},
    {"SUBDATE", MySQLSelect_SUBDATE},
    {"SUBTIME", MySQLSelect_SUBTIME},
    {"SYSDATE", MySQLSelect_SYSDATE},
    {"TIME_FORMAT", MySQLSelect_TIMEFORMAT},
    {"TIME_TO_SEC", MySQLSelect_TIMETOSEC},
    {"TIME", MySQLSelect_TIME},
    {"TIMEDIFF", MySQLSelect_TIMEDIFF},
    {"TIMESTAMP", MySQLSelect_TIMESTAMP},
    {"TIMESTAMPADD", MySQLSelect_TIMESTAMPADD},
    {"TIMESTAMPDIFF", MySQLSelect_TIMESTAMPDIFF},
    {"TO_DAYS", MySQLSelect_TODAYS},
    {"UNIX_TIMESTAMP", MySQLSelect_UNIXTIMESTAMP},
    {"UTC_DATE", MySQLSelect_UTCDATE},
    {"UTC_TIME", MySQLSelect_UTCTIME},
    {"UTC_TIMESTAMP", MySQLSelect_UTCTIMESTAMP},
    {"WEEK", MySQLSelect_WEEK},
    {"WEEKDAY", MySQLSelect_WEEKDAY},
    {"WEEKOFDATE", MySQLSelect_WEEKOFDATE},
    {"YEAR", MySQLSelect_YEAR},
    {"YEARWEEK", MySQLSelect_YEARWEEK},
};
constexpr Word kText[] = {
    {"LEFT", MySQLSelect_LEFT_KEYWORD},
    {"RIGHT", MySQLSelect_RIGHT_KEYWORD},
    {"ASCII", MySQLSelect_ASCII},
    {"BIN", MySQLSelect_BIN},
    {"BIT_LENGTH", MySQLSelect_BITLENGTH},
    {"CHAR_LENGTH", MySQLSelect_CHARLENGTH},
    {"CHAR", MySQLSelect_CHAR},
    {"CHARACTER_LENGTH", MySQLSelect_CHARACTERLENGTH},
    {"CONCAT_WS", MySQLSelect_CONCATWS},
    {"CONCAT", MySQLSelect_CONCAT},
    {"CONV", MySQLSelect_CONV},
    {"ELT", MySQLSelect_ELT},
    {"EXPORT_SET", MySQLSelect_EXPORTSET},
    {"FIELD", MySQLSelect_FIELD},
    {"FIND_IN_SET", MySQLSelect_FINDINSET},
    {"FORMAT", MySQLSelect_FORMAT},
    {"HEX", MySQLSelect_HEX},
    {"INSERT", MySQLSelect_INSERT},
    {"INSTR", MySQLSelect_INSTR},
    {"ISNULL", MySQLSelect_ISNULL},
    {"LCASE", MySQLSelect_LCASE},
    {"LENGTH", MySQLSelect_LENGTH},
    {"LOAD_FILE", MySQLSelect_LOADFILE},
    {"LOCATE", MySQLSelect_LOCATE},
    {"LOWER", MySQLSelect_LOWER},
    {"LPAD", MySQLSelect_LPAD},
    {"LTRIM", MySQLSelect_LTRIM},
    {"MAKE_SET", MySQLSelect_MAKESET},
    {"MID", MySQLSelect_MID},
    {"NOT_LIKE", MySQLSelect_NOTLIKE},
    {"NOT_REGEXP", MySQLSelect_NOTREGEXP},
    {"OCT", MySQLSelect_OCT},
    {"OCTET_LENGTH", MySQLSelect_OCTETLENGTH},
    {"ORD", MySQLSelect_ORD},
    {"POSITION", MySQLSelect_POSITION_FUNCTION},
    {"QUOTE", MySQLSelect_QUOTE},
    {"REGEXP", MySQLSelect_REGEXP},
    {"REPEAT", MySQLSelect_REPEAT},
    {"REPLACE", MySQLSelect_REPLACE},
    {"REVERSE", MySQLSelect_REVERSE},
    {"RLIKE", MySQLSelect_RLIKE},
    {"RPAD", MySQLSelect_RPAD},
    {"RTRIM", MySQLSelect_RTRIM},
    {"SOUNDEX", MySQLSelect_SOUNDEX},
    {"SPACE", MySQLSelect_SPACE},
    {"STRCMP", MySQLSelect_STRCMP},
    {"SUBSTRING_INDEX", MySQLSelect_SUBSTRINGINDEX},
    {"SUBSTRING", MySQLSelect_SUBSTRING},
    {"SUBSTR", MySQLSelect_SUBSTR},
    {"TRIM", MySQLSelect_TRIM},
    {"UCASE", MySQLSelect_UCASE},
    {"UNHEX", MySQLSelect_UNHEX},
    {"UPPER", MySQLSelect_UPPER},
};
constexpr Word kAggregates[] = {
    {"AES_DECRYPT", MySQLSelect_AESDECRYPT},
    {"IFNULL", MySQLSelect_IFNULL},
    {"AVG", MySQLSelect_AVG},
    {"COUNT", MySQLSelect_COUNT},
    {"MAX", MySQLSelect_MAX},
    {"MIN", MySQLSelect_MIN},
    {"SUM", MySQLSelect_SUM},
};
constexpr Word kSystem[] = {
    {"@@CONNECTION", 337},      {"@@DATEFIRST", 338},     {"@@DBTS", 339},
    {"@@LANGID", 340},          {"@@LANGUAGE", 341},      {"@@LOCK_TIMEOUT", 342},
    {"@@MAX_CONNECTIONS", 343}, {"@@MAX_PRECISION", 344}, {"@@NESTLEVEL", 345},
    {"@@OPTIONS", 346},         {"@@REMSERVER", 347},     {"@@SERVERNAME", 348},
    {"@@SERVICENAME", 349},     {"@@SPID", 350},          {"@@TEXTSIZE", 351},
    {"@@VERSION", 352},
};

// Every word in front of a parenthesis is a function over what stands in it.
template <std::size_t N>
void expectFunctions(const Word (&words)[N]) {
    for (const Word& word : words) {
        const std::string text = std::string("SELECT a FROM t WHERE ") + word.spelling + "(b) = 1";
        const Analysed a(std::u16string(text.begin(), text.end()), DB_MYSQL);
        ASSERT_NE(a.query.m_whereItem, nullptr) << word.spelling;
        EXPECT_EQ(listText(a.query.m_whereItem->m_items),
                  std::string("(4 name== op type=319 (4 name=") + word.spelling +
                      " type=" + std::to_string(word.token) + " (5 field=b)) (1 text=1))");
    }
}

TEST(MysqlForms, MathematicalFunctions) {
    EXPECT_EQ(std::size(kMathematical), 29u);
    expectFunctions(kMathematical);
}
TEST(MysqlForms, DateAndTimeFunctions) {
    EXPECT_EQ(std::size(kDateAndTime), 58u);
    expectFunctions(kDateAndTime);
}
TEST(MysqlForms, TextFunctions) {
    EXPECT_EQ(std::size(kText), 53u);
    expectFunctions(kText);
}
TEST(MysqlForms, Aggregates) {
    expectFunctions(kAggregates);
}
TEST(MysqlForms, SystemWords) {
    expectFunctions(kSystem);
}

// ---- the rest: a text, and the items of the clause that shows the form. Behind a clause that leaves no
// items stands one that does, or it would not be seen whether it was read.

enum class Clause { Select, From, Where, Group, Having, Order, Union };

struct Form {
    const char16_t* sql;
    Clause clause;
    const char* items;
};

constexpr Form kForms[] = {
    // Functions that have a form of their own.
    {u"SELECT LEFT(a, 2) b, RIGHT(a, 2) c FROM t", Clause::Select,
     "(4 name=ALIAS op type=19 (4 name=LEFT type=88 (5 field=a) (1 text=2)) (1 text=b)) (4 name=ALIAS op "
     "type=19 (4 name=RIGHT type=90 (5 field=a) (1 text=2)) (1 text=c))"},
    {u"SELECT CAST(a AS INT) FROM t", Clause::Select, "(4 name=CAST type=307 (5 field=a))"},
    {u"SELECT CONVERT(INT, a) FROM t", Clause::Select, "(4 name=CONVERT type=353 (9 text=INT) (5 field=a))"},
    {u"SELECT CONVERT(INT, a, 1) FROM t", Clause::Select,
     "(4 name=CONVERT type=353 (9 text=INT) (5 field=a) (0 text=1))"},
    {u"SELECT CASE WHEN a = 1 THEN 2 ELSE 3 END FROM t", Clause::Select,
     "(4 name=CASE type=282 (4 name=WHEN type=283 (4 name== op type=319 (5 field=a) (1 text=1))) (4 "
     "name=THEN type=284 (1 text=2)) (4 name=ELSE type=285 (1 text=3)))"},
    {u"SELECT CASE a WHEN 1 THEN 2 END FROM t", Clause::Select,
     "(4 name=CASE type=282 (5 field=a) (4 name=WHEN type=283 (1 text=1)) (4 name=THEN type=284 (1 "
     "text=2)))"},
    {u"SELECT `f`(a) FROM t", Clause::Select, "(7 name=f type=317 (5 field=a))"},
    {u"SELECT {fn NOW()} FROM t", Clause::Select, "(4 name=NOW type=202)"},
    {u"SELECT COUNT(*) FROM t", Clause::Select, "(4 name=COUNT type=309 (4 name=* op type=315))"},
    {u"SELECT COUNT(DISTINCT a) FROM t", Clause::Select, "(4 name=COUNT type=309 (5 field=a))"},
    {u"SELECT COUNT(ALL a) FROM t", Clause::Select, "(4 name=COUNT type=309 (5 field=a))"},
    {u"SELECT TIMESTAMPADD(mi, 1, a) b FROM t", Clause::Select,
     "(4 name=ALIAS op type=19 (4 name=TIMESTAMPADD type=217 (0 text=mi) (1 text=1) (5 field=a)) (1 "
     "text=b))"},
    {u"SELECT HOUR(yy), HOUR(wk), HOUR(mm) FROM t", Clause::Select,
     "(4 name=HOUR type=192 (0 text=yy)) (4 name=HOUR type=192 (0 text=wk)) (4 name=HOUR type=192 (0 "
     "text=mm))"},
    {u"SELECT LIKE(a), IS(a) FROM t", Clause::Select,
     "(4 name=LIKE op type=250) (4 name=IS op type=247 (5 field=a))"},
    {u"SELECT CURDATE FROM t", Clause::Select, "(4 name=CURDATE type=173)"},
    {u"SELECT a FROM t WHERE EXISTS (SELECT b FROM u)", Clause::Where,
     "(4 name=EXISTS type=99 (6 name=SUB_QUERY query))"},
    {u"SELECT a FROM t WHERE NOT EXISTS (SELECT b FROM u)", Clause::Where,
     "(4 name=NOT EXISTS type=100 (6 name=SUB_QUERY query))"},
    // Select list.
    {u"SELECT * FROM t", Clause::Select, "(1 text=*)"},
    {u"SELECT t.* FROM t", Clause::Select, "(5 table=t)"},
    {u"SELECT d.t * FROM d.t", Clause::Select, "(5 table=t)"},
    {u"SELECT a, t.b, d.t.c FROM d.t", Clause::Select, "(5 field=a) (5 table=t field=b) (5 table=t field=c)"},
    {u"SELECT `a b` FROM t", Clause::Select, "(5 field=a b)"},
    {u"SELECT a AS b FROM t", Clause::Select, "(4 name=ALIAS op type=19 (5 field=a) (1 text=b))"},
    {u"SELECT a b FROM t", Clause::Select, "(4 name=ALIAS op type=19 (5 field=a) (1 text=b))"},
    {u"SELECT a = b FROM t", Clause::Select, "(4 name== op type=319 (5 field=a) (5 field=b))"},
    // Literals.
    {u"SELECT 1, 1.5, .5, -1, +1 FROM t", Clause::Select,
     "(1 text=1) (1 text=1.5) (1 text=.5) (1 text=-1) (1 text=+1)"},
    {u"SELECT 1e+5, 1.5e-3 FROM t", Clause::Select, "(1 text=1e+5) (1 text=1.5e-3)"},
    {u"SELECT NULL, NOT NULL FROM t", Clause::Select, "(1 text=NULL) (1 text=NOT NULL)"},
    {u"SELECT 'a b', '' FROM t", Clause::Select, "(2 text=a b) (2 text= )"},
    {u"SELECT '1/2/2000', 'Jan 1, 2000', 'Jan 1 2000' FROM t", Clause::Select,
     "(3 text='1/2/2000') (3 text='Jan1,2000') (3 text='Jan12000')"},
    {u"SELECT a FROM t WHERE b = @c", Clause::Where, "(4 name== op type=319 (5 field=b) (0 text=c))"},
    // Expressions.
    {u"SELECT a + b - c FROM t", Clause::Select,
     "(4 name=- op type=327 (4 name=+ op type=318 (5 field=a) (5 field=b)) (5 field=c))"},
    {u"SELECT a * b / c FROM t", Clause::Select,
     "(4 name=/ op type=328 (4 name=* op type=315 (5 field=a) (5 field=b)) (5 field=c))"},
    {u"SELECT a & b FROM t", Clause::Select, "(4 name=& op type=330 (5 field=a) (5 field=b))"},
    {u"SELECT a % b FROM t", Clause::Select, "(5 field=a)"},
    {u"SELECT a | | b FROM t", Clause::Select, "(5 field=a) (5 field=b)"},
    {u"SELECT (a + b) * c FROM t", Clause::Select,
     "(4 name=* op type=315 (4 name=+ op type=318 (5 field=a) (5 field=b)) (5 field=c))"},
    // Conditions.
    {u"SELECT a FROM t WHERE b = 1 AND b <> 2 AND b != 3", Clause::Where,
     "(4 name=AND op type=119 (4 name=AND op type=119 (4 name== op type=319 (5 field=b) (1 text=1)) (4 "
     "name=<> op type=322 (5 field=b) (1 text=2))) (4 name=!= op type=322 (5 field=b) (1 text=3)))"},
    {u"SELECT a FROM t WHERE b < 1 OR b > 2", Clause::Where,
     "(4 name=OR op type=120 (4 name=< op type=320 (5 field=b) (1 text=1)) (4 name=> op type=321 (5 field=b) "
     "(1 text=2)))"},
    {u"SELECT a FROM t WHERE b <= 1 && b >= 2 || b = 3", Clause::Where,
     "(4 name=|| op type=137 (4 name=&& op type=136 (4 name=<= op type=323 (5 field=b) (1 text=1)) (4 "
     "name=>= op type=324 (5 field=b) (1 text=2))) (4 name== op type=319 (5 field=b) (1 text=3)))"},
    {u"SELECT a FROM t WHERE b *= c AND b =* c", Clause::Where,
     "(4 name=AND op type=119 (4 name=*= op type=325 (5 field=b) (5 field=c)) (4 name==* op type=326 (5 "
     "field=b) (5 field=c)))"},
    {u"SELECT a FROM t WHERE b(+) = c", Clause::Where,
     "(4 name== op type=319 (5 field=b) (4 name=+ op type=318))"},
    {u"SELECT a FROM t WHERE b LIKE 'x%'", Clause::Where,
     "(4 name=LIKE op type=250 (5 field=b) (2 text=x%))"},
    {u"SELECT a FROM t WHERE b IS NULL AND c IS NOT NULL", Clause::Where,
     "(4 name=AND op type=119 (4 name=IS op type=247 (5 field=b) (1 text=NULL)) (4 name=IS op type=247 (5 "
     "field=c) (1 text=NOT NULL)))"},
    {u"SELECT a FROM t WHERE b IN (1, 2)", Clause::Where,
     "(4 name=IN op type=123 (5 field=b) (1 text=1) (1 text=2))"},
    {u"SELECT a FROM t WHERE b NOT IN (1, 2)", Clause::Where,
     "(4 name=NOT IN type=126 (5 field=b) (1 text=1) (1 text=2))"},
    {u"SELECT a FROM t WHERE b IN (SELECT c FROM u)", Clause::Where,
     "(4 name=IN op type=123 (5 field=b) (6 name=SUB_QUERY query))"},
    {u"SELECT a FROM t WHERE (b BETWEEN 1 AND 2)", Clause::Where,
     "(4 name=BETWEEN op type=121 (5 field=b) (4 name=AND op type=119 (1 text=1) (1 text=2)))"},
    {u"SELECT a FROM t WHERE NOT b = 1", Clause::Where, "(4 name== op type=319 (5 field=b) (1 text=1))"},
    {u"SELECT a FROM t WHERE b", Clause::Where, "(5 field=b)"},
    // Sources and joins.
    {u"SELECT a FROM t, d.u, v w", Clause::From,
     "(5 table=t) (5 table=u) (4 name=ALIAS op type=19 (5 table=v) (1 text=w))"},
    {u"SELECT a FROM (SELECT b FROM u) x", Clause::From,
     "(4 name=ALIAS op type=19 (6 name=SUB_QUERY query) (1 text=x))"},
    {u"SELECT a FROM (SELECT b FROM u)", Clause::From, "(0 name=select)"},
    {u"SELECT a FROM t JOIN u ON t.a = u.a", Clause::From,
     "(4 name=JOIN op type=87 (0 name=  op (5 table=t)) (5 table=u) (4 name=ON op type=101 (4 name== op "
     "type=319 (5 table=t field=a) (5 table=u field=a))))"},
    {u"SELECT a FROM t INNER JOIN u ON t.a = u.a", Clause::From,
     "(4 name=JOIN op type=87 (0 name=  op (5 table=t) (1 text=INNER)) (5 table=u) (4 name=ON op type=101 (4 "
     "name== op type=319 (5 table=t field=a) (5 table=u field=a))))"},
    {u"SELECT a FROM t CROSS JOIN u", Clause::From,
     "(4 name=JOIN op type=87 (0 name=  op (5 table=t) (1 text=CROSS)) (5 table=u))"},
    {u"SELECT a FROM t LEFT JOIN u ON t.a = u.a", Clause::From,
     "(4 name=JOIN op type=87 (0 name=  op (5 table=t) (1 text=LEFT)) (5 table=u) (4 name=ON op type=101 (4 "
     "name== op type=319 (5 table=t field=a) (5 table=u field=a))))"},
    {u"SELECT a FROM t LEFT OUTER JOIN u ON t.a = u.a", Clause::From,
     "(4 name=JOIN op type=87 (0 name=  op (5 table=t) (1 text=LEFT)) (5 table=u) (4 name=ON op type=101 (4 "
     "name== op type=319 (5 table=t field=a) (5 table=u field=a))))"},
    {u"SELECT a FROM t RIGHT JOIN u ON t.a = u.a", Clause::From,
     "(4 name=JOIN op type=87 (0 name=  op (5 table=t) (1 text=RIGHT)) (5 table=u) (4 name=ON op type=101 (4 "
     "name== op type=319 (5 table=t field=a) (5 table=u field=a))))"},
    {u"SELECT a FROM t RIGHT OUTER JOIN u ON t.a = u.a", Clause::From,
     "(4 name=JOIN op type=87 (0 name=  op (5 table=t) (1 text=RIGHT)) (5 table=u) (4 name=ON op type=101 (4 "
     "name== op type=319 (5 table=t field=a) (5 table=u field=a))))"},
    {u"SELECT a FROM t STRAIGHT JOIN u", Clause::From,
     "(4 name=JOIN op type=87 (0 name=  op (5 table=t)) (5 table=u))"},
    {u"SELECT a FROM t NATURAL LEFT JOIN u", Clause::From,
     "(4 name=JOIN op type=87 (0 name=  op (5 table=t) (1 text=LEFT)) (5 table=u))"},
    {u"SELECT a FROM t NATURAL LEFT OUTER JOIN u", Clause::From,
     "(4 name=JOIN op type=87 (0 name=  op (5 table=t) (1 text=LEFT)) (5 table=u))"},
    {u"SELECT a FROM t NATURAL RIGHT JOIN u", Clause::From,
     "(4 name=JOIN op type=87 (0 name=  op (5 table=t) (1 text=RIGHT)) (5 table=u))"},
    {u"SELECT a FROM t NATURAL RIGHT OUTER JOIN u", Clause::From,
     "(4 name=JOIN op type=87 (0 name=  op (5 table=t) (1 text=RIGHT)) (5 table=u))"},
    {u"SELECT a FROM t JOIN u ON t.a = u.a AND t.b = u.b", Clause::From,
     "(4 name=JOIN op type=87 (0 name=  op (5 table=t)) (5 table=u) (4 name=AND op type=119 (4 name=ON op "
     "type=101 (4 name== op type=319 (5 table=t field=a) (5 table=u field=a))) (4 name== op type=319 (5 "
     "table=t field=b) (5 table=u field=b))))"},
    {u"SELECT a FROM t JOIN u ON t.a = u.a JOIN v ON u.b = v.b", Clause::From,
     "(4 name=JOIN op type=87 (0 name=  op (5 table=t)) (5 table=u) (4 name=ON op type=101 (4 name== op "
     "type=319 (5 table=t field=a) (5 table=u field=a)))) (4 name=JOIN op type=87 (5 table=v) (4 name=ON op "
     "type=101 (4 name== op type=319 (5 table=u field=b) (5 table=v field=b))))"},
    {u"SELECT a FROM (t JOIN u ON t.a = u.a)", Clause::From,
     "(4 name=JOIN op type=87 (0 name=  op (5 table=t)) (5 table=u) (4 name=ON op type=101 (4 name== op "
     "type=319 (5 table=t field=a) (5 table=u field=a))))"},
    {u"SELECT a FROM t LEFT JOIN (u JOIN v ON u.a = v.a) ON t.a = u.a", Clause::From,
     "(4 name=JOIN op type=87 (0 name=  op (5 table=t) (1 text=LEFT)) (0 name=  op (4 name=JOIN op type=87 "
     "(0 name=  op (5 table=u)) (5 table=v) (4 name=ON op type=101 (4 name== op type=319 (5 table=u field=a) "
     "(5 table=v field=a))))) (4 name=ON op type=101 (4 name== op type=319 (5 table=t field=a) (5 table=u "
     "field=a))))"},
    // Clauses.
    {u"SELECT a FROM t GROUP BY a, b + 1", Clause::Group,
     "(5 field=a) (4 name=+ op type=318 (5 field=b) (1 text=1))"},
    {u"SELECT a FROM t GROUP BY ALL a with ROLLUP", Clause::Group, "(5 field=a)"},
    {u"SELECT a FROM t GROUP BY a with CUBE", Clause::Group, "(5 field=a)"},
    {u"SELECT a FROM t GROUP BY a HAVING COUNT(*) > 1", Clause::Having,
     "(4 name=> op type=321 (4 name=COUNT type=309 (4 name=* op type=315)) (1 text=1))"},
    {u"SELECT a FROM t ORDER BY a, b", Clause::Order, "(5 field=a) (5 field=b)"},
    {u"SELECT a FROM t ORDER BY a ASC", Clause::Order, "(5 field=a (0 text=ASC))"},
    {u"SELECT a FROM t ORDER BY a, b DESC", Clause::Order, "(5 field=a (0 text=DESC)) (5 field=b)"},
    {u"SELECT a FROM t LIMIT 5 UNION SELECT b FROM u", Clause::Union, "(8 name=UNION query)"},
    {u"SELECT a FROM t LIMIT 5, 10 UNION SELECT b FROM u", Clause::Union, "(8 name=UNION query)"},
    {u"SELECT a FROM t UNION SELECT b FROM u", Clause::Union, "(8 name=UNION query)"},
    {u"SELECT a FROM t UNION ALL SELECT b FROM u", Clause::Union, "(8 name=UNION query)"},
    // Words that are no MySQL.
    {u"SELECT TOP 5 PERCENT WITHTIES a FROM t", Clause::From, "(5 table=t)"},
    {u"SELECT IDENTIFYCOL, ROWGUIDCOL FROM t", Clause::Select, ""},
    {u"SELECT a FROM t WITH (with (INDEX 1, NOLOCK)) WHERE b = 1", Clause::Where,
     "(4 name== op type=319 (5 field=b) (1 text=1))"},
    {u"SELECT a FROM t u WITH with (FASTFIRSTROW, HOLDLOCK, PAGLOCK, READCOMMITTED, READPAST, "
     u"READUNCOMMITTED)) WHERE b = 1",
     Clause::Where, "(4 name== op type=319 (5 field=b) (1 text=1))"},
    {u"SELECT a FROM t WITH with (REPEATABLEREAD, ROWLOCK, SERIALIZABLE, TABLOCK, TABLOCKX, UPDLOCK, XLOCK)) "
     u"WHERE b = 1",
     Clause::Where, "(4 name== op type=319 (5 field=b) (1 text=1))"},
    {u"SELECT a FROM t COMPUTE SUM(a), AVG(b) BY c UNION SELECT b FROM u", Clause::Union,
     "(8 name=UNION query)"},
    {u"SELECT a FROM t FOR BROWSE UNION SELECT b FROM u", Clause::Union, "(8 name=UNION query)"},
    {u"SELECT a FROM t FOR XML RAW UNION SELECT b FROM u", Clause::Union, "(8 name=UNION query)"},
    {u"SELECT a FROM t FOR XML AUTO.XMLDATA.ELEMENTS UNION SELECT b FROM u", Clause::Union,
     "(8 name=UNION query)"},
    {u"SELECT a FROM t FOR XML EXPLICIT.BYNATY base64 UNION SELECT b FROM u", Clause::Union,
     "(8 name=UNION query)"},
    {u"SELECT a FROM t OPTION HASH GROUP, ORDER GROUP UNION SELECT b FROM u", Clause::Union,
     "(8 name=UNION query)"},
    {u"SELECT a FROM t OPTION CONCAT UNION, HASH UNION, MERGE UNION UNION SELECT b FROM u", Clause::Union,
     "(8 name=UNION query)"},
    {u"SELECT a FROM t OPTION FAST 1, FORCE ORDER, MAXDOP 2 UNION SELECT b FROM u", Clause::Union,
     "(8 name=UNION query)"},
    {u"SELECT a FROM t OPTION ROBUST PLAN, KEEP PLAN, KEEPFIXED PLAN, EXPAND VIEWS UNION SELECT b FROM u",
     Clause::Union, "(8 name=UNION query)"},
};

const CList<SelectItem*>& itemsOf(const CZRQueryInfo& query, Clause clause) {
    switch (clause) {
        case Clause::Select:
            return query.m_selectItems;
        case Clause::From:
            return query.m_fromItems;
        case Clause::Group:
            return query.m_groupItems;
        case Clause::Having:
            return query.m_havingItems;
        case Clause::Order:
            return query.m_orderItems;
        case Clause::Union:
            return query.m_unionItems;
        default:
            return query.m_whereItem->m_items;
    }
}

TEST(MysqlForms, ComeToTheirItems) {
    for (const Form& form : kForms) {
        SCOPED_TRACE(CString(form.sql).toUtf8());
        const Analysed a(form.sql, DB_MYSQL);
        ASSERT_TRUE(form.clause != Clause::Where || a.query.m_whereItem);
        EXPECT_EQ(listText(itemsOf(a.query, form.clause)), form.items);
    }
}

}  // namespace
