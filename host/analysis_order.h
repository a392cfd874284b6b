#pragma once

#include <functional>
#include <stdexcept>
#include <vector>

#include "host/database.h"

namespace zr::host {

// Queries that read from each other in a ring; the message names them.
class CyclicQueries : public std::runtime_error {
 public:
    using std::runtime_error::runtime_error;
};

// Told before each query how many of all are analysed; what it raises ends the work.
using AnalysisProgress = std::function<void(std::size_t done, std::size_t all)>;

// Analyses the queries of a database and puts each behind those that it reads from. Raises CyclicQueries,
// with the queries in the order from before, when there is no such order.
void analyseQueries(Database& database, const AnalysisProgress& progress = {});

// Queries of which each reads from the next, and the last from the first.
using Ring = std::vector<const CZRQueryInfo*>;

// The same for a database that may have such rings: queries in one stand in some order. Gives the rings, at
// least one for each set of queries that all read from each other; empty when there is none.
std::vector<Ring> analyseQueriesInRings(Database& database, const AnalysisProgress& progress = {});

}  // namespace zr::host
