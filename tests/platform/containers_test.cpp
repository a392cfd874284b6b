#include "zrparsersql/containers.h"

#include <gtest/gtest.h>

#include <map>
#include <random>

#include "tests/platform/print_string.h"

namespace {

TEST(List, AppendsAtItsTail) {
    CList<int> list(10);
    EXPECT_TRUE(list.IsEmpty());
    list.AddTail(1);
    list.AddTail(2);
    list.AddTail(3);
    EXPECT_EQ(list.GetCount(), 3);
    EXPECT_EQ(list.GetHead(), 1);
    EXPECT_EQ(list.GetTail(), 3);
    list.RemoveAll();
    EXPECT_TRUE(list.IsEmpty());
}

TEST(List, RaisesWhereTheEndOfAnEmptyListIsAsked) {
    CList<int> list;
    EXPECT_THROW(list.GetHead(), CInvalidArgException);
    EXPECT_THROW(list.GetTail(), CInvalidArgException);
    POSITION at = list.GetHeadPosition();
    EXPECT_FALSE(at);
    EXPECT_EQ(at, nullptr);
    EXPECT_THROW(list.GetNext(at), CInvalidArgException);
    EXPECT_THROW(list.RemoveAt(at), CInvalidArgException);
}

TEST(List, IsWalkedByPosition) {
    CList<int> list;
    for (int value = 0; value < 25; ++value) list.AddTail(value);
    int expected = 0;
    for (POSITION at = list.GetHeadPosition(); at != nullptr;) EXPECT_EQ(list.GetNext(at), expected++);
    EXPECT_EQ(expected, 25);
}

TEST(List, IsWalkedWhileItGrows) {
    CList<int> list;
    list.AddTail(0);
    int seen = 0;
    for (POSITION at = list.GetHeadPosition(); at;) {
        if (list.GetCount() < 100) list.AddTail(list.GetCount());
        EXPECT_EQ(list.GetNext(at), seen++);
    }
    EXPECT_EQ(seen, 100);
}

TEST(List, RemovesAndReplacesAtAPosition) {
    CList<int> list;
    for (int value : {1, 2, 3}) list.AddTail(value);
    POSITION second = list.GetHeadPosition();
    list.GetNext(second);
    list.SetAt(second, 20);
    EXPECT_EQ(list.GetAt(second), 20);
    list.RemoveAt(second);
    EXPECT_EQ(list.GetCount(), 2);
    EXPECT_EQ(list.GetAt(second), 3);
}

TEST(StringMap, EntersReplacesAndRemoves) {
    CMapStringToString map(10);
    map.SetAt(u"a", u"1");
    map[u"b"] = u"2";
    map[u"a"] = u"3";
    EXPECT_EQ(map.GetCount(), 2);
    CString value;
    EXPECT_TRUE(map.Lookup(u"a", value));
    EXPECT_EQ(value, u"3");
    value = u"unchanged";
    EXPECT_FALSE(map.Lookup(u"A", value));
    EXPECT_EQ(value, u"unchanged");
    EXPECT_TRUE(map.RemoveKey(u"a"));
    EXPECT_FALSE(map.RemoveKey(u"a"));
    EXPECT_EQ(map.GetCount(), 1);
    map.RemoveAll();
    EXPECT_TRUE(map.IsEmpty());
    EXPECT_FALSE(map.GetStartPosition());
}

TEST(StringMap, TellsANullValueFromNoValue) {
    CMapStringToPtr map;
    map.SetAt(u"x", nullptr);
    EXPECT_TRUE(map.Contains(u"x"));
    EXPECT_FALSE(map.Contains(u"y"));
    ASSERT_NE(map.Find(u"x"), nullptr);
    EXPECT_EQ(*map.Find(u"x"), nullptr);
}

TEST(StringMap, TakesTheEmptyKey) {
    CMapStringToString map;
    map[CString()] = u"empty";
    EXPECT_EQ(map[u""], u"empty");
    EXPECT_EQ(map.GetCount(), 1);
}

TEST(StringMap, KeepsReferencesWhileItGrows) {
    CMapStringToString map;
    CString& first = map[u"first"];
    for (int number = 0; number < 1000; ++number) {
        CString key;
        key.Format(u"%d", number);
        map[key] = key;
    }
    first = u"still here";
    EXPECT_EQ(map[u"first"], u"still here");
}

TEST(StringMap, IsWalkedInOrderOfEntry) {
    CMapStringToString map;
    for (int number = 0; number < 50; ++number) {
        CString key;
        key.Format(u"k%d", number);
        map[key] = key;
    }
    map.RemoveKey(u"k0");
    map.RemoveKey(u"k49");
    map.RemoveKey(u"k7");
    map[u"k7"] = u"last";
    int walked = 0;
    CString key;
    CString value;
    CString last;
    for (POSITION at = map.GetStartPosition(); at != nullptr; ++walked) {
        map.GetNextAssoc(at, key, value);
        last = value;
    }
    EXPECT_EQ(walked, map.GetCount());
    EXPECT_EQ(last, u"last");
    int iterated = 0;
    for (const auto& entry : map) iterated += entry.value.IsEmpty() ? 0 : 1;
    EXPECT_EQ(iterated, walked);
    POSITION behind;
    EXPECT_THROW(map.GetNextAssoc(behind, key, value), CInvalidArgException);
}

TEST(StringMap, MovesWithItsEntries) {
    CMapStringToString map;
    map[u"a"] = u"1";
    CMapStringToString moved(std::move(map));
    EXPECT_EQ(moved.GetCount(), 1);
    map = std::move(moved);
    EXPECT_EQ(map[u"a"], u"1");
}

TEST(StringMap, AgreesWithAnOrderedMapOverRandomChanges) {
    zr::StringMap<int> map;
    std::map<int, int> model;
    std::mt19937 random(7);
    for (int round = 0; round < 20000; ++round) {
        const int number = static_cast<int>(random() % 300);
        CString key;
        key.Format(u"key%d", number);
        if (random() % 3 == 0) {
            EXPECT_EQ(map.RemoveKey(key), model.erase(number) > 0);
        } else {
            map[key] = round;
            model[number] = round;
        }
        ASSERT_EQ(map.GetCount(), static_cast<int>(model.size()));
    }
    for (const auto& [number, value] : model) {
        CString key;
        key.Format(u"key%d", number);
        int found = -1;
        EXPECT_TRUE(map.Lookup(key, found));
        EXPECT_EQ(found, value);
    }
}

}  // namespace
