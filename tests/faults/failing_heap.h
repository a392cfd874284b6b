#pragma once

#include <cstddef>

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

// Whether the allocation that is about to be made has to fail.
bool failsNow();

// Runs an attempt with each of its allocations failing in turn, until none does. The attempt is given the
// number of successes, arms a Failure for what it wants to fail, and tells whether it happened. Returns how
// many allocations there were to fail.
template <class Attempt>
long failEach(Attempt attempt) {
    long successes = 0;
    while (attempt(successes)) ++successes;
    return successes;
}

}  // namespace zr::faults
