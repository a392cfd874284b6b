#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace zr::test {

/// A syntax tree as the corpus files write it, apart from any runtime: nodes in preorder, so that no depth of
/// tree needs the machine's stack.
class SyntaxDump {
 public:
    /// Adds the next node in preorder; `depth` is at most one more than that of the node before.
    void add(int type, std::string_view quotedText, std::size_t depth);

    /// Reads what `flat` or `pretty` wrote; blanks between the parts don't matter. Throws std::runtime_error.
    static SyntaxDump parse(std::string_view text);

    /// On one line: `(7 "SELECT_QUERY_" (10 "SELECT_LIST"))`.
    std::string flat() const;

    /// Broken over lines of about 100 columns, a level of the tree two blanks deeper.
    std::string pretty() const;

    bool empty() const { return nodes_.empty(); }

 private:
    struct Node {
        std::string head;  // `(7 "SELECT_QUERY_"`
        std::size_t depth;
    };
    /// Writes the nodes from `first` to `last` on one line, with the closing parentheses of the first one's
    /// subtree.
    void writeFlat(std::string& out, std::size_t first, std::size_t last) const;

    std::vector<Node> nodes_;
};

}  // namespace zr::test
