#include "batch.h"

#include <unistd.h>

#include <chrono>
#include <condition_variable>
#include <deque>
#include <memory>
#include <mutex>
#include <optional>
#include <thread>
#include <vector>

namespace zr::tool {

namespace {

class Progress {
 public:
    void lineDone() {
        ++lines_;
        if (isShown_ && std::chrono::steady_clock::now() - lastShown_ > std::chrono::milliseconds(100))
            show();
    }
    ~Progress() {
        if (isShown_) {
            show();
            std::fputc('\n', stderr);
        }
    }

 private:
    void show() {
        std::fprintf(stderr, "\r%zu lines", lines_);
        std::fflush(stderr);
        lastShown_ = std::chrono::steady_clock::now();
    }

    const bool isShown_ = isatty(STDERR_FILENO) != 0;
    std::size_t lines_ = 0;
    std::chrono::steady_clock::time_point lastShown_ = std::chrono::steady_clock::now();
};

class Writer {
 public:
    explicit Writer(std::FILE* output) : output_(output) {}
    void write(std::string line) {
        line += '\n';
        std::fwrite(line.data(), 1, line.size(), output_);
        std::fflush(output_);
        progress_.lineDone();
    }

 private:
    std::FILE* output_;
    Progress progress_;
};

// The lines at work, in order. The reader puts them in at one end, workers take any, and the writer takes the
// oldest when it is done.
class Window {
 public:
    explicit Window(std::size_t most) : most_(most) {}

    void put(std::string line) {
        std::unique_lock lock(mutex_);
        changed_.wait(lock, [&] { return slots_.size() < most_; });
        slots_.push_back(std::make_unique<Slot>(Slot{std::move(line), std::nullopt}));
        changed_.notify_all();
    }
    void end() {
        const std::lock_guard lock(mutex_);
        ended_ = true;
        changed_.notify_all();
    }
    void work(const LineWorker& worker) {
        while (Slot* slot = take()) {
            std::string answer = worker(slot->line);
            const std::lock_guard lock(mutex_);
            slot->answer = std::move(answer);
            changed_.notify_all();
        }
    }
    // The oldest answer, or nothing when all have been given.
    std::optional<std::string> oldest() {
        std::unique_lock lock(mutex_);
        changed_.wait(lock, [&] { return slots_.empty() ? ended_ : slots_.front()->answer.has_value(); });
        if (slots_.empty()) return std::nullopt;
        std::optional<std::string> answer = std::move(slots_.front()->answer);
        slots_.pop_front();
        --taken_;
        changed_.notify_all();
        return answer;
    }

 private:
    struct Slot {
        std::string line;
        std::optional<std::string> answer;
    };

    Slot* take() {
        std::unique_lock lock(mutex_);
        changed_.wait(lock, [&] { return taken_ < slots_.size() || ended_; });
        return taken_ < slots_.size() ? slots_[taken_++].get() : nullptr;
    }

    const std::size_t most_;
    std::mutex mutex_;
    std::condition_variable changed_;
    std::deque<std::unique_ptr<Slot>> slots_;
    std::size_t taken_ = 0;  // the first of the slots that workers have taken
    bool ended_ = false;
};

void runInline(std::istream& input, Writer& writer, const LineWorker& worker) {
    std::string line;
    while (std::getline(input, line)) writer.write(worker(line));
}

void runThreads(std::istream& input, Writer& writer, unsigned jobs,
                const std::function<LineWorker()>& newWorker) {
    static constexpr std::size_t linesPerJob = 64;
    Window window(jobs * linesPerJob);
    std::vector<std::jthread> threads;
    for (unsigned job = 0; job < jobs; ++job)
        threads.emplace_back([&window, worker = newWorker()] { window.work(worker); });
    threads.emplace_back([&window, &writer] {
        while (auto answer = window.oldest()) writer.write(std::move(*answer));
    });
    std::string line;
    while (std::getline(input, line)) window.put(std::move(line));
    window.end();
}

}  // namespace

void runBatch(std::istream& input, std::FILE* output, unsigned jobs,
              const std::function<LineWorker()>& newWorker) {
    Writer writer(output);
    if (jobs <= 1)
        runInline(input, writer, newWorker());
    else
        runThreads(input, writer, jobs, newWorker);
}

}  // namespace zr::tool
