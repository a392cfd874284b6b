#pragma once

#include <stdexcept>
#include <vector>

#include "host/database.h"

namespace zr::host {

// Queries that read from each other in a ring; the message names them.
class CyclicQueries : public std::runtime_error {
 public:
    using std::runtime_error::runtime_error;
};

// Analyses the queries of a database, each behind those that it reads from, and leaves them in that order.
// Raises CyclicQueries, with no query analysed, when there is no such order.
void analyseQueries(Database& database);

// Queries of which each reads from the next, and the last from the first.
using Ring = std::vector<const CZRQueryInfo*>;

// The same for a database that may have such rings: queries in one stand in some order. Gives the rings, at
// least one for each set of queries that all read from each other; empty when there is none.
std::vector<Ring> analyseQueriesInRings(Database& database);

}  // namespace zr::host
