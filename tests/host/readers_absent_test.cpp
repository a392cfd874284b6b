// The same as in a build without the client libraries of servers: host/readers.cpp is compiled in here
// without them.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "host/catalog_reader.h"

namespace zr::host {
namespace {

std::string complaintAbout(const std::string& word) {
    try {
        readerFor(word);
    } catch (const CatalogReadError& error) {
        return error.what();
    }
    return "none";
}

TEST(ReadersOfServers, ThatAreNotBuiltInAreToldAsThat) {
    EXPECT_EQ(complaintAbout("postgresql://me@db/shop?schema=s"),
              "postgresql://me@db/shop: this program was built without the reader of PostgreSQL");
    EXPECT_EQ(complaintAbout("mariadb://db/shop"),
              "mariadb://db/shop: this program was built without the reader of MySQL and MariaDB");
    EXPECT_THAT(catalogReaders(),
                testing::ElementsAre("SQLite", "CSV", "JSON", "MS Access (where mdbtools is installed)"));
}

}  // namespace
}  // namespace zr::host
