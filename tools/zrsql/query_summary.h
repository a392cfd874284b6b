#pragma once

#include <vector>

#include "host/lineage.h"
#include "summary.h"

namespace zr::tool {

// What came of queries of a project: how many are known whole, and how many not, each counted once with the
// first reason that holds.
class QuerySummary {
 public:
    // Why not all of a query is known.
    struct Gap {
        bool isInRing = false;
        host::Unknown missing = host::Unknown::No;  // ColumnTracer::missingOf
        bool hasUnknownSource = false;
    };
    void add(const Gap& gap);
    Summary summary(std::chrono::milliseconds elapsed) const;

 private:
    std::uint64_t whole_ = 0;
    std::uint64_t inRing_ = 0;
    std::uint64_t notRead_ = 0;
    std::uint64_t notAnalysed_ = 0;
    std::uint64_t unknownSources_ = 0;
};

// Whether a result column has a source that is unknown.
bool hasUnknownSource(const host::ColumnTracer::Columns& columns);

}  // namespace zr::tool
