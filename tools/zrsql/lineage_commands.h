#pragma once

#include "lineage_options.h"
#include "told.h"

namespace zr::tool {

// Does what "zrsql lineage", "zrsql impact" or "zrsql report" says. Raises ProjectFailure
// (project_commands.h), Interrupted (long_work.h) or an error of the host's project (host/project.h).
Told runLineage(const LineageOptions& options);

}  // namespace zr::tool
