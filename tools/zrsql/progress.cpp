#include "progress.h"

#include <algorithm>
#include <cmath>

namespace zr::tool {

namespace {

double seconds(const BatchState& state) {
    return std::chrono::duration<double>(state.elapsed).count();
}

std::string rate(const BatchState& state) {
    const double passed = std::max(seconds(state), 0.001);
    return std::to_string(std::llround(static_cast<double>(state.done + state.failed) / passed)) + "/s";
}

// 0:07, 12:30, 1:02:03
std::string clockText(double time) {
    const auto whole = static_cast<std::uint64_t>(std::ceil(time));
    const auto twoDigits = [](std::uint64_t number) {
        return (number < 10 ? "0" : "") + std::to_string(number);
    };
    const std::uint64_t hours = whole / 3600, minutes = whole / 60 % 60;
    const std::string front =
        hours ? std::to_string(hours) + ":" + twoDigits(minutes) : std::to_string(minutes);
    return front + ":" + twoDigits(whole % 60);
}

}  // namespace

std::string progressText(const BatchState& state) {
    std::string text = std::to_string(state.done + state.failed) + " queries, " + rate(state);
    if (state.allBytes && state.bytes > 0) {
        const std::uint64_t left = *state.allBytes > state.bytes ? *state.allBytes - state.bytes : 0;
        text += ", " +
                clockText(seconds(state) * static_cast<double>(left) / static_cast<double>(state.bytes)) +
                " left";
    }
    return text;
}

std::string summaryText(const BatchState& state) {
    return (state.interrupted ? "interrupted: " : "") + std::to_string(state.done) + " done, " +
           std::to_string(state.failed) + " failed, " + clockText(seconds(state)) + " (" + rate(state) + ")";
}

void Progress::show(const BatchState& state) {
    const std::chrono::milliseconds pause(isTerminal_ ? 100 : 1000);
    if (shown_ && state.elapsed - *shown_ < pause) return;
    shown_ = state.elapsed;
    write(progressText(state), false);
}

void Progress::end(const BatchState& state) {
    write(summaryText(state), true);
}

void Progress::write(const std::string& text, bool isLast) {
    std::string line;
    if (isTerminal_) line += '\r';
    line += text;
    if (isTerminal_ && text.size() < width_) line.append(width_ - text.size(), ' ');
    if (!isTerminal_ || isLast) line += '\n';
    width_ = text.size();
    std::fwrite(line.data(), 1, line.size(), out_);
    std::fflush(out_);
}

}  // namespace zr::tool
