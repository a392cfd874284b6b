#pragma once

#include <stdexcept>
#include <string>

namespace zr::gc {

/// A refusal of the grammar compiler: what is wrong, in which file, on which line.
class GrammarError : public std::runtime_error {
 public:
    GrammarError(const std::string& file, int line, const std::string& what)
        : std::runtime_error(file + ":" + std::to_string(line) + ": error: " + what) {}
};

}  // namespace zr::gc
