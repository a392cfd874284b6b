#include "platform/guid.h"

#include <gtest/gtest.h>

#include <set>
#include <thread>
#include <vector>

#if !defined(_WIN32)
#include <sys/wait.h>
#include <unistd.h>
#endif

#include "tests/platform/print_string.h"

namespace {

TEST(Guid, IsABracedTextOf38Units) {
    CString text;
    ASSERT_EQ(zr::createGuidText(text), 0);
    ASSERT_EQ(text.GetLength(), 38);
    for (int at = 0; at < 38; ++at) {
        const char16_t unit = text[at];
        if (at == 0)
            EXPECT_EQ(unit, u'{');
        else if (at == 37)
            EXPECT_EQ(unit, u'}');
        else if (at == 9 || at == 14 || at == 19 || at == 24)
            EXPECT_EQ(unit, u'-');
        else
            EXPECT_TRUE((unit >= u'0' && unit <= u'9') || (unit >= u'A' && unit <= u'F')) << at;
    }
}

TEST(Guid, IsNewEachTime) {
    std::set<CString> texts;
    for (int round = 0; round < 1000; ++round) {
        CString text;
        zr::createGuidText(text);
        texts.insert(text);
    }
    EXPECT_EQ(texts.size(), 1000u);
}

TEST(Guid, IsOfTheRandomVersion) {
    for (int round = 0; round < 100; ++round) {
        CString text;
        zr::createGuidText(text);
        EXPECT_EQ(text[15], u'4');
        EXPECT_NE(CString(u"89AB").Find(text[20]), -1);
    }
}

TEST(Guid, IsNewInEveryThread) {
    constexpr std::size_t kEach = 5000;
    std::vector<std::vector<CString>> made(4);
    std::vector<std::thread> threads;
    for (std::vector<CString>& texts : made)
        threads.emplace_back([&texts] {
            texts.resize(kEach);
            for (CString& text : texts) zr::createGuidText(text);
        });
    for (std::thread& thread : threads) thread.join();
    std::set<CString> all;
    for (const std::vector<CString>& texts : made) all.insert(texts.begin(), texts.end());
    EXPECT_EQ(all.size(), made.size() * kEach);
}

#if !defined(_WIN32)
TEST(Guid, IsNewInAForkedProcess) {
    CString before;
    zr::createGuidText(before);
    int pipeEnds[2];
    ASSERT_EQ(pipe(pipeEnds), 0);
    const pid_t child = fork();
    if (child == 0) {
        CString text;
        zr::createGuidText(text);
        const bool written = write(pipeEnds[1], text.GetString(), 76) == 76;
        _exit(written ? 0 : 1);
    }
    ASSERT_GT(child, 0);
    CString own;
    zr::createGuidText(own);
    char16_t units[38];
    ASSERT_EQ(read(pipeEnds[0], units, sizeof units), 76);
    int status = -1;
    ASSERT_EQ(waitpid(child, &status, 0), child);
    EXPECT_EQ(status, 0);
    EXPECT_NE(CString(units, 38), own);
    close(pipeEnds[0]);
    close(pipeEnds[1]);
}
#endif

}  // namespace
