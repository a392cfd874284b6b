#pragma once

#include <mutex>

// A lock of one process. Recursive: the thread that holds it may take it again and releases it as often as it
// took it. Neither copied nor moved.
class CCriticalSection {
 public:
    CCriticalSection() = default;
    CCriticalSection(const CCriticalSection&) = delete;
    CCriticalSection& operator=(const CCriticalSection&) = delete;

    // Waits until the lock is free.
    void Lock() { mutex_.lock(); }
    // Must be called by the thread that holds the lock.
    void Unlock() { mutex_.unlock(); }

 private:
    std::recursive_mutex mutex_;
};

namespace zr {

// Holds a lock for the length of a block.
class CriticalSectionGuard {
 public:
    explicit CriticalSectionGuard(CCriticalSection& section) : section_(section) { section_.Lock(); }
    ~CriticalSectionGuard() { section_.Unlock(); }
    CriticalSectionGuard(const CriticalSectionGuard&) = delete;
    CriticalSectionGuard& operator=(const CriticalSectionGuard&) = delete;

 private:
    CCriticalSection& section_;
};

}  // namespace zr
