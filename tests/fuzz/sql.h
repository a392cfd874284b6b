#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

#include "tests/engine/sentence_source.h"
#include "tests/fuzz/pieces.h"
#include "tests/grammar/reading.h"

// SQL as input: UTF-8, in which units that pair with none have the three bytes of their number.
namespace zr::fuzz {

std::u16string unitsOf(const std::uint8_t* data, std::size_t size);

/// The grammar that this program was built for.
const test::Grammar& grammarOfTarget();

/// The texts of a grammar: its tokens are the pieces, all that a text can spell the words, derivations of its
/// rules the phrases; samples are the cases of its corpus, and derivations of a statement.
class SqlLanguage : public Language {
 public:
    explicit SqlLanguage(const test::Grammar& grammar);
    std::vector<std::string> cut(std::string_view input) const override;
    const std::vector<std::string>& words() const override { return words_; }
    std::string phrase(Random& random) override;
    std::vector<std::string> samples() override;

 private:
    const test::Grammar& grammar_;
    test::SentenceSource source_;
    std::vector<std::string> words_;
};

}  // namespace zr::fuzz
