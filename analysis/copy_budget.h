#pragma once

#include <cstddef>

class CZRAliasInfo;
class SelectItem;

namespace zr {

// What the copies that one analysis makes may come to, in items or what takes as much memory. An alias that
// stands for an expression with aliases in it grows with each of them, so a chain of such aliases doubles
// from one to the next. Once something doesn't fit, the budget is spent for good: the descriptor then holds
// all copies up to one point of the walk, and none behind it.
class CopyBudget {
 public:
    explicit CopyBudget(std::size_t units) : left_(units) {}

    bool isSpent() const { return spent_; }
    // Answers whether there was that much left.
    bool take(std::size_t units);
    // The same for the copy of an item, or of an alias, with all that hangs below it.
    bool takeCopyOf(const SelectItem& item);
    bool takeCopyOf(const CZRAliasInfo& alias);
    // The same for a new descriptor of a nested query.
    bool takeQuery();

 private:
    std::size_t left_;
    bool spent_ = false;
};

}  // namespace zr
