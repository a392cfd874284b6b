#include "tests/faults/icu_heap.h"

#include <unicode/uclean.h>

#include <cstdlib>

#include "tests/faults/failing_heap.h"

namespace zr::faults {

namespace {

void* allocate(const void*, std::size_t size) {
    return failsNow() ? nullptr : std::malloc(size);
}
void* reallocate(const void*, void* memory, std::size_t size) {
    return failsNow() ? nullptr : std::realloc(memory, size);
}
void release(const void*, void* memory) {
    std::free(memory);
}

}  // namespace

bool restartIcu() {
    u_cleanup();
    UErrorCode status = U_ZERO_ERROR;
    u_setMemoryFunctions(nullptr, &allocate, &reallocate, &release, &status);
    return U_SUCCESS(status);
}

}  // namespace zr::faults
