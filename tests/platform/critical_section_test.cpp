#include "zrparsersql/critical_section.h"

#include <gtest/gtest.h>

#include <thread>
#include <vector>

namespace {

TEST(CriticalSection, LetsOneThreadInAtATime) {
    CCriticalSection section;
    int count = 0;
    std::vector<std::thread> threads;
    for (int thread = 0; thread < 4; ++thread)
        threads.emplace_back([&] {
            for (int round = 0; round < 5000; ++round) {
                const zr::CriticalSectionGuard guard(section);
                ++count;
            }
        });
    for (std::thread& thread : threads) thread.join();
    EXPECT_EQ(count, 20000);
}

TEST(CriticalSection, MayBeTakenAgainByItsHolder) {
    CCriticalSection section;
    section.Lock();
    section.Lock();
    section.Unlock();
    section.Unlock();
    bool taken = false;
    std::thread([&] {
        const zr::CriticalSectionGuard guard(section);
        taken = true;
    }).join();
    EXPECT_TRUE(taken);
}

}  // namespace
