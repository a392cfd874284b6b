#include "expected_lineage.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <iostream>
#include <map>
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

namespace {

// The lineage of a project beside what is expected of it.
class Comparison {
 public:
    Comparison(tool::TracedProject& project, const std::vector<std::string>& files) {
        for (const auto& [name, sources] : readLines(files)) {
            const std::size_t dot = name.find('.');
            expected_[name.substr(0, dot)].emplace_back(name.substr(dot + 1), wordsOf(sources));
        }
        // The queries stand in the order in which they read from each other.
        for (const CZRQueryInfo* query : project.database().Queries) compare(project, *query);
        EXPECT_EQ(expected_.size(), views);
    }

    std::size_t views = 0;
    std::size_t columns = 0;  // of views that are measured
    Score score;              // of the sources of these
    Names notWhole;
    Names uponNotWhole;
    Names unlike;  // views that are not read whole or have other columns, and columns with other sources
    Names wrong;   // "view.column: table.column" that is told and not expected

 private:
    void compare(tool::TracedProject& project, const CZRQueryInfo& query) {
        ++views;
        const std::string view = query.GetSrcName().toUtf8();
        const auto& wanted = expected_[view];
        EXPECT_FALSE(wanted.empty()) << "nothing is expected of " << view;
        const auto& found = project.lineage().tracer().columnsOf(query);
        const bool isMeasured = noteReading(project, query, view);
        if (isMeasured) {
            columns += wanted.size();
            const bool isSame = std::equal(found.begin(), found.end(), wanted.begin(), wanted.end(),
                                           [](const host::ResultColumn& column, const auto& entry) {
                                               return column.name.toUtf8() == entry.first;
                                           });
            if (!isSame) unlike.insert(view);
        }
        for (const auto& entry : wanted) {
            const std::string& column = entry.first;
            const Names& sources = entry.second;
            const auto place = std::find_if(
                found.begin(), found.end(),
                [&column](const host::ResultColumn& each) { return each.name.toUtf8() == column; });
            const host::ColumnOrigins origins = place == found.end() ? host::ColumnOrigins() : place->origins;
            const Names names = known(origins);
            for (const std::string& name : names)
                if (!sources.contains(name)) wrong.insert(view + "." + column + ": " + name);
            if (!isMeasured) continue;
            score.add(sources, names);
            if (names != sources || names.size() != origins.size()) unlike.insert(view + "." + column);
        }
    }

    // Whether the view was read whole, and so were those behind it.
    bool noteReading(tool::TracedProject& project, const CZRQueryInfo& query, const std::string& view) {
        if (project.readPlaceOf(query).stop) {
            notWhole.insert(view);
            unlike.insert(view);
            return false;
        }
        for (const CZRSourceInfo* object : project.lineage().tracer().objectsReadBy(query)) {
            const std::string name = object->GetSrcName().toUtf8();
            if (!notWhole.contains(name) && !uponNotWhole.contains(name)) continue;
            uponNotWhole.insert(view);
            return false;
        }
        return true;
    }

    std::map<std::string, std::vector<std::pair<std::string, Names>>> expected_;
};

}  // namespace

void expectLineage(const std::string& project, const std::vector<std::string>& expectations,
                   const std::string& gaps) {
    tool::TracedProject traced(project);
    Comparison comparison(traced, expectations);
    Names named;
    for (const auto& [name, why] : readLines({gaps})) named.insert(name);
    EXPECT_EQ(comparison.unlike, named);
    // Of views that are not measured, too, nothing is told that is wrong.
    EXPECT_THAT(comparison.wrong, testing::IsEmpty());
    std::cout << comparison.views << " views, " << comparison.notWhole.size()
              << " of them not read to their end, " << comparison.uponNotWhole.size()
              << " upon one of these. Sources of the " << comparison.columns
              << " result columns of the others: " << comparison.score << "\n";
}

Names namedBy(tool::TracedProject& project, const CZRQueryInfo& query) {
    host::ColumnTracer& tracer = project.lineage().tracer();
    Names names;
    for (const host::ResultColumn& column : tracer.columnsOf(query)) names.merge(known(column.steps));
    for (const host::ColumnUse& use : tracer.usesOf(query)) names.merge(known(use.steps));
    return names;
}

}  // namespace zr::test
