#pragma once

#include <sys/types.h>

#include <string>
#include <vector>

namespace zr::test {

// zrsql at work, with the test at the other ends of its pipes. What it tells on standard error is to be less
// than a pipe takes (64 KB).
class StartedProgram {
 public:
    explicit StartedProgram(const std::vector<std::string>& arguments);
    ~StartedProgram();
    StartedProgram(const StartedProgram&) = delete;
    StartedProgram& operator=(const StartedProgram&) = delete;

    void write(const std::string& bytes);
    void closeInput();
    // The next line of its output without the end, or an empty text when there is none.
    std::string readLine();
    std::string readRest();
    // The next line of what it tells on standard error; not told again by wait().
    std::string readErrorLine();
    void signal(int number) const;

    struct End {
        int exitStatus = -1;  // -1 when a signal ended it
        int signal = 0;
        long peakKilobytes = 0;
        std::string errors;
    };
    End wait();

 private:
    pid_t child_ = -1;
    int input_ = -1;
    int output_ = -1;
    int errors_ = -1;
    std::string read_;
    std::string readErrors_;
};

}  // namespace zr::test
