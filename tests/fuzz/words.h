#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "tests/fuzz/pieces.h"

namespace zr::fuzz {

/// Words, quoted texts and signs of inputs that are no SQL.
class WordLanguage : public Language {
 public:
    /// The brackets are those that the inputs nest with; the words those of the samples.
    WordLanguage(std::string opener, std::string closer, std::vector<std::string> samples);
    std::vector<std::string> cut(std::string_view input) const override;
    const std::vector<std::string>& words() const override { return words_; }
    std::vector<std::string> samples() override { return samples_; }
    std::string opener() const override { return opener_; }
    std::string closer() const override { return closer_; }

 private:
    std::string opener_, closer_;
    std::vector<std::string> samples_, words_;
};

}  // namespace zr::fuzz
