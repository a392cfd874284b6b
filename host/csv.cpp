#include "host/csv.h"

namespace zr::host {

Csv::Csv(std::string_view text) : text_(text) {
    if (text_.starts_with("\xEF\xBB\xBF")) text_.remove_prefix(3);
    const std::string_view first = text_.substr(0, text_.find('\n'));
    for (const char candidate : {';', '\t'})
        if (first.find(',') == first.npos && first.find(candidate) != first.npos) separator_ = candidate;
}

std::vector<std::string> Csv::next() {
    std::vector<std::string> cells(1);
    while (at_ < text_.size()) {
        const char unit = text_[at_++];
        if (unit == '"' && cells.back().empty()) {
            takeQuoted(cells.back());
        } else if (unit == separator_) {
            cells.emplace_back();
        } else if (unit == '\n') {
            ++line_;
            break;
        } else if (unit != '\r') {
            cells.back() += unit;
        }
    }
    return cells;
}

void Csv::takeQuoted(std::string& cell) {
    while (at_ < text_.size()) {
        const char unit = text_[at_++];
        if (unit == '\n') ++line_;
        if (unit != '"') {
            cell += unit;
        } else if (at_ < text_.size() && text_[at_] == '"') {
            cell += text_[at_++];
        } else {
            return;
        }
    }
    isBroken_ = true;
}

}  // namespace zr::host
