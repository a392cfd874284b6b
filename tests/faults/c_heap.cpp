// The allocation functions of C as this program's own objects call them; the linker sends those calls here.
#include <cstddef>

#include "tests/faults/failing_heap.h"

extern "C" {
void* __real_malloc(std::size_t size);
void* __real_calloc(std::size_t count, std::size_t size);
void* __real_realloc(void* memory, std::size_t size);
void* __wrap_malloc(std::size_t size);
void* __wrap_calloc(std::size_t count, std::size_t size);
void* __wrap_realloc(void* memory, std::size_t size);
}

void* __wrap_malloc(std::size_t size) {
    return zr::faults::failsNow() ? nullptr : __real_malloc(size);
}
void* __wrap_calloc(std::size_t count, std::size_t size) {
    return zr::faults::failsNow() ? nullptr : __real_calloc(count, size);
}
void* __wrap_realloc(void* memory, std::size_t size) {
    return zr::faults::failsNow() ? nullptr : __real_realloc(memory, size);
}
