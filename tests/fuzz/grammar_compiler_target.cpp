// Any vocabulary, lexer and rules are compiled or refused with file and line.

#include <sstream>

#include "grammar/compiler/compile.h"
#include "grammar/compiler/error.h"
#include "tests/fuzz/check.h"
#include "tests/fuzz/samples.h"
#include "tests/fuzz/scratch_folder.h"
#include "tests/fuzz/words.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);

namespace zr::fuzz {

Language& languageOfTarget() {
    static WordLanguage language("(", ")", grammarSamples());
    return language;
}

}  // namespace zr::fuzz

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    static const zr::fuzz::ScratchFolder folder;
    std::string_view rest(reinterpret_cast<const char*>(data), size);
    const auto next = [&rest] {
        const std::size_t end = rest.find(zr::fuzz::kNextFile);
        const std::string_view file = rest.substr(0, end);
        rest.remove_prefix(end == rest.npos ? rest.size()
                                            : end + std::string_view(zr::fuzz::kNextFile).size());
        return file;
    };
    zr::gc::Inputs inputs;
    inputs.tokens = folder.write("toy.tokens", next());
    inputs.lexer = folder.write("toy.lexer", next());
    inputs.grammars = {folder.write("toy.grammar", next())};
    std::ostringstream report;
    try {
        zr::gc::compile(inputs, {}, &report);
        zr::fuzz::require(report.str().find(" rules, ") != std::string::npos, "a report of what was made");
    } catch (const zr::gc::GrammarError& error) {
        zr::fuzz::require(std::string_view(error.what()).find(": error: ") != std::string_view::npos,
                          "a refusal with its place");
    }
    return 0;
}
