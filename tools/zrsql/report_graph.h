#pragma once

#include <string>
#include <unordered_map>
#include <vector>

#include "traced_project.h"

namespace zr::tool {

// The anchors of tables and queries on the report's page.
using Anchors = std::unordered_map<const CZRSourceInfo*, std::string>;

// Appends the tables and queries of a project as SVG, each a link to its anchor, what is read left of who
// reads it, with a line between them.
void appendGraph(std::string& out, TracedProject& project, const Anchors& anchors);

}  // namespace zr::tool
