#include "query_summary.h"

#include <algorithm>

namespace zr::tool {

void QuerySummary::add(const Gap& gap) {
    ++(gap.isInRing                                   ? inRing_
       : gap.missing == host::Unknown::PartOfText     ? notRead_
       : gap.missing == host::Unknown::PartOfAnalysis ? notAnalysed_
       : gap.hasUnknownSource                         ? unknownSources_
                                                      : whole_);
}

Summary QuerySummary::summary(std::chrono::milliseconds elapsed) const {
    Summary summary;
    summary.elapsed = elapsed;
    summary.parts.push_back(counted(whole_, "query done", "queries done"));
    const auto add = [&](std::uint64_t count, const char* why) {
        if (count) summary.parts.push_back(std::to_string(count) + " " + why);
    };
    add(notRead_, "not read to the end");
    add(notAnalysed_, "not analysed to the end");
    add(unknownSources_, "with unknown sources");
    add(inRing_, "in rings");
    return summary;
}

bool hasUnknownSource(const host::ColumnTracer::Columns& columns) {
    return std::any_of(columns.begin(), columns.end(), [](const host::ResultColumn& column) {
        return std::any_of(column.origins.begin(), column.origins.end(),
                           [](const host::ColumnOrigin& origin) { return !origin.isKnown(); });
    });
}

}  // namespace zr::tool
