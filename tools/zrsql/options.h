#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "dialects.h"
#include "lineage_options.h"
#include "project_options.h"
#include "tree_format.h"

namespace zr::tool {

enum class Command { Tokens, Tree, Analyze };

struct Options {
    Command command = Command::Tokens;
    const Dialect* dialect = nullptr;
    std::optional<std::string> text;  // given on the command line, UTF-8
    std::string file = "-";           // where the text is read from otherwise
    std::string jsonLines;            // not empty: a text a line, from there
    TreeFormat treeFormat = TreeFormat::Sexpr;
    bool asPicture = false;                 // analyze: for a person instead of JSON
    std::string catalog;                    // empty: none
    unsigned jobs = 1;                      // at least 1
    std::uint64_t skip = 0;                 // lines of jsonLines to pass over first
    bool showsProgress = false;             // where standard error is a terminal it is shown anyway
    std::optional<ProjectOptions> project;  // given: nothing of the above counts
    std::optional<LineageOptions> lineage;  // as well
};

// Reads the command line. Where there is nothing to run (help was asked for, or the use is wrong), writes to
// standard output or standard error, stores the exit status and gives nothing.
std::optional<Options> readOptions(int argc, char** argv, int& exitStatus);

}  // namespace zr::tool
