// What the targets that read SQL share: the grammar that they were built for, and its language.

#include "tests/fuzz/check.h"
#include "tests/fuzz/sql.h"

namespace zr::fuzz {

const test::Grammar& grammarOfTarget() {
    for (std::size_t i = 0; i < test::kGrammarCount; ++i)
        if (test::kGrammars[i].corpus == ZR_FUZZ_GRAMMAR) return test::kGrammars[i];
    require(false, "there is a grammar " ZR_FUZZ_GRAMMAR);
    return test::kGrammars[0];
}

Language& languageOfTarget() {
    static SqlLanguage language(grammarOfTarget());
    return language;
}

}  // namespace zr::fuzz
