#include "expected_lineage.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <ostream>
#include <sstream>

#include "program.h"

namespace zr::test {

namespace {

Names wordsOf(const std::string& text) {
    std::istringstream stream(text);
    return {std::istream_iterator<std::string>(stream), {}};
}

std::string nameOf(const host::ColumnOrigin& origin) {
    return origin.source.toUtf8() + "." + origin.column.toUtf8();
}

Names known(const host::ColumnOrigins& origins) {
    Names names;
    for (const host::ColumnOrigin& origin : origins)
        if (origin.isKnown()) names.insert(nameOf(origin));
    return names;
}

}  // namespace

std::vector<std::pair<std::string, std::string>> readLines(const std::vector<std::string>& files) {
    std::vector<std::pair<std::string, std::string>> lines;
    for (const std::string& file : files)
        for (const std::string& line : splitLines(readFile(ZR_SOURCE_DIR "/tests/servers/shop/" + file))) {
            const std::size_t colon = line.find(':');
            if (line.empty() || line[0] == '#') continue;
            EXPECT_NE(colon, line.npos) << file << ": " << line;
            lines.emplace_back(line.substr(0, colon), line.substr(colon + 1));
        }
    return lines;
}

void Score::add(const Names& expected, const Names& found) {
    for (const std::string& name : found) ++(expected.contains(name) ? right : wrong);
    for (const std::string& name : expected) missed += !found.contains(name);
}

double Score::precision() const {
    return static_cast<double>(right) / static_cast<double>(right + wrong);
}

double Score::recall() const {
    return static_cast<double>(right) / static_cast<double>(right + missed);
}

std::ostream& operator<<(std::ostream& out, const Score& score) {
    return out << score.right << " right, " << score.wrong << " wrong, " << score.missed
               << " missed: precision " << score.precision() << ", recall " << score.recall();
}

Comparison compare(tool::TracedProject& project, const std::vector<std::string>& files) {
    std::map<std::string, std::vector<std::pair<std::string, Names>>> expected;
    for (const auto& [name, sources] : readLines(files)) {
        const std::size_t dot = name.find('.');
        expected[name.substr(0, dot)].emplace_back(name.substr(dot + 1), wordsOf(sources));
    }
    Comparison result;
    host::ColumnTracer& tracer = project.lineage().tracer();
    // The queries stand in the order in which they read from each other.
    for (const CZRQueryInfo* query : project.database().Queries) {
        ++result.views;
        const std::string view = query->GetSrcName().toUtf8();
        const auto& wanted = expected[view];
        const auto& columns = tracer.columnsOf(*query);

        bool isUponOthers = false;
        for (const CZRSourceInfo* object : tracer.objectsReadBy(*query)) {
            const std::string name = object->GetSrcName().toUtf8();
            isUponOthers =
                isUponOthers || result.notWhole.contains(name) || result.uponNotWhole.contains(name);
        }
        const bool isWhole = !project.readPlaceOf(*query).stop;
        if (!isWhole)
            result.notWhole.insert(view);
        else if (isUponOthers)
            result.uponNotWhole.insert(view);
        const bool isMeasured = isWhole && !isUponOthers;

        if (isMeasured) {
            result.columns += wanted.size();
            bool isSame = columns.size() == wanted.size();
            for (std::size_t at = 0; isSame && at < columns.size(); ++at)
                isSame = columns[at].name.toUtf8() == wanted[at].first;
            if (!isSame) result.differences.insert(view);
        }
        for (const auto& [column, sources] : wanted) {
            const auto found =
                std::find_if(columns.begin(), columns.end(),
                             [&](const host::ResultColumn& each) { return each.name.toUtf8() == column; });
            const Names names = found == columns.end() ? Names() : known(found->origins);
            for (const std::string& name : names)
                if (!sources.contains(name)) result.claims.push_back(view + "." + column + ": " + name);
            if (!isMeasured) continue;
            result.score.add(sources, names);
            const bool hasUnknown = found != columns.end() && names.size() != found->origins.size();
            if (names != sources || hasUnknown) result.differences.insert(view + "." + column);
        }
        EXPECT_FALSE(wanted.empty()) << "nothing is expected of " << view;
    }
    EXPECT_EQ(expected.size(), result.views);
    return result;
}

Names namedBy(tool::TracedProject& project, const CZRQueryInfo& query) {
    host::ColumnTracer& tracer = project.lineage().tracer();
    Names names;
    for (const host::ResultColumn& column : tracer.columnsOf(query)) names.merge(known(column.steps));
    for (const host::ColumnUse& use : tracer.usesOf(query)) names.merge(known(use.steps));
    return names;
}

}  // namespace zr::test
