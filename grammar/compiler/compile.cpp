#include "grammar/compiler/compile.h"

#include <ostream>

#include "grammar/compiler/readers.h"

namespace zr::gc {

void compile(const Inputs& inputs, const Output& output, std::ostream* report) {
    const Vocabulary vocabulary = readVocabulary(inputs.tokens);
    const LexerGrammar lexerGrammar = readLexer(inputs.lexer, vocabulary);
    const LexerProgram lexerProgram = buildLexer(lexerGrammar);
    ParserGrammar grammar = readParser(inputs.grammars, vocabulary);
    resolve(grammar);
    const Facts facts = collectFacts(grammar);
    Program program = lower(grammar, facts);
    inlineCalls(program, grammar, facts);
    std::string why;
    const int closer = findCloser(grammar, facts, program, why);
    if (closer >= 0) applyCloser(program, closer);
    for (const char* name : {"LEFT_PAREN", "LEFT_PAREN_"})
        if (const auto found = vocabulary.numberOf.find(name); found != vocabulary.numberOf.end())
            program.opener = found->second;
    analyse(program, grammar, facts, vocabulary.maxNumber);
    findBranches(program);
    dropCovered(program, grammar);
    findOutline(program, grammar);
    numberNodes(program, facts, grammar);
    lookAhead(program);
    if (report)
        *report << grammar.name << ": " << grammar.rules.size() << " rules, " << program.nodes.size()
                << " nodes, " << program.classes << " token classes, " << program.guards.size() << " guards, "
                << program.lookahead.size() << " rows of lookahead, " << program.outline.next.size()
                << " states of the outline, " << lexerProgram.accept.size() << " lexer states, closer "
                << closer << (why.empty() ? "" : "; refused as closer:" + why) << "\n";
    if (!output.sourceFile.empty())
        emit(vocabulary, lexerGrammar, lexerProgram, grammar, facts, program, output);
}

}  // namespace zr::gc
