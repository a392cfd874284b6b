#pragma once

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

// Holds the source columns of every result column of a project's views against the files of expectations,
// lines "view.column: table.column ...", and prints precision and recall. A view is measured that was read to
// its end, and so were all views behind it. What does not come out right has to be what the file of gaps
// names: views that are not read to their end, columns with other sources, and views with other columns.
void expectLineage(const std::string& project, const std::vector<std::string>& expectations,
                   const std::string& gaps);

// "source.column" of all that a query names itself, in any clause; what is unknown left out.
Names namedBy(tool::TracedProject& project, const CZRQueryInfo& query);

}  // namespace zr::test
