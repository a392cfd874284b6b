#include "long_work.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace zr::tool {
namespace {

std::string told(LongWork& work, std::size_t done) {
    try {
        work.step("read", done, 20);
    } catch (const Interrupted& interrupt) {
        return interrupt.what();
    }
    return "goes on";
}

TEST(LongWork, EndsAtTheNextStepBehindAnInterrupt) {
    for (const int signal : {SIGINT, SIGTERM}) {
        LongWork work("reading shop.json", false);
        EXPECT_EQ(told(work, 6), "goes on");
        std::raise(signal);
        EXPECT_THAT(told(work, 7), testing::MatchesRegex("interrupted: 7 queries read, 13 not, 0:0[0-9]; "
                                                         "nothing was written, and the same command "
                                                         "begins anew"));
    }
    LongWork another("reading on", false);
    EXPECT_EQ(told(another, 0), "goes on");
}

TEST(LongWork, LeavesInterruptsAsTheyWere) {
    struct sigaction before = {};
    struct sigaction behind = {};
    sigaction(SIGINT, nullptr, &before);
    { LongWork work("nothing", false); }
    sigaction(SIGINT, nullptr, &behind);
    EXPECT_EQ(before.sa_handler, behind.sa_handler);
}

TEST(LongWork, PassesInterruptsOverWhereItWasStartedSo) {
    const auto before = std::signal(SIGINT, SIG_IGN);
    {
        LongWork work("reading shop.json", false);
        std::raise(SIGINT);
        EXPECT_EQ(told(work, 7), "goes on");
    }
    std::signal(SIGINT, before);
}

TEST(LongWorkDeathTest, EndsAtOnceWithALineWhereNothingIsToBeKept) {
    EXPECT_EXIT(
        {
            LongWork work("reading shop.json", false);
            work.endAtOnceWith("nothing was read");
            std::raise(SIGTERM);
        },
        testing::ExitedWithCode(130), "^zrsql: nothing was read\n$");
    EXPECT_EXIT(
        {
            LongWork work("reading shop.json", false);
            work.endAtOnceWith("nothing was read");
            work.endAtSteps();
            std::raise(SIGTERM);
            std::exit(told(work, 7) == "goes on" ? 1 : 0);
        },
        testing::ExitedWithCode(0), "^$");
}

TEST(LongWorkDeathTest, EndsAtOnceAtASecondInterrupt) {
    EXPECT_EXIT(
        {
            LongWork work("reading shop.json", false);
            std::raise(SIGINT);
            std::raise(SIGINT);
        },
        testing::KilledBySignal(SIGINT), "");
}

}  // namespace
}  // namespace zr::tool
