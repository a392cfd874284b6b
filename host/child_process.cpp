#include "host/child_process.h"

#include <fcntl.h>
#include <poll.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <csignal>
#include <string_view>

namespace zr::host {

namespace {

using Clock = std::chrono::steady_clock;

constexpr std::size_t kComplaints = 4096;

class Pipe {
 public:
    Pipe() { isOpen_ = pipe2(ends_, O_CLOEXEC) == 0; }
    ~Pipe() {
        closeEnd(0);
        closeEnd(1);
    }
    Pipe(const Pipe&) = delete;
    Pipe& operator=(const Pipe&) = delete;

    bool isOpen() const { return isOpen_; }
    int reading() const { return ends_[0]; }
    int writing() const { return ends_[1]; }
    void closeEnd(int end) {
        if (ends_[end] >= 0) close(ends_[end]);
        ends_[end] = -1;
    }

 private:
    int ends_[2] = {-1, -1};
    bool isOpen_ = false;
};

std::vector<char*> pointersTo(std::vector<std::string>& words) {
    std::vector<char*> pointers;
    pointers.reserve(words.size() + 1);
    for (std::string& word : words) pointers.push_back(word.data());
    pointers.push_back(nullptr);
    return pointers;
}

std::vector<std::string> environmentWith(const std::vector<std::string>& changes) {
    const auto nameOf = [](std::string_view entry) { return entry.substr(0, entry.find('=')); };
    std::vector<std::string> all;
    for (char** entry = environ; *entry; ++entry) {
        const bool isChanged = std::any_of(changes.begin(), changes.end(), [&](const std::string& change) {
            return nameOf(change) == nameOf(*entry);
        });
        if (!isChanged) all.emplace_back(*entry);
    }
    for (const std::string& change : changes)
        if (change.find('=') != change.npos) all.push_back(change);
    return all;
}

// 0, or the error's number.
int start(pid_t& process, std::vector<std::string> words, std::vector<std::string> environment,
          const Pipe& output, const Pipe& complaints) {
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    posix_spawn_file_actions_addopen(&actions, STDIN_FILENO, "/dev/null", O_RDONLY, 0);
    posix_spawn_file_actions_adddup2(&actions, output.writing(), STDOUT_FILENO);
    posix_spawn_file_actions_adddup2(&actions, complaints.writing(), STDERR_FILENO);
    const int error = posix_spawnp(&process, words.front().c_str(), &actions, nullptr,
                                   pointersTo(words).data(), pointersTo(environment).data());
    posix_spawn_file_actions_destroy(&actions);
    return error;
}

// False at the end of what is written.
bool readOnce(int descriptor, std::string& into, std::size_t most) {
    char bytes[16384];
    const ssize_t count = read(descriptor, bytes, sizeof bytes);
    if (count < 0) return errno == EINTR;
    into.append(bytes, std::min(static_cast<std::size_t>(count), most - std::min(most, into.size())));
    return count > 0;
}

// Reads both until they end; Exited when they did.
ProgramEnd::How readAll(ProgramEnd& end, const Pipe& output, const Pipe& complaints,
                        const ProgramBounds& bounds) {
    const Clock::time_point deadline = Clock::now() + bounds.time;
    pollfd both[] = {{output.reading(), POLLIN, 0}, {complaints.reading(), POLLIN, 0}};
    while (both[0].fd >= 0 || both[1].fd >= 0) {
        const auto left = std::chrono::duration_cast<std::chrono::milliseconds>(deadline - Clock::now());
        if (left.count() <= 0) return ProgramEnd::How::TooSlow;
        if (poll(both, 2, static_cast<int>(left.count())) < 0 && errno != EINTR)
            return ProgramEnd::How::Failed;
        if (both[0].revents && !readOnce(both[0].fd, end.output, bounds.output + 1)) both[0].fd = -1;
        if (both[1].revents && !readOnce(both[1].fd, end.complaints, kComplaints)) both[1].fd = -1;
        if (end.output.size() > bounds.output) return ProgramEnd::How::TooMuch;
    }
    return ProgramEnd::How::Exited;
}

}  // namespace

ProgramEnd runProgram(const std::vector<std::string>& words, const std::vector<std::string>& environment,
                      const ProgramBounds& bounds) {
    ProgramEnd end;
    Pipe output;
    Pipe complaints;
    if (!output.isOpen() || !complaints.isOpen()) return end;
    pid_t process = 0;
    if (const int error = start(process, words, environmentWith(environment), output, complaints)) {
        if (error == ENOENT) end.how = ProgramEnd::How::Missing;
        return end;
    }
    output.closeEnd(1);
    complaints.closeEnd(1);
    end.how = readAll(end, output, complaints, bounds);
    if (end.how != ProgramEnd::How::Exited) kill(process, SIGKILL);
    int status = 0;
    while (waitpid(process, &status, 0) < 0 && errno == EINTR) {
    }
    if (end.how != ProgramEnd::How::Exited) return end;
    if (WIFEXITED(status))
        end.status = WEXITSTATUS(status);
    else
        end.how = ProgramEnd::How::Failed;
    return end;
}

}  // namespace zr::host
