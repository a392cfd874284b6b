#include "tests/fuzz/words.h"

#include <algorithm>
#include <cctype>
#include <set>

namespace zr::fuzz {

namespace {

bool isOfAWord(char c) {
    return std::isalnum(static_cast<unsigned char>(c)) || c == '_';
}

bool isBlank(char c) {
    return std::isspace(static_cast<unsigned char>(c));
}

std::size_t endOfQuoted(std::string_view text, std::size_t at) {
    const char quote = text[at++];
    while (at < text.size() && text[at] != quote && text[at] != '\n') at += text[at] == '\\' ? 2 : 1;
    return std::min(at + 1, text.size());
}

/// Where the piece that begins at a place ends: blanks belong to the piece in front of them.
std::size_t endOfPiece(std::string_view text, std::size_t at) {
    if (text[at] == '"' || text[at] == '\'')
        at = endOfQuoted(text, at);
    else if (isOfAWord(text[at]))
        while (at < text.size() && isOfAWord(text[at])) ++at;
    else
        ++at;
    while (at < text.size() && isBlank(text[at])) ++at;
    return at;
}

}  // namespace

WordLanguage::WordLanguage(std::string opener, std::string closer, std::vector<std::string> samples)
    : opener_(std::move(opener)), closer_(std::move(closer)), samples_(std::move(samples)) {
    std::set<std::string> words;
    for (const std::string& sample : samples_)
        for (std::string piece : cut(sample)) {
            while (!piece.empty() && isBlank(piece.back())) piece.pop_back();
            if (!piece.empty()) words.insert(std::move(piece));
        }
    words_.assign(words.begin(), words.end());
    if (words_.empty()) words_.push_back(opener_);
}

std::vector<std::string> WordLanguage::cut(std::string_view input) const {
    std::vector<std::string> pieces;
    for (std::size_t at = 0; at < input.size();) {
        const std::size_t end = endOfPiece(input, at);
        pieces.emplace_back(input.substr(at, end - at));
        at = end;
    }
    return pieces;
}

}  // namespace zr::fuzz
