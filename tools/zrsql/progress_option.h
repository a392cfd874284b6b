#pragma once

#include <CLI/CLI.hpp>

namespace zr::tool {

// Of commands that go through a whole project.
inline void addProgressTo(CLI::App& command, bool& showsProgress) {
    command.add_flag("--progress", showsProgress,
                     "Tell on standard error how far it is, once a second; a terminal is told anyway");
}

}  // namespace zr::tool
