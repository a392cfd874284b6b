#pragma once

#include <cstddef>
#include <thread>

// Linked into a program, replaces its global operator new by one that can be made to fail. What else
// allocates can ask the same heap: c_heap.cpp is for what this program's own objects take from C.
namespace zr::faults {

// While it lives, one allocation of this thread fails, the one behind the given number of successes, or that
// one and all behind it.
class Failure {
 public:
    enum class Lasts { Once, ToTheEnd };

    explicit Failure(long successes, Lasts lasts = Lasts::Once);
    ~Failure();
    Failure(const Failure&) = delete;
    Failure& operator=(const Failure&) = delete;
    bool happened() const;
};

// While it lives, a Failure around it lets everything succeed.
class Pause {
 public:
    Pause();
    ~Pause();
    Pause(const Pause&) = delete;
    Pause& operator=(const Pause&) = delete;

 private:
    bool wasArmed_;
};

// Whether the allocation that is about to be made has to fail.
bool failsNow();

// Runs an attempt with each of its allocations failing in turn, until none does, each on a thread of its own:
// what a thread keeps for its next text would spare the later ones their allocations. The attempt is given
// the number of successes, arms a Failure for what it wants to fail, and tells whether it happened. Returns
// how many allocations there were to fail.
template <class Attempt>
long failEach(Attempt attempt) {
    for (long successes = 0;; ++successes) {
        bool happened = false;
        std::thread([&] { happened = attempt(successes); }).join();
        if (!happened) return successes;
    }
}

}  // namespace zr::faults
