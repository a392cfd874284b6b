#include "long_work.h"

#include <gtest/gtest.h>

namespace zr::tool {
namespace {

std::string told(LongWork& work, std::size_t done) {
    try {
        work.step(done, 20);
    } catch (const Interrupted& interrupt) {
        return interrupt.what();
    }
    return "goes on";
}

TEST(LongWork, EndsAtTheNextStepBehindAnInterrupt) {
    for (const int signal : {SIGINT, SIGTERM}) {
        LongWork work("reading shop.json");
        EXPECT_EQ(told(work, 6), "goes on");
        std::raise(signal);
        EXPECT_EQ(told(work, 7),
                  "interrupted while reading shop.json: 7 of 20 steps were done, and nothing was written");
    }
    LongWork another("reading on");
    EXPECT_EQ(told(another, 0), "goes on");
}

TEST(LongWork, LeavesInterruptsAsTheyWere) {
    struct sigaction before = {};
    struct sigaction behind = {};
    sigaction(SIGINT, nullptr, &before);
    { LongWork work("nothing"); }
    sigaction(SIGINT, nullptr, &behind);
    EXPECT_EQ(before.sa_handler, behind.sa_handler);
}

TEST(LongWorkDeathTest, EndsAtOnceAtASecondInterrupt) {
    EXPECT_EXIT(
        {
            LongWork work("reading shop.json");
            std::raise(SIGINT);
            std::raise(SIGINT);
        },
        testing::KilledBySignal(SIGINT), "");
}

}  // namespace
}  // namespace zr::tool
