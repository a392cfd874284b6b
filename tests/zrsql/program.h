#pragma once

#include <string>
#include <vector>

namespace zr::test {

struct ProgramResult {
    int exitStatus = -1;  // -1 when a signal ended it
    std::string output;
    std::string errors;
    std::string summary;  // the last line of long work, which is not among the errors, without the time
};

// Runs zrsql with the arguments and the bytes on its standard input, and waits for its end.
ProgramResult runZrsql(const std::vector<std::string>& arguments, const std::string& input = {});

// Runs a line of shell in the root of the source tree; "build/release/bin/zrsql" in it means the program
// under test.
ProgramResult runShell(const std::string& line);

// The bytes of a file; fails the test when it can't be read.
std::string readFile(const std::string& path);

// A file of the test's own with the bytes, removed with the object.
class TemporaryFile {
 public:
    explicit TemporaryFile(const std::string& bytes);
    ~TemporaryFile();
    TemporaryFile(const TemporaryFile&) = delete;
    TemporaryFile& operator=(const TemporaryFile&) = delete;
    const std::string& path() const { return path_; }

 private:
    std::string path_;
};

std::vector<std::string> splitLines(const std::string& text);

}  // namespace zr::test
