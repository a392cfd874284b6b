#include "progress.h"

#include "summary.h"

namespace zr::tool {

std::string progressText(const BatchState& state) {
    const std::uint64_t answered = state.done + state.failed;
    std::string text = std::to_string(answered) + " queries, " + rateText(answered, state.elapsed);
    if (state.allBytes && state.bytes > 0) {
        const std::uint64_t left = *state.allBytes > state.bytes ? *state.allBytes - state.bytes : 0;
        const double passed = std::chrono::duration<double>(state.elapsed).count();
        text +=
            ", " + clockText(passed * static_cast<double>(left) / static_cast<double>(state.bytes)) + " left";
    }
    return text;
}

std::string summaryText(const BatchState& state) {
    Summary summary;
    summary.interrupted = state.interrupted;
    summary.parts = {std::to_string(state.done) + " done", std::to_string(state.failed) + " failed"};
    summary.elapsed = state.elapsed;
    summary.counted = state.done + state.failed;
    if (state.interrupted)
        summary.goesOn =
            "--skip " + std::to_string(state.skipped + state.done + state.failed) + " goes on from there";
    return summaryText(summary);
}

bool Progress::isDue(std::chrono::milliseconds elapsed) const {
    const std::chrono::milliseconds pause(isTerminal_ ? 100 : 1000);
    return !shown_ || elapsed - *shown_ >= pause;
}

void Progress::show(std::chrono::milliseconds elapsed, const std::string& text) {
    if (!isDue(elapsed)) return;
    shown_ = elapsed;
    write(text, false);
}

void Progress::end(const std::string& text) {
    write(text, true);
}

void Progress::clear() {
    if (!isTerminal_ || width_ == 0) return;
    const std::string blanks(width_, ' ');
    std::fprintf(out_, "\r%s\r", blanks.c_str());
    std::fflush(out_);
    width_ = 0;
}

void Progress::write(const std::string& text, bool isLast) {
    std::string line;
    if (isTerminal_) line += '\r';
    line += text;
    if (isTerminal_ && text.size() < width_) line.append(width_ - text.size(), ' ');
    if (!isTerminal_ || isLast) line += '\n';
    width_ = isLast ? 0 : text.size();
    std::fwrite(line.data(), 1, line.size(), out_);
    std::fflush(out_);
}

}  // namespace zr::tool
