#pragma once

#include <gtest/gtest.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <string>

#include "grammar/compiler/passes.h"
#include "grammar/compiler/readers.h"

namespace zr::test {

/// A small grammar as the passes of the grammar compiler see it ahead of the last ones.
struct Toy {
    gc::Vocabulary vocabulary;
    gc::ParserGrammar grammar;
    gc::Facts facts;
    gc::Program program;
};

/// Of these rules, the first of which is `statement`, and these directives. Its tokens are A, B, C, COMMA,
/// PLUS, LEFT and RIGHT.
inline Toy toy(const std::string& rules, const std::string& directives = {}) {
    // Of this process alone: several builds may be tested at the same time.
    const std::filesystem::path folder =
        std::filesystem::path(testing::TempDir()) / ("zr_toy_" + std::to_string(getpid()));
    std::filesystem::create_directories(folder);
    std::ofstream(folder / "toy.tokens") << "A=4\nB=5\nC=6\nCOMMA=7\nPLUS=8\nLEFT=9\nRIGHT=10\n";
    std::ofstream(folder / "toy.grammar") << "parser Toy;\nstart start_rule;\n"
                                          << directives << "start_rule : statement (.!)* EOF! ;\n"
                                          << rules;
    Toy made;
    made.vocabulary = gc::readVocabulary((folder / "toy.tokens").string());
    made.grammar = gc::readParser({(folder / "toy.grammar").string()}, made.vocabulary);
    gc::resolve(made.grammar);
    made.facts = gc::collectFacts(made.grammar);
    made.program = gc::lower(made.grammar, made.facts);
    gc::analyse(made.program, made.grammar, made.facts, made.vocabulary.maxNumber);
    gc::findBranches(made.program);
    std::filesystem::remove_all(folder);
    return made;
}

}  // namespace zr::test
