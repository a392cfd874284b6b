#include "tests/analysis/failing_heap.h"

#include <cstdlib>
#include <new>

namespace {

thread_local bool isArmed = false;
thread_local long allocationsLeft = 0;

void* allocate(std::size_t size) {
    if (isArmed && allocationsLeft-- == 0) {
        isArmed = false;
        return nullptr;
    }
    return std::malloc(size ? size : 1);
}

}  // namespace

OneFailure::OneFailure(long successes) {
    allocationsLeft = successes;
    isArmed = true;
}
OneFailure::~OneFailure() {
    isArmed = false;
}
bool OneFailure::happened() const {
    return !isArmed;
}

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
