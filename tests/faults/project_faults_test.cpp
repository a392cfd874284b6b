// Opening and saving a project with each allocation failing in turn, those of SQLite as well: a file holds
// the old project or the new one, whole, and what was opened is whole or not there.
#include <gtest/gtest.h>
#include <sqlite3.h>

#include <filesystem>
#include <memory>
#include <new>

#include "tests/faults/failing_heap.h"
#include "tests/host/projects.h"

namespace zr::faults {
namespace {

using host::Database;
using host::ProjectError;
using host::StorageForm;
using host::test::Folder;
using host::test::stored;

sqlite3_mem_methods usual;

void* sqliteMalloc(int size) {
    return failsNow() ? nullptr : usual.xMalloc(size);
}
void* sqliteRealloc(void* memory, int size) {
    return failsNow() ? nullptr : usual.xRealloc(memory, size);
}

/// SQLite takes its memory here from the first call on.
const bool isSqliteReady = [] {
    sqlite3_config(SQLITE_CONFIG_GETMALLOC, &usual);
    sqlite3_mem_methods failing = usual;
    failing.xMalloc = &sqliteMalloc;
    failing.xRealloc = &sqliteRealloc;
    // A page cache of its own would be filled before anything fails.
    return sqlite3_config(SQLITE_CONFIG_MALLOC, &failing) == SQLITE_OK &&
           sqlite3_config(SQLITE_CONFIG_PAGECACHE, nullptr, 0, 0) == SQLITE_OK;
}();

/// Small, since every allocation of a save or a load costs one more of it.
std::unique_ptr<Database> project(const char16_t* sql) {
    auto made = std::make_unique<Database>(DB_MSSQL);
    host::Table& table = made->addTable(std::make_unique<host::Table>(DB_MSSQL));
    host::setNames(table, u"t");
    host::setNames(table.addField(std::make_unique<host::Field>()), u"a");
    table.addIndex(std::make_unique<host::Index>()).addColumn(u"a");
    host::setNames(table.addForeignKey(std::make_unique<host::ForeignKey>()), u"k");
    auto* filter = new host::Filter(DB_MSSQL);
    table.Filter = filter;
    filter->SQLQuery = u"a > 1";
    filter->Items.AddTail(new host::FilterItem(DB_MSSQL));
    filter->Items.GetTail()->FieldID = u"a";
    filter->Items.GetTail()->Value.SetWide(u"1", 1);
    host::Query& query = made->addQuery(std::make_unique<host::Query>(DB_MSSQL));
    host::setNames(query, u"q");
    query.SetSQL(sql);
    return made;
}

struct Attempted {
    StorageForm form;
    Failure::Lasts lasts;
};

class ExhaustedProject : public testing::TestWithParam<Attempted> {
 protected:
    /// Runs a step under a failure, which may come out as either of the two exceptions.
    template <class Step>
    static bool failsWithin(long successes, Failure::Lasts lasts, bool& happened, Step step) {
        const Failure failing(successes, lasts);
        bool refused = false;
        try {
            step();
        } catch (const ProjectError&) {
            refused = true;
        } catch (const std::bad_alloc&) {
            refused = true;
        }
        happened = failing.happened();
        return refused;
    }

    Folder folder;
    const std::string path = folder.path("p");
    const std::unique_ptr<Database> before = project(u"SELECT a FROM t");
    const std::unique_ptr<Database> after = project(u"SELECT b FROM u");
    const std::string oldForm = stored(*before);
    const std::string newForm = stored(*after);
};

TEST_P(ExhaustedProject, ASaveLeavesTheOldProjectOrTheNewOne) {
    ASSERT_TRUE(isSqliteReady);
    const auto [form, lasts] = GetParam();
    saveProject(*before, path, form);
    const long allocations = failEach([&, form = form, lasts = lasts](long successes) {
        bool happened = false;
        const bool refused =
            failsWithin(successes, lasts, happened, [&] { saveProject(*after, path, form); });
        const std::string found = stored(*host::loadProject(path));
        EXPECT_TRUE(found == oldForm || found == newForm) << successes;
        if (!refused) {
            EXPECT_EQ(found, newForm) << successes;
        }
        if (found == newForm) saveProject(*before, path, form);
        EXPECT_EQ(folder.files(), "p") << successes;
        return happened && !testing::Test::HasFailure();
    });
    EXPECT_GT(allocations, 100);
}

TEST_P(ExhaustedProject, ASaveToANewFileLeavesNoneOrTheWholeProject) {
    const auto [form, lasts] = GetParam();
    failEach([&, form = form, lasts = lasts](long successes) {
        bool happened = false;
        const bool refused =
            failsWithin(successes, lasts, happened, [&] { saveProject(*after, path, form); });
        if (!refused || std::filesystem::exists(path)) {
            EXPECT_EQ(stored(*host::loadProject(path)), newForm) << successes;
        }
        std::filesystem::remove(path);
        EXPECT_EQ(folder.files(), "") << successes;
        return happened && !testing::Test::HasFailure();
    });
}

TEST_P(ExhaustedProject, ALoadGivesTheWholeProjectOrNone) {
    const auto [form, lasts] = GetParam();
    saveProject(*after, path, form);
    const long allocations = failEach([&, lasts = lasts](long successes) {
        std::unique_ptr<Database> loaded;
        bool happened = false;
        const bool refused =
            failsWithin(successes, lasts, happened, [&] { loaded = host::loadProject(path); });
        EXPECT_NE(refused, loaded != nullptr) << successes;
        if (loaded) {
            EXPECT_EQ(stored(*loaded), newForm) << successes;
        }
        return happened && !testing::Test::HasFailure();
    });
    EXPECT_GT(allocations, 100);
    EXPECT_EQ(stored(*host::loadProject(path)), newForm);
}

TEST(ExhaustedDatabase, ACopyIsWholeOrThrows) {
    const std::unique_ptr<Database> original = project(u"SELECT a FROM t");
    const std::string whole = stored(*original);
    const long allocations = failEach([&](long successes) {
        std::unique_ptr<Database> copy;
        bool happened = false;
        {
            const Failure failing(successes, Failure::Lasts::ToTheEnd);
            try {
                copy.reset(original->Clone());
            } catch (const std::bad_alloc&) {
            }
            happened = failing.happened();
        }
        EXPECT_EQ(copy == nullptr, happened) << successes;
        if (copy) {
            EXPECT_EQ(stored(*copy), whole) << successes;
        }
        return happened && !testing::Test::HasFailure();
    });
    EXPECT_GT(allocations, 5);
}

INSTANTIATE_TEST_SUITE_P(Heap, ExhaustedProject,
                         testing::Values(Attempted{StorageForm::Json, Failure::Lasts::Once},
                                         Attempted{StorageForm::Json, Failure::Lasts::ToTheEnd},
                                         Attempted{StorageForm::Sqlite, Failure::Lasts::Once},
                                         Attempted{StorageForm::Sqlite, Failure::Lasts::ToTheEnd}),
                         [](const auto& attempted) {
                             return std::string(attempted.param.form == StorageForm::Json ? "Json"
                                                                                          : "Sqlite") +
                                    (attempted.param.lasts == Failure::Lasts::Once ? "Once" : "FromThenOn");
                         });

}  // namespace
}  // namespace zr::faults
