#pragma once

#include <chrono>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace zr::tool {

// What came of a piece of work: what was done first, then what was not, and why.
struct Summary {
    bool interrupted = false;
    std::vector<std::string> parts;  // such as "1947 queries done", "40 not read to their end"
    std::chrono::milliseconds elapsed{0};
    std::optional<std::uint64_t> counted;  // pieces, to tell how many a second
    std::string goesOn;                    // how the rest is done; may be empty
};

// One line, such as "interrupted: 1498 done, 2 failed, 0:30 (50/s); --skip 1500 goes on from there".
std::string summaryText(const Summary& summary);

// 1 query, 2 queries.
std::string counted(std::uint64_t count, const char* one, const char* many);

// Pieces a second.
std::string rateText(std::uint64_t count, std::chrono::milliseconds elapsed);
// 0:07, 12:30, 1:02:03; a part of a second counts as one.
std::string clockText(double seconds);

}  // namespace zr::tool
