#pragma once

#include <string>

#include "traced_project.h"

namespace zr::tool {

// Appends one HTML page about a project that needs nothing beside itself: counts, what could not be analysed,
// the graph of what reads from what, and each query and table. The page is well-formed XML, too.
void appendReport(std::string& out, TracedProject& project, const std::string& title);

}  // namespace zr::tool
