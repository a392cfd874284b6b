#pragma once

#include <map>
#include <set>
#include <string>
#include <vector>

#include "traced_project.h"

namespace zr::test {

using Names = std::set<std::string>;

// The lines "name: word word ..." of files under tests/servers/shop, those that begin with # left out.
std::vector<std::pair<std::string, std::string>> readLines(const std::vector<std::string>& files);

struct Score {
    std::size_t right = 0;
    std::size_t wrong = 0;
    std::size_t missed = 0;

    void add(const Names& expected, const Names& found);
    double precision() const;
    double recall() const;
};
std::ostream& operator<<(std::ostream& out, const Score& score);

// What the lineage of a project says, held against expectations ("view.column: table.column ...").
struct Comparison {
    std::size_t views = 0;
    std::size_t columns = 0;  // of views that were read whole, and so were the views behind them
    Score score;              // of these columns' sources
    Names notWhole;           // views whose text was not read to its end
    Names uponNotWhole;       // views that were read whole and read from such a one
    Names differences;        // columns whose sources are others, and views whose columns are others
    std::vector<std::string>
        claims;  // known sources that are wrong, in any view: "view.column: table.column"
};
Comparison compare(tool::TracedProject& project, const std::vector<std::string>& files);

// "source.column" of all that a query names itself, in any clause; what is unknown left out.
Names namedBy(tool::TracedProject& project, const CZRQueryInfo& query);

}  // namespace zr::test
