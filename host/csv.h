#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace zr::host {

// Lines of cells as in RFC 4180: cells in quotes may hold separators, quotes (doubled) and ends of lines. The
// first line tells whether commas, semicolons or tabs separate.
class Csv {
 public:
    explicit Csv(std::string_view text);

    bool isAtEnd() const { return at_ >= text_.size(); }
    // The number of the line that comes next.
    std::size_t line() const { return line_; }
    // Whether the text ended within quotes.
    bool isBroken() const { return isBroken_; }

    std::vector<std::string> next();

 private:
    void takeQuoted(std::string& cell);

    std::string_view text_;
    std::size_t at_ = 0;
    std::size_t line_ = 1;
    char separator_ = ',';
    bool isBroken_ = false;
};

}  // namespace zr::host
