#pragma once

#include <string>

#include "lineage_options.h"

namespace zr::tool {

// Does what "zrsql lineage", "zrsql impact" or "zrsql report" says and appends what it has to tell. Raises
// ProjectFailure (project_commands.h) or an error of the host's project (host/project.h).
void runLineage(const LineageOptions& options, std::string& out);

}  // namespace zr::tool
