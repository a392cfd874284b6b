#include <gtest/gtest.h>

#include <thread>
#include <vector>

#include "tests/model/small_host.h"

namespace {

using zr::test::Database;
using zr::test::Table;

class TableProcessed : public testing::Test {
 protected:
    TableProcessed() : parent(database.addTable(u"parent")), child(database.addTable(u"child")) {
        child.addForeignKey(u"fk", parent.ID);
        child.ForeignKeys.AddTail(nullptr);
    }

    Database database;
    Table& parent;
    Table& child;
};

TEST_F(TableProcessed, ReferencingTablesMustAllBeProcessed) {
    EXPECT_EQ(parent.AreReferencingTablesProcessed(), 0);
    child.SetProcessed(1);
    EXPECT_EQ(parent.AreReferencingTablesProcessed(), 1);
    EXPECT_EQ(child.AreReferencingTablesProcessed(), 1) << "nothing refers to it";
}

TEST_F(TableProcessed, ReferencedTablesMustAllBeProcessed) {
    EXPECT_EQ(child.AreReferencedTablesProcessed(), 0);
    parent.SetProcessed(5);
    EXPECT_EQ(child.AreReferencedTablesProcessed(), 1);
    EXPECT_EQ(parent.AreReferencedTablesProcessed(), 1);
}

TEST_F(TableProcessed, ReferenceToItselfCountsOnOneSideOnly) {
    parent.addForeignKey(u"self", parent.ID);
    child.SetProcessed(1);
    EXPECT_EQ(parent.AreReferencingTablesProcessed(), 1);
    EXPECT_EQ(parent.AreReferencedTablesProcessed(), 0);
    parent.SetProcessed(1);
    EXPECT_EQ(parent.AreReferencedTablesProcessed(), 1);
}

TEST_F(TableProcessed, ReferencingTablesAreMatchedByExactIdAndReferencedOnesByAnyCase) {
    parent.SetID(u"{ABC}");
    Table& other = database.addTable(u"other");
    other.addForeignKey(u"fk", u"{abc}");
    child.Clear();
    EXPECT_EQ(parent.AreReferencingTablesProcessed(), 1);
    EXPECT_EQ(other.AreReferencedTablesProcessed(), 0);
}

TEST_F(TableProcessed, UnknownTablesAndMissingDatabasesDoNotMatter) {
    Table lonely(u"t");
    lonely.addForeignKey(u"fk", u"x");
    EXPECT_EQ(lonely.AreReferencingTablesProcessed(), 1);
    EXPECT_EQ(lonely.AreReferencedTablesProcessed(), 1);
    lonely.SetDatabase(&database);
    EXPECT_EQ(lonely.AreReferencedTablesProcessed(), 1);
}

TEST_F(TableProcessed, DatabaseSetsAllAtOnce) {
    database.Tables.AddTail(nullptr);
    database.SetAllProcessed(3);
    EXPECT_EQ(parent.GetProcessed(), 3);
    EXPECT_EQ(child.GetProcessed(), 3);
}

TEST(TableProcessedThreads, EightThreadsReadAndWriteAtOnce) {
    Database database;
    std::vector<Table*> tables;
    for (int number = 0; number < 16; ++number) {
        CString name;
        name.Format(u"t%d", number);
        tables.push_back(&database.addTable(name));
    }
    for (std::size_t number = 1; number < tables.size(); ++number)
        tables[number]->addForeignKey(u"fk", tables[number - 1]->ID);
    database.SetAllProcessed(0);
    std::vector<std::thread> threads;
    for (std::size_t first = 0; first < 8; ++first)
        threads.emplace_back([&tables, first] {
            for (int round = 1; round <= 200; ++round)
                for (std::size_t number = first; number < tables.size(); number += 8) {
                    tables[number]->SetProcessed(round);
                    tables[number]->AreReferencingTablesProcessed();
                    tables[number]->AreReferencedTablesProcessed();
                }
        });
    for (std::thread& thread : threads) thread.join();
    for (Table* table : tables) {
        EXPECT_EQ(table->GetProcessed(), 200);
        EXPECT_EQ(table->AreReferencingTablesProcessed(), 1);
        EXPECT_EQ(table->AreReferencedTablesProcessed(), 1);
    }
}

}  // namespace
