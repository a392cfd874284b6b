#pragma once

#include <cstddef>
#include <cstdint>

/// What the program asks of the heap, counted by replaced operators new and delete.
namespace zr::bench {

struct HeapUse {
    std::uint64_t allocations = 0;
    std::int64_t peakBytes = 0;  ///< above what was held when counting started
    std::int64_t keptBytes = 0;  ///< held at the end and not at the start
};

/// Counts what its thread does as long as it lives; one at a time.
class HeapCount {
 public:
    HeapCount();
    ~HeapCount();
    HeapCount(const HeapCount&) = delete;
    HeapCount& operator=(const HeapCount&) = delete;
    HeapUse use() const;
};

}  // namespace zr::bench
