#pragma once

#include <cstdio>
#include <functional>
#include <istream>
#include <string>
#include <string_view>

namespace zr::tool {

// Turns one line of input into one line of output, without its end. One worker serves one thread.
using LineWorker = std::function<std::string(std::string_view line)>;

// Sends each line of the input through a worker and writes the answers in the order of the lines, each as
// soon as it and all before it are there, so that a program on the other end of a pipe may wait for them. The
// number of lines held in memory is bounded. With a terminal for standard error, a count of lines runs there.
void runBatch(std::istream& input, std::FILE* output, unsigned jobs,
              const std::function<LineWorker()>& newWorker);

}  // namespace zr::tool
