#include "tests/faults/failing_heap.h"

#include <cstdlib>
#include <new>

namespace zr::faults {

namespace {

struct Plan {
    bool isArmed = false;
    bool lasts = false;
    bool happened = false;
    long successesLeft = 0;
};
thread_local Plan plan;

}  // namespace

Failure::Failure(long successes, Lasts lasts) {
    plan = {true, lasts == Lasts::ToTheEnd, false, successes};
}
Failure::~Failure() {
    plan.isArmed = false;
}
bool Failure::happened() const {
    return plan.happened;
}

Pause::Pause() : wasArmed_(plan.isArmed) {
    plan.isArmed = false;
}
Pause::~Pause() {
    plan.isArmed = wasArmed_;
}

bool failsNow() {
    if (!plan.isArmed || (plan.happened && !plan.lasts)) return false;
    if (!plan.happened && plan.successesLeft-- > 0) return false;
    plan.happened = true;
    return true;
}

}  // namespace zr::faults

namespace {

void* allocate(std::size_t size) {
    return zr::faults::failsNow() ? nullptr : std::malloc(size ? size : 1);
}

}  // namespace

void* operator new(std::size_t size) {
    if (void* const memory = allocate(size)) return memory;
    throw std::bad_alloc();
}
void* operator new[](std::size_t size) {
    return operator new(size);
}
void* operator new(std::size_t size, const std::nothrow_t&) noexcept {
    return allocate(size);
}
void* operator new[](std::size_t size, const std::nothrow_t&) noexcept {
    return allocate(size);
}
void operator delete(void* memory) noexcept {
    std::free(memory);
}
void operator delete(void* memory, std::size_t) noexcept {
    std::free(memory);
}
void operator delete[](void* memory) noexcept {
    std::free(memory);
}
void operator delete[](void* memory, std::size_t) noexcept {
    std::free(memory);
}
