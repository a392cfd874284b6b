#pragma once

#include <cstdio>
#include <cstdlib>
#include <string_view>

namespace zr::fuzz {

/// What has to hold for every input. Ends the program where it doesn't, as fuzzers and replays want it.
inline void require(bool holds, std::string_view what) {
    if (holds) return;
    std::fprintf(stderr, "does not hold: %.*s\n", static_cast<int>(what.size()), what.data());
    std::abort();
}

}  // namespace zr::fuzz
