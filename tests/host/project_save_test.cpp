#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <filesystem>
#include <random>

#include "tests/host/projects.h"

// A save that is interrupted, or that fails, leaves the project from before, whole.
namespace zr::host::test {
namespace {

using testing::HasSubstr;

// A project of some hundred kilobytes.
std::unique_ptr<Database> largerProject() {
    auto database = smallProject();
    for (int number = 0; number < 300; ++number) {
        auto query = std::make_unique<Query>(DB_MSSQL);
        CString name;
        name.Format(u"query_%d", number);
        setNames(*query, name);
        query->SetSQL(u"SELECT a, b, c FROM orders WHERE id = 1");
        database->addQuery(std::move(query));
    }
    return database;
}

enum class End { Killed, Failed, Done };

// Saves in a process of its own that may write files of that many bytes. The system kills it where it goes
// beyond, or, when it does not want to be killed, refuses to write.
End saveWithin(rlim_t bytes, bool killed, Database& database, const std::string& path, StorageForm form) {
    const pid_t child = fork();
    if (child == 0) {
        std::signal(SIGXFSZ, killed ? SIG_DFL : SIG_IGN);
        const rlimit noCore{0, 0};
        setrlimit(RLIMIT_CORE, &noCore);
        const rlimit limit{bytes, bytes};
        setrlimit(RLIMIT_FSIZE, &limit);
        try {
            saveProject(database, path, form);
        } catch (const ProjectError&) {
            _exit(1);
        }
        _exit(0);
    }
    int status = 0;
    EXPECT_EQ(waitpid(child, &status, 0), child);
    if (WIFSIGNALED(status)) {
        EXPECT_EQ(WTERMSIG(status), SIGXFSZ);
        return End::Killed;
    }
    return WEXITSTATUS(status) == 0 ? End::Done : End::Failed;
}

class SavedProject : public testing::TestWithParam<StorageForm> {
 protected:
    StorageForm form() const { return GetParam(); }

    Folder folder;
    const std::string path = folder.path("p");
};

TEST_P(SavedProject, InterruptedAnywhereIsTheOldOneOrTheNewOne) {
    const auto old = smallProject();
    const auto next = largerProject();
    const std::string oldForm = stored(*old);
    const std::string nextForm = stored(*next);
    saveProject(*next, path, form());
    const auto size = std::filesystem::file_size(path);
    int killed = 0;
    for (rlim_t bytes = 1; bytes < size; bytes += size / 40) {
        std::filesystem::remove(path);
        saveProject(*old, path, form());
        const End end = saveWithin(bytes, true, *next, path, form());
        killed += end == End::Killed;
        EXPECT_EQ(stored(*loadProject(path)), end == End::Done ? nextForm : oldForm) << bytes;
    }
    EXPECT_GT(killed, 10);
    EXPECT_EQ(saveWithin(size * 4, true, *next, path, form()), End::Done);
    EXPECT_EQ(stored(*loadProject(path)), nextForm);
}

// The project that a child saves in its n-th round.
std::unique_ptr<Database> projectOfRound(int round) {
    auto database = largerProject();
    CString sql;
    sql.Format(u"SELECT %d", round);
    database->Queries.GetHead()->SetSQL(sql);
    return database;
}

int roundOf(Database& database) {
    return std::stoi(database.Queries.GetHead()->GetSQL().toUtf8().substr(7));
}

// A child saves one project after the other, and says so of each behind it, until it is killed.
TEST_P(SavedProject, KilledAtAnyMomentLosesNothingThatWasSaved) {
    std::mt19937 random(1);
    saveProject(*projectOfRound(0), path, form());
    int rounds = 0;
    for (int kill = 0; kill < 25; ++kill) {
        int ends[2];
        ASSERT_EQ(pipe(ends), 0);
        const int first = roundOf(*loadProject(path)) + 1;
        const pid_t child = fork();
        if (child == 0) {
            for (int round = first;; ++round) {
                saveProject(*projectOfRound(round), path, form());
                if (write(ends[1], &round, sizeof round) != sizeof round) _exit(1);
            }
        }
        close(ends[1]);
        int said = first - 1;
        const auto hear = [&] { return read(ends[0], &said, sizeof said) == sizeof said; };
        for (auto saves = random() % 3; saves > 0; --saves) ASSERT_TRUE(hear());
        usleep(random() % 20'000);
        ASSERT_EQ(::kill(child, SIGKILL), 0);
        int status = 0;
        ASSERT_EQ(waitpid(child, &status, 0), child);
        EXPECT_TRUE(WIFSIGNALED(status));
        while (hear()) {
        }
        close(ends[0]);
        const auto found = loadProject(path);
        const int round = roundOf(*found);
        EXPECT_GE(round, said) << "what was said to be saved is there";
        EXPECT_LE(round, said + 1);
        EXPECT_EQ(stored(*found), stored(*projectOfRound(round)));
        rounds += said - first + 1;
    }
    EXPECT_GT(rounds, 5);
}

TEST_P(SavedProject, ThatCannotBeWrittenStaysAsItIsAndLeavesNothingBeside) {
    const auto old = smallProject();
    const auto next = largerProject();
    saveProject(*old, path, form());
    const std::string before = bytesOf(path);
    int failed = 0;
    for (rlim_t bytes = 0; bytes < 60000; bytes += 10007)
        failed += saveWithin(bytes, false, *next, path, form()) == End::Failed;
    EXPECT_GT(failed, 3);
    EXPECT_EQ(stored(*loadProject(path)), stored(*old));
    EXPECT_EQ(folder.files(), "p");
    if (form() == StorageForm::Json) {
        EXPECT_EQ(bytesOf(path), before);
    }
}

TEST_P(SavedProject, ThatIsNewAndCannotBeWrittenIsNotThere) {
    EXPECT_EQ(saveWithin(0, false, *largerProject(), path, form()), End::Failed);
    EXPECT_EQ(folder.files(), "");
}

TEST_P(SavedProject, InAFolderThatIsNotThereIsRefused) {
    const std::string nowhere = folder.path("no/p");
    try {
        saveProject(*smallProject(), nowhere, form());
        FAIL();
    } catch (const ProjectError& error) {
        EXPECT_THAT(error.what(), HasSubstr(nowhere));
    }
}

TEST_P(SavedProject, ReplacesAProjectOfTheOtherForm) {
    const StorageForm other = form() == StorageForm::Json ? StorageForm::Sqlite : StorageForm::Json;
    saveProject(*largerProject(), path, other);
    EXPECT_EQ(formOfFile(path), other);
    saveProject(*smallProject(), path, form());
    EXPECT_EQ(formOfFile(path), form());
    EXPECT_EQ(stored(*loadProject(path)), stored(*smallProject()));
    EXPECT_EQ(folder.files(), "p");
}

TEST_P(SavedProject, KeepsTheModeOfItsFile) {
    saveProject(*smallProject(), path, form());
    ASSERT_EQ(chmod(path.c_str(), 0640), 0);
    saveProject(*largerProject(), path, form());
    struct stat state {};
    ASSERT_EQ(stat(path.c_str(), &state), 0);
    EXPECT_EQ(state.st_mode & 07777, 0640u);
}

TEST_P(SavedProject, GoesThroughALink) {
    saveProject(*smallProject(), path, form());
    const std::string link = folder.path("link");
    std::filesystem::create_symlink(path, link);
    saveProject(*largerProject(), link, form());
    EXPECT_TRUE(std::filesystem::is_symlink(link));
    EXPECT_EQ(stored(*loadProject(path)), stored(*largerProject()));
}

INSTANTIATE_TEST_SUITE_P(Forms, SavedProject, testing::Values(StorageForm::Json, StorageForm::Sqlite),
                         [](const testing::TestParamInfo<StorageForm>& form) {
                             return form.param == StorageForm::Json ? "Json" : "Sqlite";
                         });

TEST(SavedAsSqlite, LeavesADatabaseThatIsNoProjectAlone) {
    const Folder folder;
    const std::string path = folder.path("other.db");
    runSql(path, "CREATE TABLE t (a)");
    const std::string before = bytesOf(path);
    EXPECT_THROW(saveProject(*smallProject(), path, StorageForm::Sqlite), ProjectError);
    EXPECT_EQ(bytesOf(path), before);
}

TEST(ProjectForm, IsToldByTheEndingOfAName) {
    EXPECT_EQ(formByName("a.json"), StorageForm::Json);
    for (const char* name : {"a.db", "a.sqlite", "b/a.sqlite3"})
        EXPECT_EQ(formByName(name), StorageForm::Sqlite) << name;
    for (const char* name : {"a", "a.txt", "db", "a.json.bak"})
        EXPECT_EQ(formByName(name), std::nullopt) << name;
}

}  // namespace
}  // namespace zr::host::test
