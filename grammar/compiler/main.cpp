/// zrgc, the grammar compiler: reads a vocabulary, a lexer and the parser rules of one grammar, checks them,
/// and writes the tables, the context header and the token header. Runs at build time; needs nothing but the
/// standard library and never its own output.
///
///     zrgc --tokens NAME.tokens --lexer NAME.lexer --headers DIR --source FILE.cpp NAME.grammar...

#include <iostream>
#include <string>

#include "grammar/compiler/compile.h"
#include "grammar/compiler/error.h"

int main(int argc, char** argv) {
    using namespace zr::gc;
    Inputs inputs;
    Output output;
    bool verbose = false;
    for (int i = 1; i < argc; ++i) {
        const std::string word = argv[i];
        const bool more = i + 1 < argc;
        if (word == "--tokens" && more)
            inputs.tokens = argv[++i];
        else if (word == "--lexer" && more)
            inputs.lexer = argv[++i];
        else if (word == "--headers" && more)
            output.headerDirectory = argv[++i];
        else if (word == "--source" && more)
            output.sourceFile = argv[++i];
        else if (word == "--verbose")
            verbose = true;
        else
            inputs.grammars.push_back(word);
    }
    if (inputs.tokens.empty() || inputs.lexer.empty() || inputs.grammars.empty()) {
        std::cerr << "usage: zrgc --tokens FILE --lexer FILE [--headers DIR --source FILE] [--verbose] "
                     "GRAMMAR...\n";
        return 2;
    }
    try {
        compile(inputs, output, verbose ? &std::cerr : nullptr);
        return 0;
    } catch (const GrammarError& error) {
        std::cerr << error.what() << "\n";
        return 1;
    }
}
