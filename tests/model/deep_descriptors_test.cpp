#include <gtest/gtest.h>
#include <pthread.h>

#include <functional>
#include <memory>

#include "tests/model/small_host.h"
#include "tests/platform/print_string.h"

// Everything here is deeper than a recursive walk could go on the small stack it is given.
namespace {

using zr::test::Database;
using zr::test::fieldItem;
using zr::test::functionItem;
using zr::test::Query;
using zr::test::valueItem;

constexpr int kDepth = 10000;

// A sanitizer's frames are several times as large.
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
constexpr std::size_t kStackBytes = 512 * 1024;
#else
constexpr std::size_t kStackBytes = 128 * 1024;
#endif

void onSmallStack(std::function<void()> work) {
    pthread_attr_t attributes;
    ASSERT_EQ(pthread_attr_init(&attributes), 0);
    ASSERT_EQ(pthread_attr_setstacksize(&attributes, kStackBytes), 0);
    pthread_t thread;
    const auto run = [](void* argument) -> void* {
        (*static_cast<std::function<void()>*>(argument))();
        return nullptr;
    };
    ASSERT_EQ(pthread_create(&thread, &attributes, run, &work), 0);
    ASSERT_EQ(pthread_join(thread, nullptr), 0);
    pthread_attr_destroy(&attributes);
}

SelectItem* chainOfItems(int depth) {
    SelectItem* item = valueItem(u"x");
    for (int level = 0; level < depth; ++level) item = functionItem(u"f", {item});
    return item;
}

// Sub-queries, each in an expression of the one outside it.
CZRQueryInfo* nestInItems(int depth) {
    auto* query = new CZRQueryInfo;
    for (int level = 0; level < depth; ++level) {
        auto* item = new SelectItemSubQuery;
        item->m_query = query;
        query = new CZRQueryInfo;
        query->m_whereItem = functionItem(u"", {item});
    }
    return query;
}

// Nested descriptors of every kind in turn.
CZRQueryInfo* nestEverywhere(int depth) {
    auto* query = new CZRQueryInfo;
    for (int level = 0; level < depth; ++level) {
        auto* outer = new CZRQueryInfo;
        switch (level % 5) {
            case 0:
                outer->m_subQueries.AddTail(query);
                break;
            case 1: {
                auto* branch = new SelectItemUnion;
                branch->m_query = query;
                outer->m_unionItems.AddTail(branch);
                break;
            }
            case 2: {
                auto* record = new CZRQueryUnionInfo;
                record->Query = query;
                outer->m_unions.AddTail(record);
                break;
            }
            case 3: {
                auto* item = new SelectItemSubQuery;
                item->m_query = query;
                auto* alias = new CZRAliasInfo;
                alias->Expression = item;
                outer->m_aliases[u"a"] = alias;
                break;
            }
            default:
                outer->RetireQuery(query);
                query = new CZRQueryInfo;
                outer->m_subQueries.AddTail(query);
                break;
        }
        query = outer;
    }
    return query;
}

TEST(DeepDescriptors, ChainsOfItemsAreClonedAndDeleted) {
    onSmallStack([] {
        SelectItem* chain = chainOfItems(kDepth);
        SelectItem* clone = chain->Clone();
        int depth = 0;
        for (SelectItem* at = clone; !at->m_items.IsEmpty(); at = at->m_items.GetHead()) ++depth;
        EXPECT_EQ(depth, kDepth);
        clone->ClearItems();
        delete clone;
        delete chain;
    });
}

TEST(DeepDescriptors, NestedQueriesAreClonedAndDeleted) {
    onSmallStack([] {
        CZRQueryInfo* query = nestInItems(kDepth);
        CZRQueryInfo* clone = query->Clone();
        delete query;
        int depth = 0;
        for (CZRQueryInfo* at = clone; at->m_whereItem;
             at = static_cast<SelectItemSubQuery*>(at->m_whereItem->m_items.GetHead())->m_query)
            ++depth;
        EXPECT_EQ(depth, kDepth);
        delete clone;
    });
}

TEST(DeepDescriptors, QueriesNestedInEveryWayAreClonedAndDeleted) {
    onSmallStack([] {
        CZRQueryInfo* query = nestEverywhere(kDepth);
        delete query->Clone();
        delete query;
    });
}

TEST(DeepDescriptors, SourcesOfNestedQueriesAreResolved) {
    onSmallStack([] {
        Database database;
        auto& table = database.addTable(u"t");
        Query outer;
        CZRQueryInfo* at = &outer;
        for (int level = 0; level < kDepth; ++level) {
            auto* nested = new CZRQueryInfo;
            at->m_subQueries.AddTail(nested);
            at = nested;
        }
        at->SetDatabase(&database);
        at->m_sourceTables[u"t"] = u"t";
        outer.ResolveSources();
        EXPECT_EQ(at->m_sourceTables[u"t"], table.ID);
        EXPECT_EQ(outer.GetCorrect(), 0);
        EXPECT_EQ(at->Resolved, 1);
    });
}

TEST(DeepDescriptors, ItemsAreResolvedAtAnyDepth) {
    onSmallStack([] {
        Database database;
        auto& query = database.addQuery(u"q");
        SelectItemField* field = fieldItem(u"", u"a");
        SelectItem* item = field;
        for (int level = 0; level < kDepth; ++level) item = functionItem(u"f", {item});
        query.m_selectItems.AddTail(item);
        query.ResolveAllItems();
        EXPECT_EQ(field->m_fieldName, u"a");
    });
}

// Queries that each read from the one before, the first from a table.
void chainOfViews(Database& database, int count, bool withColumns) {
    auto& table = database.addTable(u"t", {u"a"});
    CString source = u"t";
    CString id = table.ID;
    for (int number = 0; number < count; ++number) {
        CString name;
        name.Format(u"v%d", number);
        auto& view = database.addQuery(name);
        view.m_sourceTables[source] = id;
        if (withColumns) view.refersTo(source, u"a");
        source = name;
        id = view.ID;
    }
}

TEST(DeepDescriptors, ColumnsAreFoundThroughChainsOfQueries) {
    onSmallStack([] {
        Database database;
        chainOfViews(database, kDepth, true);
        CZRQueryInfo* last = database.Queries.GetTail();
        const CZRSourceFildInfo* field = database.Tables.GetHead()->FindFieldBySrcName(u"a");
        EXPECT_EQ(last->FindField(u"", u"a"), field);
        EXPECT_EQ(last->FindFieldBySrcName(u"a"), field);
        CZRQueryInfo* found = nullptr;
        EXPECT_EQ(last->FindInSubQueries(u"nothing", u"nowhere", found), 0);
    });
}

TEST(DeepDescriptors, ChainsOfQueriesAreValidated) {
    onSmallStack([] {
        Database database;
        chainOfViews(database, kDepth, true);
        EXPECT_EQ(database.Queries.GetTail()->GetCorrect(), 0);
        EXPECT_EQ(database.Queries.GetHead()->Resolved, 1);
    });
}

}  // namespace
