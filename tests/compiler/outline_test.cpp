// What the outline of a small statement takes.

#include <gtest/gtest.h>

#include <string>

#include "tests/compiler/toy_program.h"

namespace zr::test {
namespace {

/// The outline of the statement, asked with texts of one letter a token: A, B, C, the comma, +, ( and ).
class ToyOutline {
 public:
    explicit ToyOutline(const std::string& rules, const std::string& directives = {})
        : made_(toy(rules, directives)) {
        gc::findOutline(made_.program, made_.grammar);
    }
    bool exists() const { return !made_.program.outline.next.empty(); }
    std::size_t states() const { return made_.program.outline.next.size(); }
    bool takes(const std::string& text) const {
        const int state = behind(text);
        return made_.program.outline.accepts[gc::index(state)];
    }
    /// Whether anything that begins like this could be a statement.
    bool leadsOn(const std::string& text) const { return behind(text) != 0; }

 private:
    int behind(const std::string& text) const {
        const gc::Outline& outline = made_.program.outline;
        int state = outline.start;
        for (const char letter : text) {
            const int token = 4 + static_cast<int>(std::string("ABC,+()").find(letter));
            state = outline.next[gc::index(state)][gc::index(made_.program.classOf[gc::index(token)])];
        }
        return state;
    }
    Toy made_;
};

TEST(Outline, IsWhatAStatementWithoutRecursionReads) {
    const ToyOutline outline("statement : A (COMMA A)* B? ;");
    for (const char* text : {"A", "A,A", "AB", "A,A,AB"}) EXPECT_TRUE(outline.takes(text)) << text;
    for (const char* text : {"", "A,", "A,A,"}) {
        EXPECT_FALSE(outline.takes(text)) << text;
        EXPECT_TRUE(outline.leadsOn(text)) << text;
    }
    for (const char* text : {"B", "AA", "ABB", "A,B", "ABA"}) EXPECT_FALSE(outline.leadsOn(text)) << text;
}

TEST(Outline, KnowsWhoCalledARuleOutsideOfRecursion) {
    const ToyOutline outline("statement : A name B | B name C ; name : A PLUS A | A ;");
    EXPECT_TRUE(outline.takes("AA+AB"));
    EXPECT_TRUE(outline.takes("BAC"));
    EXPECT_FALSE(outline.leadsOn("AA+AC"));
    EXPECT_FALSE(outline.leadsOn("BAB"));
}

TEST(Outline, TakesAtLeastWhatRecursionReads) {
    const ToyOutline outline("statement : sum ; sum : atom (PLUS atom)* ; atom : A | LEFT sum RIGHT ;");
    for (const char* text : {"A", "A+A", "(A)", "((A)+A)+A"}) EXPECT_TRUE(outline.takes(text)) << text;
    EXPECT_TRUE(outline.takes("((A)")) << "it doesn't count";
    EXPECT_FALSE(outline.takes("((A")) << "but knows that it is inside";
    for (const char* text : {"AA", "(+", "()"}) EXPECT_FALSE(outline.leadsOn(text)) << text;
}

TEST(Outline, KnowsAStatementFromANestedOne) {
    const std::string rules =
        "statement : query B? ; query : A item (COMMA item)* ; item : C | LEFT query RIGHT ;";
    const ToyOutline outline(rules, "island query A;\n");
    EXPECT_TRUE(outline.takes("AC,(AC,C),CB"));
    EXPECT_FALSE(outline.leadsOn("A(ACB")) << "B is behind the statement alone";
    EXPECT_FALSE(outline.leadsOn("AC)")) << "a nested one alone ends at )";
}

TEST(Outline, JoinsStatesThatTellTheSame) {
    const ToyOutline outline("statement : A B C | B B C | C B C ;");
    EXPECT_EQ(outline.states(), 6U) << "nothing, anything, and four places";
}

TEST(Outline, IsLeftOutWhereItWouldBeTooLarge) {
    std::string rules = "statement : (A | B)* A";
    for (int i = 0; i < 14; ++i) rules += " (A | B)";
    EXPECT_FALSE(ToyOutline(rules + " ;").exists()) << "which A is the last but 14, over 16,000 states";
}

}  // namespace
}  // namespace zr::test
