#include "host/stored_tree.h"

#include <gtest/gtest.h>

#include "host/json_form.h"

namespace zr::host {
namespace {

TEST(TreeStorage, HoldsValuesAndSectionsInTheOrderOfWriting) {
    StoredTree tree;
    TreeStorage storage(tree, TreeStorage::Use::Save);
    storage.WriteInt(u"b", 1);
    storage.OpenChild(u"second", 1);
    storage.WriteString(u"x", u"text", 0);
    storage.CloseChild();
    storage.OpenChild(u"first", 1);
    storage.CloseChild();
    storage.WriteInt(u"a", 2);
    storage.WriteInt(u"b", 3);
    std::string json;
    appendJson(json, tree.root);
    EXPECT_EQ(json, "{\n \"b\": 3,\n \"a\": 2,\n \"second\": {\n  \"x\": \"text\"\n },\n \"first\": {}\n}");
    EXPECT_EQ(storage.GetChildNames().GetCount(), 2);
    EXPECT_NE(storage.HasChild(u"first"), 0);
    EXPECT_EQ(storage.HasChild(u"a"), 0);
}

TEST(TreeStorage, ReadsDefaultsForWhatIsNotThere) {
    StoredTree tree;
    TreeStorage storage(tree, TreeStorage::Use::Load);
    EXPECT_EQ(storage.ReadInt(u"a", 7), 7);
    EXPECT_EQ(storage.ReadString(u"a", u"x", 0), u"x");
}

TEST(TreeStorage, WrittenValueMayChangeItsType) {
    StoredTree tree;
    TreeStorage storage(tree, TreeStorage::Use::Save);
    storage.WriteInt(u"a", 1);
    storage.WriteString(u"a", u"x", 0);
    EXPECT_EQ(storage.ReadString(u"a", u"", 0), u"x");
    EXPECT_THROW(storage.ReadInt(u"a", 0), StorageError);
    storage.WriteInt(u"a", 2);
    EXPECT_EQ(storage.ReadInt(u"a", 0), 2);
}

TEST(TreeStorage, SectionThatIsNotThereIsEmptyAndNotStoredUnlessItIsToBeMade) {
    StoredTree tree;
    TreeStorage storage(tree, TreeStorage::Use::Save);
    storage.OpenChild(u"a", 0);
    storage.WriteInt(u"x", 1);
    EXPECT_EQ(storage.ReadInt(u"x", 0), 1) << "until it is closed";
    storage.CloseChild();
    EXPECT_TRUE(tree.root.children.empty());
    storage.OpenChild(u"a", 0);
    EXPECT_EQ(storage.ReadInt(u"x", 0), 0);
    storage.CloseChild();
    storage.OpenChild(u"a", 1);
    storage.CloseChild();
    EXPECT_EQ(tree.root.children.size(), 1u);
}

TEST(TreeStorage, LoadingMakesNothing) {
    StoredTree tree;
    TreeStorage storage(tree, TreeStorage::Use::Load);
    storage.OpenChild(u"Queries", 1);
    storage.CloseChild();
    EXPECT_TRUE(tree.root.children.empty());
}

TEST(TreeStorage, RemovesASection) {
    StoredTree tree;
    TreeStorage storage(tree, TreeStorage::Use::Save);
    for (int number = 0; number < 40; ++number) {
        CString name;
        name.Format(u"s%d", number);
        storage.OpenChild(name, 1);
        storage.CloseChild();
    }
    storage.RemoveChild(u"s5");
    storage.RemoveChild(u"nothing");
    EXPECT_EQ(storage.HasChild(u"s5"), 0);
    EXPECT_NE(storage.HasChild(u"s39"), 0);
    EXPECT_EQ(storage.GetChildNames().GetCount(), 39);
    storage.OpenChild(u"s5", 1);
    storage.CloseChild();
    EXPECT_EQ(storage.GetChildNames().GetTail(), u"s5");
    EXPECT_NE(storage.HasChild(u"s0"), 0);
}

TEST(TreeStorage, ANameIsAValueOrASection) {
    StoredTree tree;
    TreeStorage storage(tree, TreeStorage::Use::Save);
    storage.WriteInt(u"value", 1);
    storage.OpenChild(u"section", 1);
    storage.CloseChild();
    EXPECT_THROW(storage.OpenChild(u"value", 1), StorageError);
    EXPECT_THROW(storage.WriteInt(u"section", 1), StorageError);
    EXPECT_THROW(storage.ReadInt(u"section", 1), StorageError);
}

TEST(TreeStorage, DepthIsBounded) {
    StoredTree tree;
    TreeStorage storage(tree, TreeStorage::Use::Save);
    for (std::size_t level = 0; level < kMostLevels; ++level) storage.OpenChild(u"a", 1);
    EXPECT_THROW(storage.OpenChild(u"a", 1), StorageError);
}

CString throughJson(const CString& text) {
    StoredSection section;
    section.values.emplace_back();
    section.values.back().name = text;
    section.values.back().text = text;
    section.values.back().isText = true;
    std::string json;
    appendJson(json, section);
    StoredSection read;
    JsonReader().read(json, read);
    EXPECT_EQ(read.values.front().name, text);
    return read.values.front().text;
}

TEST(JsonForm, HoldsEveryUnit) {
    for (int unit = 0; unit < 0x10000; ++unit) {
        const CString text(std::u16string{u'a', static_cast<char16_t>(unit), u'b'});
        EXPECT_EQ(throughJson(text), text) << unit;
    }
}

TEST(JsonForm, HoldsSurrogatesInPairsAndWithout) {
    for (const char16_t* units :
         {u"\xD83D\xDE00", u"\xDE00\xD83D", u"\xD83D", u"\xD83D\xD83D\xDE00", u"\xFFFF\xD800", u"\uFFFFD800"})
        EXPECT_EQ(throughJson(units), units);
}

std::string jsonOf(const char16_t* text) {
    StoredSection section;
    section.values.emplace_back();
    section.values.back().name = u"a";
    section.values.back().text = text;
    section.values.back().isText = true;
    std::string json;
    appendValuesJson(json, section);
    return json;
}

TEST(JsonForm, IsPlainUtf8WhereTextsAre) {
    EXPECT_EQ(jsonOf(u"größe \xD83D\xDE00"), "{\"a\": \"größe 😀\"}");
    EXPECT_EQ(jsonOf(u"\"\\\n\r\t\x01"), "{\"a\": \"\\\"\\\\\\n\\r\\t\\u0001\"}");
    EXPECT_EQ(jsonOf(u"\xD800"), "{\"a\": \"\uFFFFD800\"}");
}

TEST(JsonForm, TakesWhatOtherWritersWrite) {
    StoredSection read;
    JsonReader().read("\xEF\xBB\xBF { \"a\" : \"\\u00e9\\ud83d\\ude00\\/\\b\\f\" , \"b\":-5,\"c\":{ } }",
                      read);
    EXPECT_EQ(read.findValue(u"a")->text, u"é\xD83D\xDE00/\b\f");
    EXPECT_EQ(read.findValue(u"b")->number, -5);
    EXPECT_NE(read.findChild(u"c"), nullptr);
}

TEST(JsonForm, NumbersAreOf32Bits) {
    StoredSection read;
    JsonReader().read("{\"a\": 2147483647, \"b\": -2147483648}", read);
    EXPECT_EQ(read.findValue(u"a")->number, 2147483647);
    EXPECT_EQ(read.findValue(u"b")->number, -2147483647 - 1);
}

}  // namespace
}  // namespace zr::host
