#include <gtest/gtest.h>

#include <memory>
#include <random>
#include <string>

#include "tests/model/memory_storage.h"
#include "tests/model/small_host.h"

// Whatever a model holds: saved, loaded and saved again it is the same, and so is its clone.
namespace {

using zr::test::Database;
using zr::test::Factory;
using zr::test::Filter;
using zr::test::FilterItem;
using zr::test::Index;
using zr::test::MemoryStorage;
using zr::test::Table;

class ModelMaker {
 public:
    explicit ModelMaker(unsigned seed) : random_(seed) {}

    std::unique_ptr<Database> make() {
        auto database = std::make_unique<Database>();
        fill(*database);
        database->SchemaName = text();
        database->GarbageSymbols = text();
        database->GarbageReplace = text();
        database->Version = text();
        database->MaxThreads = static_cast<std::uint8_t>(number());
        database->CaseState = static_cast<std::int16_t>(number());
        database->MaxQuant = number();
        database->OverwriteDatabase = number();
        for (int count = upTo(4); count > 0; --count) fill(database->addQuery(text()));
        for (int count = upTo(4); count > 0; --count) fillTable(database->addTable(text()));
        return database;
    }

 private:
    int upTo(int limit) { return static_cast<int>(random_() % static_cast<unsigned>(limit + 1)); }
    int number() { return static_cast<int>(random_()); }
    CString text() {
        CString result;
        for (int length = upTo(12); length > 0; --length)
            result += static_cast<char16_t>(random_() % 3 ? u'a' + random_() % 26 : 1 + random_() % 0xFFFE);
        return result;
    }
    void fill(CZRObjectInfo& object) {
        object.SrcName = text();
        object.Name = text();
        object.Type = text();
        object.TypeMapped = text();
        object.TypeMappedString = text();
        object.Length = number();
        object.LengthMapped = number();
        object.Scale = number();
        object.ScaleMapped = number();
        object.DataType = number();
        object.State = number();
        object.Correct = number();
        object.Selected = upTo(1);
        object.LowerCase = static_cast<std::int16_t>(number());
        object.IndexOff = number();
    }
    void fillTable(Table& table) {
        fill(table);
        table.CopyStructure = upTo(1);
        table.SyncDrop = number();
        table.ModifyForeignKeys = number();
        for (int count = upTo(5); count > 0; --count) fill(*table.addField(text()));
        for (int count = upTo(3); count > 0; --count) fill(*table.addIndex(new Index(text())));
        for (int count = upTo(3); count > 0; --count) fill(*table.addForeignKey(text(), text()));
        if (upTo(1)) return;
        auto* filter = new Filter(static_cast<DBTypes>(upTo(20)));
        filter->SQLQuery = text();
        filter->SQLQuery += u"x";  // a filter of nothing would not be cloned
        filter->UseSQLQuery = number();
        table.Filter = filter;
        if (table.Fields.IsEmpty()) return;
        for (int count = upTo(3); count > 0; --count) {
            auto* item = new FilterItem(table.Fields.GetHead()->SrcName, text().GetString());
            item->Condition = number();
            item->ConditionAdd = number();
            item->Value.ValueType = 1 + upTo(9);
            if (upTo(3) == 0) item->Value.SetNull(4);
            filter->Items.AddTail(item);
        }
    }

    std::mt19937 random_;
};

std::string stored(Database& database) {
    MemoryStorage storage;
    database.Save(storage);
    EXPECT_TRUE(storage.isAtRoot());
    return storage.root.dump();
}

class StoredRoundTrip : public testing::TestWithParam<unsigned> {};

TEST_P(StoredRoundTrip, SavedLoadedAndSavedAgainIsTheSame) {
    const std::unique_ptr<Database> database = ModelMaker(GetParam()).make();
    MemoryStorage storage;
    database->Save(storage);
    Database loaded;
    Factory factory;
    loaded.Load(storage, factory);
    EXPECT_EQ(stored(loaded), storage.root.dump());
}

TEST_P(StoredRoundTrip, SavingOverItselfChangesNothing) {
    const std::unique_ptr<Database> database = ModelMaker(GetParam()).make();
    MemoryStorage storage;
    database->Save(storage);
    const std::string first = storage.root.dump();
    database->Save(storage);
    EXPECT_EQ(storage.root.dump(), first);
}

TEST_P(StoredRoundTrip, CloneIsStoredLikeItsSource) {
    const std::unique_ptr<Database> database = ModelMaker(GetParam()).make();
    const std::unique_ptr<Database> clone(database->Clone());
    EXPECT_EQ(stored(*clone), stored(*database));
}

INSTANTIATE_TEST_SUITE_P(Seeds, StoredRoundTrip, testing::Range(0u, 40u));

}  // namespace
