#pragma once

#include <condition_variable>
#include <cstdint>
#include <deque>
#include <memory>
#include <mutex>
#include <string>

#include "line_chunks.h"

namespace zr::tool {

// The chunks at work, in order. The reader puts them in at one end and waits while the window is full,
// workers take any, and the writer takes the oldest when it is done.
class ChunkWindow {
 public:
    struct Slot {
        LineChunk chunk;
        std::string answers;
        std::uint64_t done = 0;
        std::uint64_t failed = 0;
        bool isFinished = false;
        bool isBroken = false;  // the worker gave up; the answers are not whole
    };

    explicit ChunkWindow(std::size_t most) : most_(most) {}

    // False when no more chunks are wanted.
    bool put(LineChunk chunk) {
        std::unique_lock lock(mutex_);
        roomCame_.wait(lock, [&] { return slots_.size() < most_ || ended_; });
        if (ended_) return false;
        slots_.push_back(std::make_unique<Slot>());
        slots_.back()->chunk = std::move(chunk);
        workCame_.notify_one();
        return true;
    }
    // No chunk will follow. What is there is worked on.
    void end() {
        const std::lock_guard lock(mutex_);
        ended_ = true;
        notifyAll();
    }
    // As end(), and forgets chunks that nobody has taken: those taken are the oldest ones, so that the
    // answers have no gap.
    void stop() {
        const std::lock_guard lock(mutex_);
        ended_ = true;
        slots_.resize(taken_);
        notifyAll();
    }
    // The next one to work on, or null when there is none left.
    Slot* take() {
        std::unique_lock lock(mutex_);
        workCame_.wait(lock, [&] { return taken_ < slots_.size() || ended_; });
        return taken_ < slots_.size() ? slots_[taken_++].get() : nullptr;
    }
    void finish(Slot& slot) {
        const std::lock_guard lock(mutex_);
        slot.isFinished = true;
        if (&slot == slots_.front().get()) oldestFinished_.notify_one();
    }
    // The oldest one with its answers, or null when all have been given.
    std::unique_ptr<Slot> oldest() {
        std::unique_lock lock(mutex_);
        oldestFinished_.wait(lock, [&] { return slots_.empty() ? ended_ : slots_.front()->isFinished; });
        if (slots_.empty()) return nullptr;
        std::unique_ptr<Slot> slot = std::move(slots_.front());
        slots_.pop_front();
        --taken_;
        roomCame_.notify_one();
        return slot;
    }

 private:
    void notifyAll() {
        roomCame_.notify_all();
        workCame_.notify_all();
        oldestFinished_.notify_all();
    }

    const std::size_t most_;
    std::mutex mutex_;
    std::condition_variable roomCame_, workCame_, oldestFinished_;
    std::deque<std::unique_ptr<Slot>> slots_;
    std::size_t taken_ = 0;  // of the slots, from the oldest on
    bool ended_ = false;
};

}  // namespace zr::tool
