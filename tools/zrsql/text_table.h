#pragma once

#include <algorithm>
#include <string>
#include <vector>

namespace zr::tool {

// Lines of cells, each column as wide as its widest cell, up to a bound. A column without any text takes no
// room.
class TextTable {
 public:
    void add(std::vector<std::u16string> cells) { lines_.push_back(std::move(cells)); }
    bool isEmpty() const { return lines_.empty(); }
    void appendTo(std::u16string& out) const {
        static constexpr std::size_t widest = 40;
        std::vector<std::size_t> widths;
        for (const auto& cells : lines_) {
            widths.resize(std::max(widths.size(), cells.size()));
            for (std::size_t at = 0; at < cells.size(); ++at)
                widths[at] = std::max(widths[at], std::min(cells[at].size(), widest));
        }
        for (const auto& cells : lines_) {
            std::u16string line = u" ";
            for (std::size_t at = 0; at < cells.size(); ++at) {
                if (widths[at])
                    line += u' ' + cells[at] +
                            std::u16string(widths[at] + 1 - std::min(cells[at].size(), widths[at]), u' ');
            }
            line.erase(line.find_last_not_of(u' ') + 1);
            out += line + u'\n';
        }
    }

 private:
    std::vector<std::vector<std::u16string>> lines_;
};

template <class Integer>
std::u16string number(Integer value) {
    const std::string digits = std::to_string(value);
    return std::u16string(digits.begin(), digits.end());
}

}  // namespace zr::tool
