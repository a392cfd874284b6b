#pragma once

#include <string>

#include "project_options.h"

namespace zr::tool {

// What can't be done with a project; the message tells what and where.
class ProjectFailure : public std::runtime_error {
 public:
    using std::runtime_error::runtime_error;
};

// Does what one of the commands of "zrsql project" says and appends what it has to tell. Raises
// ProjectFailure, WrongUse, InputError (input.h) or an error of the host's project (host/project.h).
void runProject(const ProjectOptions& options, std::string& out);

// The dialect of a project that was read from a file. Raises ProjectFailure when there is none.
const Dialect& dialectOf(const host::Database& database, const std::string& file);

}  // namespace zr::tool
