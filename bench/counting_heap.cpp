#include "bench/counting_heap.h"

#include <malloc.h>

#include <algorithm>
#include <cstdlib>
#include <new>

namespace {

thread_local bool isCounting = false;
thread_local zr::bench::HeapUse counted;

void* allocate(std::size_t size) {
    void* const memory = std::malloc(size ? size : 1);
    if (memory && isCounting) {
        ++counted.allocations;
        counted.keptBytes += static_cast<std::int64_t>(malloc_usable_size(memory));
        counted.peakBytes = std::max(counted.peakBytes, counted.keptBytes);
    }
    return memory;
}

void release(void* memory) {
    if (memory && isCounting) counted.keptBytes -= static_cast<std::int64_t>(malloc_usable_size(memory));
    std::free(memory);
}

}  // namespace

namespace zr::bench {

HeapCount::HeapCount() {
    counted = {};
    isCounting = true;
}
HeapCount::~HeapCount() {
    isCounting = false;
}
HeapUse HeapCount::use() const {
    return counted;
}

}  // namespace zr::bench

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
    release(memory);
}
void operator delete(void* memory, std::size_t) noexcept {
    release(memory);
}
void operator delete[](void* memory) noexcept {
    release(memory);
}
void operator delete[](void* memory, std::size_t) noexcept {
    release(memory);
}
