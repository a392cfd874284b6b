#include <gtest/gtest.h>

#include "host/json_form.h"
#include "host/project.h"
#include "host/sqlite_form.h"
#include "tests/host/projects.h"

// Whatever a project holds: stored, opened, converted, cloned and merged into its clone it stays the same.
namespace zr::host::test {
namespace {

class ProjectRoundTrip : public testing::TestWithParam<unsigned> {
 protected:
    Folder folder;
    std::unique_ptr<Database> project = randomProject(GetParam());
};

TEST_P(ProjectRoundTrip, SavedLoadedAndSavedAgainAsJsonGivesTheSameBytes) {
    saveProject(*project, folder.path("a.json"), StorageForm::Json);
    saveProject(*loadProject(folder.path("a.json")), folder.path("b.json"), StorageForm::Json);
    EXPECT_EQ(bytesOf(folder.path("b.json")), bytesOf(folder.path("a.json")));
}

TEST_P(ProjectRoundTrip, SavedLoadedAndSavedAgainAsSqliteGivesTheSameProject) {
    saveProject(*project, folder.path("a.db"), StorageForm::Sqlite);
    const auto loaded = loadProject(folder.path("a.db"));
    EXPECT_EQ(stored(*loaded), stored(*project));
    EXPECT_EQ(loaded->GetDBType(), project->GetDBType());
}

TEST_P(ProjectRoundTrip, ConvertedFromSqliteToJsonAndBackIsTheSame) {
    saveProject(*project, folder.path("a.db"), StorageForm::Sqlite);
    convertProject(folder.path("a.db"), folder.path("b.json"), StorageForm::Json);
    convertProject(folder.path("b.json"), folder.path("c.db"), StorageForm::Sqlite);
    EXPECT_TRUE(isSame(readSqlite(folder.path("c.db")).root, readSqlite(folder.path("a.db")).root));
    EXPECT_EQ(stored(*loadProject(folder.path("c.db"))), stored(*project));
    saveProject(*project, folder.path("d.json"), StorageForm::Json);
    EXPECT_EQ(bytesOf(folder.path("b.json")), bytesOf(folder.path("d.json")))
        << "as JSON a converted project and a saved one have the same bytes";
}

TEST_P(ProjectRoundTrip, SavedOverAnotherProjectLeavesNothingOfThatOne) {
    for (const StorageForm form : {StorageForm::Json, StorageForm::Sqlite}) {
        saveProject(*randomProject(GetParam() + 1000), folder.path("a"), form);
        saveProject(*project, folder.path("a"), form);
        EXPECT_EQ(stored(*loadProject(folder.path("a"))), stored(*project));
    }
}

TEST_P(ProjectRoundTrip, CloneIsStoredLikeItsSource) {
    const std::unique_ptr<Database> clone(project->Clone());
    EXPECT_EQ(stored(*clone), stored(*project));
    EXPECT_EQ(clone->GetDBType(), project->GetDBType());
}

// What merging takes over that is not there to be taken over: the names and types as the getters show them,
// what a query's own validation says, what tables without indexes or foreign keys answer of them, filters of
// another kind, and queries that find no partner by their new name.
void settleWhatMergingChanges(Database& database) {
    const auto settle = [](CZRObjectInfo& object) {
        object.Name = object.GetName();
        object.Type = object.GetTypeName();
        object.TypeMapped = object.GetTypeMapped();
        object.TypeMappedString = object.GetTypeMappedString();
    };
    for (CZRQueryInfo* query : database.Queries) {
        query->Name = query->SrcName;
        query->LowerCase = 0;
        settle(*query);
        query->Correct = query->GetCorrect();
    }
    for (CZRTableInfo* table : database.Tables) {
        settle(*table);
        table->CopyIndexes = table->GetCopyIndexes();
        table->CopyForeignKeys = table->GetCopyForeignKeys();
        for (CZRFieldInfo* field : table->Fields) settle(*field);
        for (CZRIndexInfo* index : table->Indexes) settle(*index);
        for (CZRForeignKeyInfo* key : table->ForeignKeys) settle(*key);
        if (table->Filter && table->Filter->GetDBType() != database.GetDBType())
            table->AttachFilterCopy(nullptr);
    }
}

TEST_P(ProjectRoundTrip, MergedIntoItsCloneChangesNothingThatIsSettled) {
    settleWhatMergingChanges(*project);
    const std::string before = stored(*project);
    const std::unique_ptr<Database> clone(project->Clone());
    clone->MergeFrom(*project, project->GetDBType());
    EXPECT_EQ(stored(*clone), before);
    EXPECT_EQ(stored(*project), before) << "the other side stays as it is";
}

TEST_P(ProjectRoundTrip, MergedIntoItsCloneChangesOnlyWhatMergingMay) {
    const std::unique_ptr<Database> clone(project->Clone());
    clone->MergeFrom(*project, project->GetDBType());
    // Selected is what a query without a partner loses; everything else has to come out as settled.
    const std::unique_ptr<Database> expected(project->Clone());
    auto query = expected->Queries.begin();
    for (CZRQueryInfo* merged : clone->Queries) {
        CZRQueryInfo& settled = **query++;
        const CString name = settled.GetName();
        EXPECT_EQ(merged->SrcName, settled.SrcName);
        if (!project->FindQueryBySrcName(name)) {
            EXPECT_EQ(merged->Selected, 0);
            merged->Selected = settled.Selected;
        }
        merged->Name = settled.Name;
        merged->Type = settled.Type;
        merged->TypeMapped = settled.TypeMapped;
        merged->TypeMappedString = settled.TypeMappedString;
        merged->Correct = settled.Correct;
    }
    settleWhatMergingChanges(*expected);
    settleWhatMergingChanges(*clone);
    EXPECT_EQ(stored(*clone), stored(*expected));
}

INSTANTIATE_TEST_SUITE_P(Seeds, ProjectRoundTrip, testing::Range(0u, 40u));

}  // namespace
}  // namespace zr::host::test
