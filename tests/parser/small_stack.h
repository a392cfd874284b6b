#pragma once

#include <gtest/gtest.h>
#include <pthread.h>
#include <sys/mman.h>
#include <unistd.h>

#include <cstddef>
#include <cstring>
#include <functional>

// The machine stack that any query has to do with. A sanitizer's frames are several times as large.
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
inline constexpr std::size_t kSmallStack = 1024 * 1024;
#else
inline constexpr std::size_t kSmallStack = 256 * 1024;
#endif

// Runs a piece of work on a thread with a small machine stack, far too small for recursion over a deep query:
// what needs more ends the program. Answers how many bytes of it were used.
inline std::size_t onSmallStack(const std::function<void()>& work) {
    constexpr unsigned char kUntouched = 0xA5;
    const auto page = static_cast<std::size_t>(sysconf(_SC_PAGESIZE));
    // The page below it is closed, as below any stack.
    void* const whole = mmap(nullptr, page + kSmallStack, PROT_NONE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
    if (whole == MAP_FAILED) {
        ADD_FAILURE() << "there is no memory for a stack";
        return 0;
    }
    auto* const stack = static_cast<unsigned char*>(whole) + page;
    std::size_t untouched = 0;
    pthread_attr_t attributes;
    pthread_t thread;
    const auto run = [](void* argument) -> void* {
        (*static_cast<const std::function<void()>*>(argument))();
        return nullptr;
    };
    if (mprotect(stack, kSmallStack, PROT_READ | PROT_WRITE) == 0 && pthread_attr_init(&attributes) == 0) {
        std::memset(stack, kUntouched, kSmallStack);
        if (pthread_attr_setstack(&attributes, stack, kSmallStack) == 0 &&
            pthread_create(&thread, &attributes, run, const_cast<std::function<void()>*>(&work)) == 0) {
            pthread_join(thread, nullptr);
            while (untouched < kSmallStack && stack[untouched] == kUntouched) ++untouched;
        } else {
            ADD_FAILURE() << "a thread can't be made";
        }
        pthread_attr_destroy(&attributes);
    }
    munmap(whole, page + kSmallStack);
    return kSmallStack - untouched;
}
