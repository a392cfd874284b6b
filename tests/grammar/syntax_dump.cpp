#include "tests/grammar/syntax_dump.h"

#include <cctype>
#include <stdexcept>
#include <utility>

#include "tests/grammar/json_string.h"

namespace zr::test {
namespace {

constexpr std::size_t kWidth = 100;

void skipBlanks(std::string_view& in) {
    while (!in.empty() && std::isspace(static_cast<unsigned char>(in.front()))) in.remove_prefix(1);
}

int takeNumber(std::string_view& in) {
    std::size_t length = 0;
    while (length < in.size() && (in[length] == '-' || std::isdigit(static_cast<unsigned char>(in[length]))))
        ++length;
    const int number = std::stoi(std::string(in.substr(0, length)));
    in.remove_prefix(length);
    return number;
}

}  // namespace

void SyntaxDump::add(int type, std::string_view quotedText, std::size_t depth) {
    std::string head = "(";
    head += std::to_string(type);
    head += ' ';
    head += quotedText;
    nodes_.push_back({std::move(head), depth});
}

SyntaxDump SyntaxDump::parse(std::string_view text) {
    SyntaxDump dump;
    std::size_t depth = 0;
    for (skipBlanks(text); !text.empty(); skipBlanks(text)) {
        const char sign = text.front();
        text.remove_prefix(1);
        if (sign == ')' && depth > 0) {
            --depth;
            continue;
        }
        if (sign != '(' || (depth == 0 && !dump.empty())) throw std::runtime_error("a tree out of shape");
        const int type = takeNumber(text);
        skipBlanks(text);
        dump.add(type, quoteJson(readJsonString(text)), depth++);
    }
    if (depth != 0 || dump.empty()) throw std::runtime_error("a tree without its end");
    return dump;
}

void SyntaxDump::writeFlat(std::string& out, std::size_t first, std::size_t last) const {
    for (std::size_t i = first; i < last; ++i) {
        if (i > first) out += ' ';
        out += nodes_[i].head;
        const std::size_t next = i + 1 < last ? nodes_[i + 1].depth : nodes_[first].depth;
        out.append(nodes_[i].depth + 1 - next, ')');
    }
}

std::string SyntaxDump::flat() const {
    std::string out;
    writeFlat(out, 0, nodes_.size());
    return out;
}

std::string SyntaxDump::pretty() const {
    // Length on one line and end of each node's subtree, from the leaves upwards.
    std::vector<std::size_t> length(nodes_.size()), end(nodes_.size());
    for (std::size_t i = nodes_.size(); i-- > 0;) {
        length[i] = nodes_[i].head.size() + 1;
        end[i] = i + 1;
        while (end[i] < nodes_.size() && nodes_[end[i]].depth > nodes_[i].depth) {
            length[i] += 1 + length[end[i]];
            end[i] = end[end[i]];
        }
    }
    std::string out;
    for (std::size_t i = 0; i < nodes_.size();) {
        const std::size_t depth = nodes_[i].depth;
        if (i > 0) out += '\n';
        out.append(2 * depth, ' ');
        const bool whole = 2 * depth + length[i] <= kWidth || end[i] == i + 1;
        const std::size_t next = whole ? end[i] : i + 1;
        if (whole)
            writeFlat(out, i, next);
        else
            out += nodes_[i].head;
        if (whole) out.append(depth - (next < nodes_.size() ? nodes_[next].depth : 0), ')');
        i = next;
    }
    return out;
}

}  // namespace zr::test
