#pragma once

#include <stdexcept>
#include <string>
#include <vector>

namespace zr::host {

// MS Access keeps no text of a query but rows of its parts; "attribute" tells what a row is.
struct AccessQueryPart {
    int attribute = 0;
    int flag = 0;
    std::string name1;
    std::string name2;
    std::string expression;
};

// Why a query has no text to analyse.
class NoAccessQuery : public std::runtime_error {
 public:
    using std::runtime_error::runtime_error;
};

// The SQL text of a query's parts, which are UTF-8 and in the order in which they are stored: selections with
// joins, groups and orders, unions, and the text of definitions and of queries for a server. Raises
// NoAccessQuery for one that changes data and for a crosstab.
std::string textOfAccessQuery(const std::vector<AccessQueryPart>& parts);

}  // namespace zr::host
