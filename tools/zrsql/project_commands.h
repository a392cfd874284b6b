#pragma once

#include <string>

#include "project_options.h"
#include "told.h"

namespace zr::tool {

// What can't be done with a project; the message tells what and where.
class ProjectFailure : public std::runtime_error {
 public:
    using std::runtime_error::runtime_error;
};

// Does what one of the commands of "zrsql project" says. Raises ProjectFailure, WrongUse, Interrupted
// (long_work.h), InputError (input.h) or an error of the host's project (host/project.h).
Told runProject(const ProjectOptions& options);

// The dialect of a project that was read from a file. Raises ProjectFailure when there is none.
const Dialect& dialectOf(const host::Database& database, const std::string& file);

}  // namespace zr::tool
