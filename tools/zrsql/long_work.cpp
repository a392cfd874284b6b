#include "long_work.h"

#include <unistd.h>

#include <algorithm>
#include <array>
#include <cstdio>

namespace zr::tool {

namespace {

constexpr auto kPatience = std::chrono::milliseconds(500);  // before the first line on a terminal

// What a handler of signals may touch.
volatile std::sig_atomic_t interrupts = 0;
volatile std::sig_atomic_t endsAtOnce = 0;
std::array<char, 1024> lastLine;
volatile std::sig_atomic_t lastLineSize = 0;

void takeInterrupt(int) {
    interrupts = 1;
    if (!endsAtOnce) return;
    [[maybe_unused]] const ssize_t written =
        write(STDERR_FILENO, lastLine.data(), static_cast<std::size_t>(lastLineSize));
    _exit(kInterruptedStatus);
}

void take(int signal, struct sigaction& before) {
    sigaction(signal, nullptr, &before);
    if (before.sa_handler == SIG_IGN) return;
    struct sigaction action = {};
    action.sa_handler = takeInterrupt;
    action.sa_flags = static_cast<int>(SA_RESETHAND | SA_RESTART);
    sigaction(signal, &action, nullptr);
}

}  // namespace

LongWork::LongWork(std::string what, bool showsProgress)
    : what_(std::move(what)),
      isTerminal_(isatty(STDERR_FILENO) == 1),
      isShown_(isTerminal_ || showsProgress),
      progress_(stderr, isTerminal_) {
    interrupts = 0;
    endsAtOnce = 0;
    take(SIGINT, oldInterrupt_);
    take(SIGTERM, oldEnd_);
}

LongWork::~LongWork() {
    sigaction(SIGINT, &oldInterrupt_, nullptr);
    sigaction(SIGTERM, &oldEnd_, nullptr);
    endsAtOnce = 0;
    progress_.clear();
}

void LongWork::endAtOnceWith(const std::string& line) {
    const std::string whole = (isTerminal_ ? "\r\x1b[Kzrsql: " : "zrsql: ") + line;
    endsAtOnce = 0;
    const std::size_t size = std::min(whole.size(), lastLine.size() - 1);
    std::copy_n(whole.begin(), size, lastLine.begin());
    lastLine[size] = '\n';
    lastLineSize = static_cast<std::sig_atomic_t>(size + 1);
    endsAtOnce = 1;
}

void LongWork::endAtSteps() {
    endsAtOnce = 0;
}

void LongWork::step(const std::function<std::string()>& far) {
    if (interrupts) throw Interrupted("interrupted: " + what_ + ": " + far());
    const auto passed = elapsed();
    if (!isShown_ || (isTerminal_ && passed < kPatience) || !progress_.isDue(passed)) return;
    progress_.show(passed, "zrsql: " + what_ + ": " + far());
}

void LongWork::step(const char* verb, std::size_t done, std::size_t all) {
    const auto far = [&] { return std::to_string(done) + " of " + std::to_string(all) + " queries " + verb; };
    if (!interrupts) return step(far);
    Summary summary;
    summary.interrupted = true;
    summary.parts = {counted(done, "query ", "queries ") + verb, std::to_string(all - done) + " not"};
    summary.elapsed = elapsed();
    summary.goesOn = "nothing was written, and the same command begins anew";
    throw Interrupted(summaryText(summary));
}

std::chrono::milliseconds LongWork::elapsed() const {
    return std::chrono::duration_cast<std::chrono::milliseconds>(std::chrono::steady_clock::now() - start_);
}

}  // namespace zr::tool
