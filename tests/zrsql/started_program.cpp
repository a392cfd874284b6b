#include "started_program.h"

#include <fcntl.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <stdexcept>
#include <utility>

namespace zr::test {

namespace {

struct Pipe {
    Pipe() {
        int ends[2];
        // Ends that later programs inherited would keep pipes open.
        if (pipe2(ends, O_CLOEXEC) != 0) throw std::runtime_error("no pipe");
        reading = ends[0];
        writing = ends[1];
    }
    int reading = -1;
    int writing = -1;
};

std::string readAll(int descriptor) {
    std::string bytes;
    char block[1 << 16];
    for (ssize_t count; (count = read(descriptor, block, sizeof block)) > 0;)
        bytes.append(block, static_cast<std::size_t>(count));
    return bytes;
}

// Without its end; empty when there is none. What is read beyond it is kept.
std::string nextLine(int descriptor, std::string& kept) {
    std::size_t end;
    while ((end = kept.find('\n')) == std::string::npos) {
        char block[1 << 12];
        const ssize_t count = read(descriptor, block, sizeof block);
        if (count <= 0) return {};
        kept.append(block, static_cast<std::size_t>(count));
    }
    std::string line = kept.substr(0, end);
    kept.erase(0, end + 1);
    return line;
}

void closeOnce(int& descriptor) {
    if (descriptor >= 0) close(std::exchange(descriptor, -1));
}

}  // namespace

StartedProgram::StartedProgram(const std::vector<std::string>& arguments) {
    std::signal(SIGPIPE, SIG_IGN);
    std::vector<std::string> words = {ZR_BIN_DIR "/zrsql"};
    words.insert(words.end(), arguments.begin(), arguments.end());
    std::vector<char*> pointers;
    for (std::string& word : words) pointers.push_back(word.data());
    pointers.push_back(nullptr);
    const Pipe in, out, err;
    child_ = fork();
    if (child_ == 0) {
        dup2(in.reading, STDIN_FILENO);
        dup2(out.writing, STDOUT_FILENO);
        dup2(err.writing, STDERR_FILENO);
        std::signal(SIGTERM, SIG_DFL);
        std::signal(SIGINT, SIG_DFL);  // whoever runs the tests in the background may have it passed over
        execv(pointers[0], pointers.data());
        _exit(127);
    }
    for (const int theirs : {in.reading, out.writing, err.writing}) close(theirs);
    input_ = in.writing;
    output_ = out.reading;
    errors_ = err.reading;
}

StartedProgram::~StartedProgram() {
    if (child_ > 0) {
        kill(child_, SIGKILL);
        wait();
    }
}

void StartedProgram::write(const std::string& bytes) {
    for (std::size_t done = 0; done < bytes.size();) {
        const ssize_t count = ::write(input_, bytes.data() + done, bytes.size() - done);
        if (count <= 0) break;  // the program may end without reading its input
        done += static_cast<std::size_t>(count);
    }
}

void StartedProgram::closeInput() {
    closeOnce(input_);
}

std::string StartedProgram::readLine() {
    return nextLine(output_, read_);
}

std::string StartedProgram::readErrorLine() {
    return nextLine(errors_, readErrors_);
}

std::string StartedProgram::readRest() {
    return std::exchange(read_, {}) + readAll(output_);
}

void StartedProgram::signal(int number) const {
    kill(child_, number);
}

StartedProgram::End StartedProgram::wait() {
    End end;
    closeInput();
    readAll(output_);
    end.errors = std::exchange(readErrors_, {}) + readAll(errors_);
    int status = 0;
    rusage used{};
    wait4(std::exchange(child_, -1), &status, 0, &used);
    if (WIFEXITED(status)) end.exitStatus = WEXITSTATUS(status);
    if (WIFSIGNALED(status)) end.signal = WTERMSIG(status);
    end.peakKilobytes = used.ru_maxrss;
    closeOnce(output_);
    closeOnce(errors_);
    return end;
}

}  // namespace zr::test
