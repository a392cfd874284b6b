#pragma once

#include <vector>

#include "zrparsersql/export.h"

class CZRQueryInfo;

namespace zr {

// A query and every descriptor nested in it, at any depth, wherever it hangs: sub-queries, union branches,
// expressions, records of unions. The query stands first and owns the rest. The pointers hold as long as the
// query is not changed. Threads: as for the query. Failure: only an exhausted heap, as std::bad_alloc.
ZR_SHARED_DECLARATION std::vector<CZRQueryInfo*> withNestedQueries(CZRQueryInfo& query);

}  // namespace zr
