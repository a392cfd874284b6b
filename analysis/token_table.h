#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <initializer_list>

namespace zr {

// What a token number means to the walk, whatever number the dialect's vocabulary gives it. Named after the
// tokens.
enum class Role : std::uint8_t {
    None,
    // A query and its clauses.
    SelectQuery,
    Predicate,
    SelectList,
    FromDef,
    WhereCondition,
    GroupBy,
    Having,
    OrderBy,
    Union,
    // Names.
    ColumnSpecification,
    TableSpecification,
    DbName,
    SchemaName,
    TableName,
    ColumnName,
    NewName,
    Alias,
    Identificator,
    // Joins.
    JoinDef,
    JoinPrefix,
    JoinPostfix,
    NestedJoin,
    InnerKeyword,
    LeftKeyword,
    RightKeyword,
    CrossKeyword,
    OuterKeyword,
    // Functions and conditions.
    Function,
    GroupFunction,
    ConvertFunction,
    UserFunction,
    SearchCondition,
    BetweenKeyword,
    LikeKeyword,
    RightParen,
    // Literals.
    Cast,
    SqlLiteral,
    NumberLiteral,
    SqlString,
    Date,
    DatePart,
    Style,
    DataType,
    Asterisk,
    // Words that decide something.
    AllKeyword,
    DistinctKeyword,
    TopKeyword,
    AscKeyword,
    DescKeyword,
};

// The token numbers of one dialect's vocabulary, as the walk sees them. Built at compile time from the
// dialect's two lists; every number that stands in neither means nothing to the walk.
class TokenTable {
 public:
    struct Entry {
        unsigned int token;
        Role role;
    };

    constexpr TokenTable(std::initializer_list<Entry> roles, std::initializer_list<unsigned int> operators) {
        for (const Entry& entry : roles) rows_[entry.token].role = entry.role;
        for (const unsigned int token : operators) rows_[token].isOperator = true;
    }

    constexpr Role role(unsigned int token) const { return row(token).role; }
    constexpr bool isOperator(unsigned int token) const { return row(token).isOperator; }

 private:
    struct Row {
        Role role = Role::None;
        bool isOperator = false;
    };
    // No vocabulary is larger; the compiler refuses a table that needs more.
    static constexpr std::size_t kSize = 512;

    constexpr Row row(unsigned int token) const { return token < kSize ? rows_[token] : Row(); }

    std::array<Row, kSize> rows_{};
};

}  // namespace zr
