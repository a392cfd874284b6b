// Filter values with each allocation failing in turn, ICU's as well: no text gets lost unseen.
#include <gtest/gtest.h>

#include <memory>
#include <new>
#include <string>

#include "tests/faults/failing_heap.h"
#include "tests/faults/icu_heap.h"
#include "tests/model/memory_storage.h"
#include "tests/model/small_host.h"

namespace zr::faults {
namespace {

using test::MemoryStorage;

constexpr int kType = 3;

void fill(CZRFilterValue& value) {
    ASSERT_EQ(value.SetText("1,5 \x8A", 8, kType), 1);
    ASSERT_EQ(value.SetBlob("blob", 4), 1);
}

std::string told(const CZRFilterValue& value) {
    return std::to_string(value.ValueType) + " " + std::to_string(value.Encoding) + " " +
           (value.Data ? std::string(value.Data, value.DataLength) : "null") + " " +
           (value.Blob ? std::string(value.Blob, value.BlobLength) : "null");
}

/// Runs a step under a failure; false where it throws.
template <class Step>
bool runs(long successes, bool& happened, Step step) {
    const Failure failing(successes);
    bool isDone = false;
    try {
        step();
        isDone = true;
    } catch (const std::bad_alloc&) {
    }
    happened = failing.happened();
    return isDone;
}

TEST(ExhaustedFilterValue, ACopyIsWholeOrThrows) {
    CZRFilterValue value;
    fill(value);
    const std::string whole = told(value);
    const long allocations = failEach([&](long successes) {
        std::unique_ptr<CZRFilterValue> copy;
        bool happened = false;
        const bool isDone =
            runs(successes, happened, [&] { copy = std::make_unique<CZRFilterValue>(value); });
        EXPECT_NE(isDone, happened) << successes;
        if (copy) {
            EXPECT_EQ(told(*copy), whole) << successes;
        }
        return happened && !testing::Test::HasFailure();
    });
    EXPECT_GE(allocations, 3);
}

TEST(ExhaustedFilterValue, IsWhatItWasWhereAnAssignmentThrows) {
    CZRFilterValue value;
    fill(value);
    failEach([&](long successes) {
        test::FilterItem item(u"old", u"before");
        const std::string before = told(item.Value);
        bool happened = false;
        const bool isDone = runs(successes, happened, [&] { item.SetAll(u"new", 1, value, 1); });
        EXPECT_EQ(told(item.Value), isDone ? told(value) : before) << successes;
        EXPECT_EQ(item.FieldID, isDone ? u"new" : u"old") << successes;
        return happened && !testing::Test::HasFailure();
    });
}

TEST(ExhaustedFilterValue, IsNullWhereASetterAnswersZero) {
    using Setter = int (*)(CZRFilterValue&);
    const Setter setters[] = {
        [](CZRFilterValue& value) { return value.SetDouble(1.5, kType); },
        [](CZRFilterValue& value) { return value.SetInt64(5, kType); },
        [](CZRFilterValue& value) {
            return value.SetDate({40000, zr::DateTime::Status::Valid}, kType);
        },
        [](CZRFilterValue& value) {
            return value.SetDate({0, zr::DateTime::Status::Null}, kType);
        },
        [](CZRFilterValue& value) { return value.SetWide(u"a", kType); },
        [](CZRFilterValue& value) { return value.SetBytes("a", 1, kType); },
        [](CZRFilterValue& value) { return value.SetText("a", 8, kType); },
    };
    for (const Setter set : setters) {
        const long allocations = failEach([&](long successes) {
            CZRFilterValue value;
            fill(value);
            bool happened = false;
            int answer = 0;
            EXPECT_TRUE(runs(successes, happened, [&] { answer = set(value); })) << successes;
            EXPECT_EQ(answer, happened ? 0 : 1) << successes;
            EXPECT_EQ(value.IsNull(), happened) << successes;
            EXPECT_EQ(value.ValueType, kType) << successes;
            return happened && !testing::Test::HasFailure();
        });
        EXPECT_GE(allocations, 1);
    }
}

TEST(ExhaustedFilterValue, IsConvertedWholeOrNotAtAll) {
    const std::string digits(40, '1');
    for (const int encoding : {int{FE_UTF8}, int{FE_ANSI}, 9, int{FE_UTF16}}) {
        const long allocations = failEach([&](long successes) {
            EXPECT_TRUE(restartIcu());
            CZRFilterValue value;
            EXPECT_EQ(value.SetText(digits.c_str(), 21, kType), 1);
            bool happened = false;
            const char* text = nullptr;
            EXPECT_TRUE(runs(successes, happened, [&] { text = value.GetAs(encoding); })) << successes;
            if (!happened) {
                EXPECT_NE(text, nullptr);
            }
            if (text) {
                EXPECT_EQ(std::string(text, 1), "1") << successes;
            }
            EXPECT_EQ(told(value), "3 21 " + digits + " null") << successes;
            EXPECT_TRUE(restartIcu());  // with memory again
            EXPECT_STREQ(value.GetAs(FE_UTF8), digits.c_str()) << successes;
            return happened && !testing::Test::HasFailure();
        });
        EXPECT_GT(allocations, 1);
    }
}

// What is stored without its text would be lost when it is loaded.
TEST(ExhaustedFilterValue, IsStoredWholeOrNotAtAll) {
    const long allocations = failEach([&](long successes) {
        EXPECT_TRUE(restartIcu());
        CZRFilterValue value;
        fill(value);
        MemoryStorage storage;
        bool happened = false;
        const bool isDone = runs(successes, happened, [&] { value.Save(storage); });
        if (isDone) {
            EXPECT_EQ(storage.root.textOf(u"Value"), u"1,5 Š") << successes;
        }
        return happened && !testing::Test::HasFailure();
    });
    EXPECT_GT(allocations, 3);
}

TEST(ExhaustedFilterValue, IsLoadedWholeOrNotAtAll) {
    CZRFilterValue value;
    fill(value);
    const long allocations = failEach([&](long successes) {
        MemoryStorage storage;  // a new one, since it notes all calls and grows by that
        value.Save(storage);
        CZRFilterValue loaded;
        bool happened = false;
        const bool isDone = runs(successes, happened, [&] { loaded.Load(storage); });
        EXPECT_NE(isDone, happened) << successes;
        if (isDone) {
            EXPECT_EQ(CString(loaded.GetWide()), u"1,5 Š") << successes;
        }
        return happened && !testing::Test::HasFailure();
    });
    EXPECT_GE(allocations, 1);
}

TEST(ExhaustedFilterValue, OfATableIsCopiedWithItOrTheCopyThrows) {
    test::Table table(u"t", {u"a"});
    auto* filter = new test::Filter;
    table.Filter = filter;
    auto* item = new test::FilterItem(u"a", u"");
    fill(item->Value);
    filter->Items.AddTail(item);
    failEach([&](long successes) {
        std::unique_ptr<CZRTableInfo> copy;
        bool happened = false;
        const bool isDone = runs(successes, happened, [&] { copy.reset(table.Clone()); });
        EXPECT_NE(isDone, happened) << successes;
        if (copy) {
            EXPECT_EQ(told(copy->Filter->Items.GetHead()->Value), told(item->Value)) << successes;
        }
        return happened && !testing::Test::HasFailure();
    });
}

}  // namespace
}  // namespace zr::faults
