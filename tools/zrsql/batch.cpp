#include "batch.h"

#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <exception>
#include <mutex>
#include <thread>
#include <vector>

#include "chunk_window.h"
#include "interrupt_watch.h"

namespace zr::tool {

namespace {

constexpr std::size_t kChunksPerJob = 4;

// What is left of a file from where it is read on.
std::optional<std::uint64_t> sizeOf(int input) {
    struct stat status {};
    if (fstat(input, &status) != 0 || !S_ISREG(status.st_mode)) return std::nullopt;
    const off_t place = lseek(input, 0, SEEK_CUR);
    if (place < 0 || place > status.st_size) return std::nullopt;
    return static_cast<std::uint64_t>(status.st_size - place);
}

// The first exception of several threads.
class Problem {
 public:
    void note(std::exception_ptr problem) {
        const std::lock_guard lock(mutex_);
        if (!problem_) problem_ = std::move(problem);
    }
    void rethrow() const {
        if (problem_) std::rethrow_exception(problem_);
    }

 private:
    std::mutex mutex_;
    std::exception_ptr problem_;
};

void workOn(ChunkWindow::Slot& slot, const LineWorker& worker) {
    std::string_view lines = slot.chunk.lines;
    std::uint64_t number = slot.chunk.firstLine;
    while (!lines.empty()) {
        const std::string_view line = lines.substr(0, lines.find('\n'));
        ++(worker(line, number++, slot.answers) ? slot.done : slot.failed);
        slot.answers += '\n';
        lines.remove_prefix(std::min(line.size() + 1, lines.size()));
    }
}

void workAll(ChunkWindow& window, const LineWorker& worker, Problem& problem) {
    while (ChunkWindow::Slot* slot = window.take()) {
        try {
            workOn(*slot, worker);
        } catch (...) {
            problem.note(std::current_exception());
            slot->isBroken = true;
            window.stop();
        }
        window.finish(*slot);
    }
}

class Writer {
 public:
    explicit Writer(const Batch& batch) : batch_(batch) { state_.allBytes = sizeOf(batch.input); }

    // Before the writing begins.
    void noteSkipped(const SkippedLines& skipped) {
        state_.skipped = skipped.lines;
        if (state_.allBytes) *state_.allBytes -= std::min(*state_.allBytes, skipped.bytes);
    }

    void writeAll(ChunkWindow& window) {
        bool isBroken = false;
        while (const auto slot = window.oldest()) {
            isBroken = isBroken || slot->isBroken;
            if (isBroken) continue;  // what comes behind would leave a gap
            std::fwrite(slot->answers.data(), 1, slot->answers.size(), batch_.output);
            if (std::fflush(batch_.output) != 0) window.stop();
            state_.done += slot->done;
            state_.failed += slot->failed;
            state_.bytes += slot->chunk.lines.size();
            look();
            if (batch_.progress) batch_.progress->show(state_.elapsed, progressText(state_));
        }
    }
    BatchState end(bool interrupted) {
        look();
        state_.interrupted = interrupted;
        return state_;
    }

 private:
    void look() {
        state_.elapsed =
            std::chrono::duration_cast<std::chrono::milliseconds>(std::chrono::steady_clock::now() - start_);
    }

    const Batch& batch_;
    const std::chrono::steady_clock::time_point start_ = std::chrono::steady_clock::now();
    BatchState state_;
};

// Whatever happens to the reader, the threads come to their end.
struct Ender {
    ChunkWindow& window;
    ~Ender() { window.end(); }
};

}  // namespace

BatchState runBatch(const Batch& batch) {
    ChunkWindow window(batch.jobs * kChunksPerJob);
    Problem problem;
    Writer writer(batch);
    const InterruptWatch interrupt([&window] { window.stop(); });
    {
        LineChunks chunks(batch.input, interrupt.descriptor());
        writer.noteSkipped(chunks.skip(batch.skip));
        std::vector<std::jthread> threads;
        const Ender atTheEnd{window};
        for (unsigned job = 0; job < batch.jobs; ++job)
            threads.emplace_back(
                [&window, &problem, worker = batch.newWorker()] { workAll(window, worker, problem); });
        threads.emplace_back([&writer, &window] { writer.writeAll(window); });
        while (auto chunk = chunks.next())
            if (!window.put(std::move(*chunk))) break;
        window.end();
        threads.clear();
    }
    problem.rethrow();
    return writer.end(interrupt.wasInterrupted());
}

}  // namespace zr::tool
