/// zrgc, the grammar compiler: reads a vocabulary, a lexer and the parser rules of one grammar, checks them,
/// and writes the tables, the context header and the token header. Runs at build time; needs nothing but the
/// standard library and never its own output.
///
///     zrgc --tokens NAME.tokens --lexer NAME.lexer --headers DIR --source FILE.cpp NAME.grammar...

#include <iostream>
#include <string>
#include <vector>

#include "grammar/compiler/error.h"
#include "grammar/compiler/passes.h"
#include "grammar/compiler/readers.h"

int main(int argc, char** argv) {
    using namespace zr::gc;
    std::string tokens, lexer;
    Output output;
    std::vector<std::string> grammars;
    bool verbose = false;
    for (int i = 1; i < argc; ++i) {
        const std::string word = argv[i];
        const bool more = i + 1 < argc;
        if (word == "--tokens" && more)
            tokens = argv[++i];
        else if (word == "--lexer" && more)
            lexer = argv[++i];
        else if (word == "--headers" && more)
            output.headerDirectory = argv[++i];
        else if (word == "--source" && more)
            output.sourceFile = argv[++i];
        else if (word == "--verbose")
            verbose = true;
        else
            grammars.push_back(word);
    }
    if (tokens.empty() || lexer.empty() || grammars.empty()) {
        std::cerr << "usage: zrgc --tokens FILE --lexer FILE [--headers DIR --source FILE] [--verbose] "
                     "GRAMMAR...\n";
        return 2;
    }
    try {
        const Vocabulary vocabulary = readVocabulary(tokens);
        const LexerGrammar lexerGrammar = readLexer(lexer, vocabulary);
        const LexerProgram lexerProgram = buildLexer(lexerGrammar);
        ParserGrammar grammar = readParser(grammars, vocabulary);
        resolve(grammar);
        const Facts facts = collectFacts(grammar);
        Program program = lower(grammar, facts);
        std::string why;
        const int closer = findCloser(grammar, facts, program, why);
        if (closer >= 0) applyCloser(program, closer);
        for (const char* name : {"LEFT_PAREN", "LEFT_PAREN_"})
            if (const auto found = vocabulary.numberOf.find(name); found != vocabulary.numberOf.end())
                program.opener = found->second;
        analyse(program, grammar, facts, vocabulary.maxNumber);
        numberNodes(program, facts, grammar.recoverRule);
        if (verbose)
            std::cerr << grammar.name << ": " << grammar.rules.size() << " rules, " << program.nodes.size()
                      << " nodes, " << program.classes << " token classes, " << program.guards.size()
                      << " guards, " << program.tailLoops.size() << " tail loops, " << program.contexts.size()
                      << " contexts, " << lexerProgram.accept.size() << " lexer states, closer " << closer
                      << (why.empty() ? "" : "; refused as closer:" + why) << "\n";
        if (!output.sourceFile.empty())
            emit(vocabulary, lexerGrammar, lexerProgram, grammar, facts, program, output);
        return 0;
    } catch (const GrammarError& error) {
        std::cerr << error.what() << "\n";
        return 1;
    }
}
