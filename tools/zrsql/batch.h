#pragma once

#include <cstdint>
#include <cstdio>
#include <functional>
#include <string>
#include <string_view>

#include "progress.h"

namespace zr::tool {

// Appends the answer to one line of input, without its end, and tells whether it is one: false for an error.
// The number counts the lines from 1. One worker serves one thread.
using LineWorker = std::function<bool(std::string_view line, std::uint64_t number, std::string& answer)>;

struct Batch {
    int input = 0;  // a descriptor that is open; not closed
    std::FILE* output = nullptr;
    std::uint64_t skip = 0;        // lines to pass over first; they count in the numbers of lines
    unsigned jobs = 1;             // threads that work
    Progress* progress = nullptr;  // null: none is shown
    std::function<LineWorker()> newWorker;
};

// Sends each line of the input through a worker and writes the answers in the order of the lines, without
// waiting for input that comes behind them, so that a program on the other end of a pipe may wait for them.
// What is held in memory is bounded by the number of jobs and the longest line. An interrupt ends the
// reading; what was begun is finished and written. So does output that can't be written. Gives how far it
// came.
//
// Throws ReadError (line_chunks.h) when the input can't be read, behind what was read of it, and what a
// worker throws.
BatchState runBatch(const Batch& batch);

}  // namespace zr::tool
