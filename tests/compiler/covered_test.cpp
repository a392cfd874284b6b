// Which branches of a choice a search doesn't need.

#include <gtest/gtest.h>

#include <string>

#include "tests/compiler/toy_program.h"

namespace zr::test {
namespace {

/// How many branches the statement's own choice keeps.
std::size_t branchesOf(const std::string& rules, const std::string& directives = {}) {
    Toy made = toy(rules, directives);
    gc::dropCovered(made.program, made.grammar);
    const int first = made.program.skip(made.program.entry[gc::index(made.grammar.statement)]);
    const gc::Node& choice = made.program.nodes[gc::index(first)];
    EXPECT_EQ(choice.op, gc::Op::Choice) << rules;
    return choice.branches.size();
}

TEST(CoveredBranches, GoWhereAnEarlierOneReadsTheSame) {
    EXPECT_EQ(branchesOf("statement : list | single ; list : A (COMMA A)* ; single : A ;"), 1U);
    EXPECT_EQ(branchesOf("statement : A? B | B ; "), 2U) << "the optional A and the B behind it";
}

TEST(CoveredBranches, GoWhereSeveralEarlierOnesReadTheSameTogether) {
    EXPECT_EQ(branchesOf("statement : A B | A C | pair ; pair : A (C | B) ;"), 2U);
}

TEST(CoveredBranches, StayWhereTheyReadMore) {
    EXPECT_EQ(branchesOf("statement : single | list ; list : A (COMMA A)* ; single : A ;"), 2U);
    EXPECT_EQ(branchesOf("statement : A B | pair ; pair : A (C | B) ;"), 2U);
}

TEST(CoveredBranches, StayWhereALaterOneReadsTheSame) {
    EXPECT_EQ(branchesOf("statement : A | A B ;"), 2U);
}

TEST(CoveredBranches, GoThroughRecursion) {
    const std::string rules = "sum : atom (PLUS atom)* ; atom : A | LEFT sum RIGHT ;";
    EXPECT_EQ(branchesOf("statement : sum | atom ;" + rules), 1U);
    EXPECT_EQ(branchesOf("statement : atom | sum ;" + rules), 2U);
}

TEST(CoveredBranches, StayWhereARecursionAloneGoesAnyDepth) {
    EXPECT_EQ(branchesOf("statement : LEFT* A RIGHT* | nest ; nest : LEFT nest RIGHT | A ;"), 3U)
        << "the loop, what is behind it, and the recursion, which is gone into only so deep";
}

TEST(CoveredBranches, StayWhereTheyLeadToWhatRecoveryReplaces) {
    const std::string rules = "list : A (COMMA A)* ;";
    EXPECT_EQ(branchesOf("statement : A B? list | A list ;" + rules), 1U);
    EXPECT_EQ(branchesOf("statement : A B? list | A list ;" + rules, "recover list;\n"), 2U);
}

}  // namespace
}  // namespace zr::test
