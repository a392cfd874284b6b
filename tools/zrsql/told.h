#pragma once

#include <optional>
#include <string>

#include "summary.h"

namespace zr::tool {

// What a command on a project has to tell.
struct Told {
    std::string out;                 // for standard output
    std::optional<Summary> summary;  // for standard error, behind it; of long work
};

}  // namespace zr::tool
