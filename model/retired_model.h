#pragma once

#include <memory>
#include <vector>

#include "zrparsersql/query_info.h"
#include "zrparsersql/table_info.h"

namespace zr {

// Tables and queries that a database took out of its lists when it was loaded anew; a host may still hold
// them.
class RetiredModel {
 public:
    std::vector<std::unique_ptr<CZRTableInfo>> tables;
    std::vector<std::unique_ptr<CZRQueryInfo>> queries;
};

}  // namespace zr
