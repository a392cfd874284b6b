#pragma once

#include <iosfwd>
#include <string>
#include <vector>

#include "grammar/compiler/passes.h"

namespace zr::gc {

/// The files of one grammar.
struct Inputs {
    std::string tokens, lexer;
    std::vector<std::string> grammars;
};

/// Runs all passes over a grammar and writes what `output` names, which is nothing where it names no source
/// file. Tells `report`, where there is one, what was made. Throws GrammarError, ahead of any writing.
void compile(const Inputs& inputs, const Output& output, std::ostream* report);

}  // namespace zr::gc
