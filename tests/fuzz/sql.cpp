#include "tests/fuzz/sql.h"

#include <filesystem>

#include "platform/utf8.h"
#include "tests/grammar/corpus_file.h"

namespace zr::fuzz {

std::u16string unitsOf(const std::uint8_t* data, std::size_t size) {
    return utf8ToUtf16({reinterpret_cast<const char*>(data), size});
}

SqlLanguage::SqlLanguage(const test::Grammar& grammar) : grammar_(grammar), source_(grammar.tables(), 1) {
    for (std::uint16_t type = 1; type <= grammar.tables().parser->maxToken; ++type) {
        const std::string spelling = utf16ToUtf8(source_.text({type}));
        const std::size_t end = spelling.find_last_not_of(' ');
        if (end != std::string::npos) words_.push_back(spelling.substr(0, end + 1));
    }
}

std::vector<std::string> SqlLanguage::cut(std::string_view input) const {
    const std::u16string text = utf8ToUtf16(input);
    const std::u16string_view units = text;
    std::vector<std::string> pieces;
    std::size_t done = 0;
    for (const test::TokenText& token : grammar_.lex(text)) {
        if (token.to <= done) continue;
        pieces.push_back(utf16ToUtf8(units.substr(done, token.to - done)));
        done = token.to;
    }
    if (done < text.size()) pieces.push_back(utf16ToUtf8(units.substr(done)));
    return pieces;
}

std::string SqlLanguage::phrase(Random& random) {
    const engine::ParserTable& table = *grammar_.tables().parser;
    const auto rule = static_cast<std::uint16_t>(random() % table.ruleCount);
    return utf16ToUtf8(source_.text(source_.sentence(rule, 1 + random() % 16)));
}

std::vector<std::string> SqlLanguage::samples() {
    constexpr int kSentences = 200;
    std::vector<std::string> samples;
    for (const test::CorpusFile& file :
         test::readCorpus(std::filesystem::path(ZR_CORPUS_DIR) / grammar_.corpus))
        for (const test::CorpusCase& one : file.cases) samples.push_back(utf16ToUtf8(one.text()));
    const std::uint16_t statement = grammar_.tables().parser->statementRule;
    for (int i = 0; i < kSentences; ++i)
        samples.push_back(utf16ToUtf8(source_.text(source_.sentence(statement, 4 + source_.number(60)))));
    return samples;
}

}  // namespace zr::fuzz
