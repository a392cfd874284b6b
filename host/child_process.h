#pragma once

#include <chrono>
#include <cstddef>
#include <string>
#include <vector>

namespace zr::host {

// What became of a program that was run.
struct ProgramEnd {
    enum class How {
        Exited,
        Missing,  // there is no such program
        Failed,   // it can't be started, or a signal ended it
        TooSlow,  // it was ended when its time was over
        TooMuch,  // it was ended when it wrote more than is taken
    };
    How how = How::Failed;
    int status = 0;  // where it exited
    std::string output;
    std::string complaints;  // its standard error, the beginning of it

    bool isDone() const { return how == How::Exited && status == 0; }
};

struct ProgramBounds {
    std::chrono::milliseconds time = std::chrono::seconds(60);
    std::size_t output = std::size_t(256) << 20;
};

// Runs a program that is looked for in PATH, its name being the first word, without a shell and without
// input, and waits for its end. Its environment is this process's, but for the given NAME=VALUE; a name
// without "=" is taken out.
ProgramEnd runProgram(const std::vector<std::string>& words, const std::vector<std::string>& environment,
                      const ProgramBounds& bounds = {});

}  // namespace zr::host
