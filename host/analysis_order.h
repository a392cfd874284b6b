#pragma once

#include <stdexcept>

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

}  // namespace zr::host
