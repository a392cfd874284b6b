#pragma once

#include <functional>
#include <string>

#include "grammar/compiler/grammar_model.h"

// Draws the rules of a grammar as railroad diagrams: follow the line from left to right, never back but along
// a loop, and what you pass is a sentence of the rule.
namespace zr::diagrams {

// How a token is written in a text: "SELECT" for SELECT_KEYWORD; its name where the lexer tells no single
// spelling.
using Spelling = std::function<std::string(int token)>;

// One SVG picture with all rules below each other. The box of a rule is a link to its diagram, whose id is
// the rule's name. Tokens that leave no node have a dashed border, roots a thick one.
std::string drawRules(const gc::ParserGrammar& grammar, const gc::Vocabulary& vocabulary,
                      const Spelling& spelling);

}  // namespace zr::diagrams
