#pragma once

#include <vector>

#include "zrparsersql/nested_queries.h"

class CZRDatabaseInfo;
class CZRQueryInfo;
class SelectItem;

namespace zr {

// Where an item holds its nested query; null for an item that cannot hold one.
CZRQueryInfo** nestedQuerySlot(SelectItem& item);
inline CZRQueryInfo* nestedQueryOf(const SelectItem& item) {
    // The slot is only read.
    CZRQueryInfo** slot = nestedQuerySlot(const_cast<SelectItem&>(item));
    return slot ? *slot : nullptr;
}

// The queries of the union branches of a query: those that its m_unionItems hold, and their branches in turn,
// in order. A chain of unions stands nested, each branch inside the one before.
std::vector<CZRQueryInfo*> unionBranchesOf(const CZRQueryInfo& query);

}  // namespace zr
