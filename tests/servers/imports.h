#pragma once

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>

#include "private_server.h"

namespace zr::test {

// A test that imports from a server. It is skipped where the server's programs are not installed.
class ServerTest : public testing::Test {
 protected:
    explicit ServerTest(const PrivateServer& running) : server(running) {}

    void SetUp() override {
        if (!server.absence().empty()) GTEST_SKIP() << server.absence();
        std::filesystem::remove(project());
    }
    void TearDown() override { std::filesystem::remove(project()); }

    std::string project() const { return server.folder() + ".project.json"; }

    ProgramResult import(const std::string& address, const std::string& dialect,
                         const std::vector<std::string>& more = {}) const {
        std::vector<std::string> words = {"project", "import", address, project(), "-d", dialect, "--force"};
        words.insert(words.end(), more.begin(), more.end());
        return runZrsql(words);
    }

    // Imports, and gives the message of the failure: one line, behind "zrsql: ", with nothing made.
    std::string failureOf(const std::string& address, const std::string& dialect) const {
        const ProgramResult result = import(address, dialect);
        EXPECT_EQ(result.exitStatus, 1) << result.output << result.errors;
        const std::vector<std::string> lines = splitLines(result.errors);
        EXPECT_EQ(lines.size(), 1u) << result.errors;
        EXPECT_FALSE(std::filesystem::exists(project()));
        EXPECT_TRUE(result.errors.starts_with("zrsql: ")) << result.errors;
        return lines.empty() || !result.errors.starts_with("zrsql: ") ? result.errors : lines[0].substr(7);
    }

    const PrivateServer& server;
};

// A variable of the environment that is there or not there for as long as the object lives.
class Variable {
 public:
    Variable(const char* name, const char* value) : name_(name) {
        if (const char* before = std::getenv(name)) before_ = before;
        set(value);
    }
    ~Variable() { set(before_ ? before_->c_str() : nullptr); }
    Variable(const Variable&) = delete;
    Variable& operator=(const Variable&) = delete;

 private:
    void set(const char* value) {
        if (value)
            setenv(name_, value, 1);
        else
            unsetenv(name_);
    }

    const char* name_;
    std::optional<std::string> before_;
};

}  // namespace zr::test
