#include "zrparsersql/object_info.h"

#include <gtest/gtest.h>

#include "tests/model/small_host.h"
#include "tests/platform/print_string.h"

namespace {

using zr::test::Field;

class ShortNamed : public Field {
 public:
    explicit ShortNamed(int limit) : limit_(limit) {}
    int GetMaxNameLength() const override { return limit_; }

 private:
    int limit_;
};

TEST(ObjectInfo, NewObjectHasItsDefaults) {
    const Field object;
    EXPECT_EQ(object.ID.GetLength(), 38);
    EXPECT_EQ(object.Length, -1);
    EXPECT_EQ(object.LengthMapped, -1);
    EXPECT_EQ(object.Scale, 0);
    EXPECT_EQ(object.ScaleMapped, 0);
    EXPECT_EQ(object.DataType, 0);
    EXPECT_EQ(object.State, 1);
    EXPECT_EQ(object.Correct, 0);
    EXPECT_EQ(object.Selected, 1);
    EXPECT_EQ(object.LowerCase, 0);
    EXPECT_EQ(object.Resolved, 0);
    EXPECT_EQ(object.Computed, 0);
    EXPECT_TRUE(object.Name.IsEmpty());
    EXPECT_EQ(object.CZRObjectInfo::GetDBType(), DB_NONE);
    EXPECT_EQ(object.GetMaxNameLength(), -1);
}

TEST(ObjectInfo, NewObjectsHaveIdsOfTheirOwn) {
    EXPECT_NE(Field().ID, Field().ID);
}

TEST(ObjectInfo, GenerateIdMakesAnotherId) {
    Field object;
    const CString before = object.ID;
    EXPECT_EQ(object.GenerateID(), 0);
    EXPECT_NE(object.ID, before);
}

TEST(ObjectInfo, LowerCaseOneShowsNamesInUpperCase) {
    Field object;
    object.SetName(u"Abc");
    const struct {
        std::int16_t rule;
        const char16_t* shown;
    } cases[] = {{0, u"Abc"}, {1, u"ABC"}, {2, u"abc"}, {3, u"Abc"}, {-1, u"Abc"}};
    for (const auto& expected : cases) {
        object.SetLowerCase(expected.rule);
        EXPECT_EQ(object.GetName(), expected.shown);
        EXPECT_EQ(object.Name, u"Abc");
    }
}

TEST(ObjectInfo, FoldsTypesTooButNotTheSourceName) {
    Field object;
    object.SetType(u"Int");
    object.SetTypeMapped(u"BigInt");
    object.TypeMappedString = u"Big (1)";
    object.SetSrcName(u"Abc");
    object.SetLowerCase(1);
    EXPECT_EQ(object.GetType(), u"INT");
    EXPECT_EQ(object.GetTypeName(), u"INT");
    EXPECT_EQ(object.GetTypeMapped(), u"BIGINT");
    EXPECT_EQ(object.GetTypeMappedString(), u"BIG (1)");
    EXPECT_EQ(object.GetSrcName(), u"Abc");
}

TEST(ObjectInfo, SettersOfNamesTrimAndThatOfTheSourceNameDoesNot) {
    Field object;
    object.SetName(u"  x ");
    object.SetType(u" t ");
    object.SetTypeMapped(u"\tm\n");
    object.SetSrcName(u"  x ");
    object.SetID(u" id ");
    EXPECT_EQ(object.Name, u"x");
    EXPECT_EQ(object.Type, u"t");
    EXPECT_EQ(object.TypeMapped, u"m");
    EXPECT_EQ(object.SrcName, u"  x ");
    EXPECT_EQ(object.GetID(), u" id ");
    object.SetTypeName(u" second pair ");
    EXPECT_EQ(object.GetType(), u"second pair");
}

TEST(ObjectInfo, TruncatesNothingWithoutALimit) {
    ShortNamed object(-1);
    object.SetName(u"abcdef");
    object.TruncateName();
    EXPECT_EQ(object.Name, u"abcdef");
}

TEST(ObjectInfo, TruncatesToNothingWithALimitOfZero) {
    ShortNamed object(0);
    object.SetName(u"abcdef");
    object.TruncateName();
    EXPECT_TRUE(object.Name.IsEmpty());
}

TEST(ObjectInfo, TruncatedNameIsStoredFoldedAndAShortOneIsNot) {
    ShortNamed object(3);
    object.SetLowerCase(1);
    object.SetName(u"Abcdef");
    object.TruncateName();
    EXPECT_EQ(object.Name, u"ABC");
    object.SetName(u"Abc");
    object.TruncateName();
    EXPECT_EQ(object.Name, u"Abc");
}

TEST(ObjectInfo, CloneKeepsTheIdAndEverythingElse) {
    Field object;
    object.SetName(u"n");
    object.SetSrcName(u"s");
    object.Length = 5;
    object.Resolved = 1;
    object.Computed = 1;
    object.Selected = 0;
    object.IndexOff = 7;
    const std::unique_ptr<Field> clone(object.Clone());
    EXPECT_EQ(clone->ID, object.ID);
    EXPECT_EQ(clone->Name, u"n");
    EXPECT_EQ(clone->SrcName, u"s");
    EXPECT_EQ(clone->Length, 5);
    EXPECT_EQ(clone->Resolved, 1);
    EXPECT_EQ(clone->Computed, 1);
    EXPECT_EQ(clone->Selected, 0);
    EXPECT_EQ(clone->IndexOff, 7);
}

TEST(ObjectInfo, CopyPropertiesLeavesIdentityAlone) {
    Field source;
    source.SetName(u"Source");
    source.SetSrcName(u"source src");
    source.SetLowerCase(1);
    source.Length = 3;
    source.LengthMapped = 4;
    source.Scale = 5;
    source.ScaleMapped = 6;
    source.DataType = 7;
    source.State = 8;
    source.Correct = 9;
    source.DbTypeSrcLast = 10;
    source.DbTypeSrcCur = 11;
    source.Selected = 0;
    source.AutoIncrMapped = 12;
    source.UnsignedMapped = 13;
    source.IndexOff = 14;
    source.Resolved = 1;
    source.Computed = 1;
    Field target;
    target.SetSrcName(u"target src");
    const CString id = target.ID;
    target.CopyProperties(source, 0);
    EXPECT_EQ(target.ID, id);
    EXPECT_EQ(target.SrcName, u"target src");
    EXPECT_EQ(target.Resolved, 0);
    EXPECT_EQ(target.Computed, 0);
    EXPECT_EQ(target.Name, u"SOURCE") << "the name comes as the source shows it";
    EXPECT_EQ(target.Length, 3);
    EXPECT_EQ(target.LengthMapped, 4);
    EXPECT_EQ(target.Scale, 5);
    EXPECT_EQ(target.ScaleMapped, 6);
    EXPECT_EQ(target.DataType, 7);
    EXPECT_EQ(target.State, 8);
    EXPECT_EQ(target.Correct, 9);
    EXPECT_EQ(target.DbTypeSrcLast, 10);
    EXPECT_EQ(target.DbTypeSrcCur, 11);
    EXPECT_EQ(target.Selected, 0);
    EXPECT_EQ(target.LowerCase, 1);
    EXPECT_EQ(target.AutoIncrMapped, 12);
    EXPECT_EQ(target.UnsignedMapped, 13);
    EXPECT_EQ(target.IndexOff, 14);
}

TEST(ObjectInfo, PlainAccessorsReadAndWriteTheirMembers) {
    Field object;
    object.SetLength(1);
    object.SetLengthMapped(2);
    object.SetScale(3);
    object.SetScaleMapped(4);
    object.SetState(5);
    object.SetCorrect(6);
    object.SetDbTypeSrcLast(7);
    object.SetDbTypeSrcCur(8);
    object.SetAutoIncrMapped(9);
    object.SetUnsignedMapped(10);
    object.SetIndexOff(11);
    object.SetDataType(12);
    EXPECT_EQ(object.GetLength(), 1);
    EXPECT_EQ(object.GetLengthMapped(), 2);
    EXPECT_EQ(object.GetScale(), 3);
    EXPECT_EQ(object.GetScaleMapped(), 4);
    EXPECT_EQ(object.GetState(), 5);
    EXPECT_EQ(object.GetCorrect(), 6);
    EXPECT_EQ(object.GetDbTypeSrcLast(), 7);
    EXPECT_EQ(object.GetDbTypeSrcCur(), 8);
    EXPECT_EQ(object.GetAutoIncrMapped(), 9);
    EXPECT_EQ(object.GetUnsignedMapped(), 10);
    EXPECT_EQ(object.GetIndexOff(), 11);
    EXPECT_EQ(object.GetDataType(), 12);
    EXPECT_EQ(object.HasQuerySource(), 1);
}

TEST(ObjectInfo, ClassesTellWhetherTheyAreDerivedSourcesOrBaseTables) {
    EXPECT_TRUE(CZRAliasInfo().IsDerivedSource());
    EXPECT_FALSE(CZRAliasInfo().IsBaseTable());
    EXPECT_TRUE(CZRQueryInfo().IsDerivedSource());
    EXPECT_FALSE(CZRQueryInfo().IsBaseTable());
    EXPECT_FALSE(zr::test::Table().IsDerivedSource());
    EXPECT_TRUE(zr::test::Table().IsBaseTable());
    EXPECT_TRUE(zr::test::Database().IsDerivedSource());
    EXPECT_FALSE(zr::test::Database().IsBaseTable());
}

class BaseLikeQuery : public CZRQueryInfo {
 public:
    bool IsDerivedSource() const override { return false; }
};

TEST(ObjectInfo, QueryIsABaseTableWhenASubclassSaysThatItIsNotDerived) {
    EXPECT_TRUE(BaseLikeQuery().IsBaseTable());
}

}  // namespace
