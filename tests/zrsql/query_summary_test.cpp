#include "query_summary.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace zr::tool {
namespace {

using host::Unknown;

TEST(QuerySummary, CountsEachQueryOnceWithTheFirstReason) {
    QuerySummary queries;
    for (int number = 0; number < 3; ++number) queries.add({});
    queries.add({false, Unknown::PartOfText, true});
    queries.add({false, Unknown::PartOfAnalysis, true});
    queries.add({false, Unknown::No, true});
    queries.add({true, Unknown::PartOfText, true});
    queries.add({true, Unknown::No, false});
    EXPECT_EQ(summaryText(queries.summary(std::chrono::milliseconds(4000))),
              "3 queries done, 1 not read to the end, 1 not analysed to the end, 1 with unknown sources, "
              "2 in rings, 0:04");
}

TEST(QuerySummary, LeavesOutWhatDoesNotOccur) {
    QuerySummary queries;
    EXPECT_EQ(summaryText(queries.summary(std::chrono::milliseconds(0))), "0 queries done, 0:00");
    queries.add({});
    EXPECT_EQ(summaryText(queries.summary(std::chrono::milliseconds(1000))), "1 query done, 0:01");
}

TEST(Summary, TellsAtLastHowTheRestIsDone) {
    Summary summary;
    summary.interrupted = true;
    summary.parts = {"2 tables done", "1 view not read"};
    summary.elapsed = std::chrono::milliseconds(61001);
    summary.goesOn = "--continue goes on";
    EXPECT_EQ(summaryText(summary), "interrupted: 2 tables done, 1 view not read, 1:02; --continue goes on");
}

}  // namespace
}  // namespace zr::tool
