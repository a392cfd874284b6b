// Runs the program over whole files of real queries, where there are some (ZR_CORPUS_DIR).

#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <map>
#include <nlohmann/json.hpp>

#include "program.h"

namespace zr::test {
namespace {

using nlohmann::json;

class Corpus : public testing::TestWithParam<std::string> {
 protected:
    void SetUp() override {
        path_ = ZR_CORPUS_DIR "/" + GetParam() + ".jsonl";
        if (!std::filesystem::exists(path_)) GTEST_SKIP() << "there is no " << path_;
        for (const std::string& line : splitLines(readFile(path_))) queries_.push_back(json::parse(line));
        ASSERT_FALSE(queries_.empty());
    }

    // The answers of a run over the whole file, one a query.
    std::vector<json> answers(const std::string& command) const {
        const auto result = runZrsql({command, "-d", GetParam(), "--jsonl", path_});
        EXPECT_EQ(result.exitStatus, 0) << result.errors;
        std::vector<json> objects;
        for (const std::string& line : splitLines(result.output)) objects.push_back(json::parse(line));
        EXPECT_EQ(objects.size(), queries_.size());
        objects.resize(queries_.size());
        return objects;
    }

    std::string path_;
    std::vector<json> queries_;
};

// True for (NUMBER "TEXT" CHILD...), whole.
bool isSexpr(const std::string& text) {
    std::size_t depth = 0;
    for (std::size_t at = 0; at < text.size(); ++at) {
        if (text[at] == '(') {
            if (at && depth == 0) return false;
            ++depth;
        } else if (text[at] == ')') {
            if (depth-- == 0) return false;
        } else if (text[at] == '"') {
            while (++at < text.size() && text[at] != '"')
                if (text[at] == '\\') ++at;
        }
    }
    return depth == 0 && text.size() > 2 && text.front() == '(' && text.back() == ')';
}

TEST_P(Corpus, HasOneWellFormedTreeALine) {
    const auto trees = answers("tree");
    for (std::size_t at = 0; at < trees.size(); ++at) {
        EXPECT_EQ(trees[at]["id"], queries_[at]["id"]);
        ASSERT_TRUE(trees[at].contains("tree")) << queries_[at]["id"];
        EXPECT_TRUE(isSexpr(trees[at]["tree"].get<std::string>())) << queries_[at]["id"];
    }
}

TEST_P(Corpus, HasOneListOfTokensALine) {
    const auto tokens = answers("tokens");
    for (std::size_t at = 0; at < tokens.size(); ++at) {
        EXPECT_EQ(tokens[at]["id"], queries_[at]["id"]);
        EXPECT_FALSE(tokens[at]["tokens"].empty()) << queries_[at]["id"];
    }
}

TEST_P(Corpus, HasOneDescriptorALineThatAgreesWithTheTokens) {
    const auto tokens = answers("tokens");
    const auto analyses = answers("analyze");
    for (std::size_t at = 0; at < analyses.size(); ++at) {
        const json& read = analyses[at]["read"];
        EXPECT_EQ(analyses[at]["id"], queries_[at]["id"]);
        EXPECT_TRUE(analyses[at]["query"].is_object()) << queries_[at]["id"];
        // The text of MS Access is prepared ahead of its analysis, which makes three tokens of some.
        const std::size_t more = read["of"].get<std::size_t>() - tokens[at]["tokens"].size();
        ASSERT_TRUE(more == 0 || (GetParam() == "msaccess" && more % 2 == 0)) << queries_[at]["id"];
        EXPECT_EQ(read["stop"].is_null(), read["tokens"] == read["of"]) << queries_[at]["id"];
        if (!read["stop"].is_null() && more == 0) {
            EXPECT_EQ(read["stop"]["text"], tokens[at]["tokens"][read["tokens"].get<std::size_t>()][2]);
        }
    }
}

TEST_P(Corpus, IsReadToItsEndAsOftenAsBefore) {
    // The grammars are those of older servers; fewer than this were never read.
    static const std::map<std::string, std::ptrdiff_t> least = {
        {"mssql", 158}, {"mysql", 203}, {"oracle", 430}, {"postgresql", 244}, {"msaccess", 459}};
    const auto analyses = answers("analyze");
    const auto whole = std::count_if(analyses.begin(), analyses.end(),
                                     [](const json& each) { return each["read"]["stop"].is_null(); });
    EXPECT_GE(whole, least.at(GetParam()));
}

INSTANTIATE_TEST_SUITE_P(Dialects, Corpus,
                         testing::Values("mssql", "mysql", "oracle", "postgresql", "msaccess"),
                         [](const testing::TestParamInfo<std::string>& file) { return file.param; });

}  // namespace
}  // namespace zr::test
