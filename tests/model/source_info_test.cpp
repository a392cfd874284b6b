#include "zrparsersql/source_info.h"

#include <gtest/gtest.h>

#include "tests/model/small_host.h"
#include "tests/platform/print_string.h"

namespace {

TEST(FieldInfo, MappedTypeIsTheTypeDefinition) {
    zr::test::Field field;
    field.typeDefinition = u"varchar(10)";
    field.BuildTypeMappedString();
    EXPECT_EQ(field.TypeMappedString, u"varchar(10)");
}

TEST(FieldInfo, MappedTypeCarriesTheCollation) {
    zr::test::Field field;
    field.typeDefinition = u"varchar(10)";
    field.collation = u"utf8_bin";
    field.BuildTypeMappedString();
    EXPECT_EQ(field.TypeMappedString, u"varchar(10), COLLATE utf8_bin");
}

}  // namespace
