#pragma once

#include <string>
#include <vector>

#include "lineage_options.h"
#include "traced_project.h"

namespace zr::tool {

// The result columns of queries with their sources.
void appendLineage(std::string& out, LineageFormat format, TracedProject& project,
                   const std::vector<const CZRQueryInfo*>& queries);

// All that depends on a target, as pretty or JSON.
void appendImpact(std::string& out, LineageFormat format, TracedProject& project,
                  const host::LineageTarget& target);

// The name of a column's origin, such as orders.id or ?.id.
std::u16string originName(const host::ColumnOrigin& origin);

// The expression of a result column as SQL; "*" where one stands for it.
std::u16string expressionOf(const host::ResultColumn& column);

// {"source":..,"column":..,"known":..,"why":..}
void appendOriginJson(std::string& out, const host::ColumnOrigin& origin);

}  // namespace zr::tool
