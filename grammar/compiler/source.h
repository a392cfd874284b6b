#pragma once

#include <string>
#include <vector>

namespace zr::gc {

/// One lexical item of a grammar file.
struct Item {
    enum class Kind { Name, Number, Single, Double, Set, Punct, End } kind;
    std::string text;  ///< Single/Double/Set: with their delimiters, escapes kept
    int line;
};

/// Cuts a grammar file into items. Throws GrammarError on an unclosed quote or a character that means
/// nothing.
std::vector<Item> scan(const std::string& file, const std::string& text);

/// A cursor over items with the errors that a reader needs.
class Cursor {
 public:
    Cursor(std::string file, std::vector<Item> items) : file_(std::move(file)), items_(std::move(items)) {}

    const Item& peek(std::size_t ahead = 0) const;
    Item next();
    bool accept(const std::string& punct);
    void expect(const std::string& punct);
    std::string expectName();
    int expectNumber(const std::string& after);
    /// A group starts behind its parenthesis; fails where too many are open. The passes go down into groups
    /// by calling themselves, so their depth is bounded here.
    void openGroup();
    /// And ends with its parenthesis.
    void closeGroup();
    [[noreturn]] void fail(const std::string& what) const;
    [[noreturn]] void failAt(int line, const std::string& what) const;
    const std::string& file() const { return file_; }

 private:
    std::string file_;
    std::vector<Item> items_;
    std::size_t at_ = 0;
    int openGroups_ = 0;
};

/// The whole file as text; throws GrammarError when it can't be read.
std::string readFile(const std::string& path);

}  // namespace zr::gc
