#include "host/catalog_url.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "host/catalog_reader.h"

namespace zr::host {
namespace {

using testing::HasSubstr;

std::string complaint(const std::function<void()>& act) {
    try {
        act();
    } catch (const CatalogReadError& error) {
        return error.what();
    }
    return "none";
}

std::string complaintAbout(const std::string& word) {
    return complaint([&] { readerFor(word); });
}

TEST(CatalogUrl, IsToldFromAFilesName) {
    EXPECT_TRUE(isUrl("postgresql://db/x"));
    EXPECT_TRUE(isUrl("x-y+z1://"));
    for (const char* name : {"shop.db", "C:/shop.db", "/tmp/a://b", "://x", "", "a b://c"})
        EXPECT_FALSE(isUrl(name)) << name;
}

TEST(CatalogUrl, HasPartsThatAreDecoded) {
    CatalogUrl url = parseUrl("MySQL://a%40b@db.example:3307/my%20shop?schema=x%26y&socket=/s");
    EXPECT_EQ(url.scheme, "mysql");
    EXPECT_EQ(url.user(), "a@b");
    EXPECT_EQ(url.host(), "db.example");
    EXPECT_EQ(url.port(), 3307u);
    EXPECT_EQ(decodeUrl(url.database), "my shop");
    EXPECT_EQ(url.take("schema"), "x&y");
    EXPECT_EQ(url.take("schema"), std::nullopt) << "it was taken out";
    EXPECT_EQ(url.text(), "mysql://a%40b@db.example:3307/my%20shop?socket=/s");
    EXPECT_EQ(url.shown(), "mysql://a%40b@db.example:3307/my%20shop");
}

TEST(CatalogUrl, MayLackEveryPart) {
    const CatalogUrl url = parseUrl("postgresql://");
    EXPECT_EQ(url.user() + url.host() + url.database, "");
    EXPECT_EQ(url.port(), 0u);
    EXPECT_EQ(parseUrl("mysql://db").host(), "db");
    EXPECT_EQ(parseUrl("mysql://me@").user(), "me");
    EXPECT_EQ(parseUrl("mysql://?schema=s").parameters.size(), 1u);
}

TEST(CatalogUrl, TakesAnAddressInBracketsAsHost) {
    const CatalogUrl url = parseUrl("mysql://me@[::1]:3306/x");
    EXPECT_EQ(url.host(), "::1");
    EXPECT_EQ(url.port(), 3306u);
    EXPECT_EQ(parseUrl("mysql://[fe80::2]").host(), "fe80::2");
    EXPECT_THAT(complaint([] { parseUrl("mysql://[::1/x").host(); }), HasSubstr("\"]\" is missing"));
    EXPECT_THAT(complaint([] { parseUrl("mysql://[::1]3306").port(); }), HasSubstr("is no port"));
}

TEST(CatalogUrl, RefusesWhatIsNoPort) {
    for (const char* word : {"mysql://db:x/", "mysql://db:70000/", "mysql://db:33x/", "mysql://db:-1/"})
        EXPECT_THAT(complaint([&] { parseUrl(word).port(); }), HasSubstr("is no port")) << word;
}

TEST(CatalogUrl, LeavesPercentSignsThatBeginNoCode) {
    EXPECT_EQ(decodeUrl("100%"), "100%");
    EXPECT_EQ(decodeUrl("%4"), "%4");
    EXPECT_EQ(decodeUrl("%zz%C3%A9"), "%zz\u00e9");
}

TEST(CatalogUrl, WithAPasswordIsRefusedWithoutShowingItAndToldWhereToPutIt) {
    EXPECT_EQ(
        complaintAbout("postgresql://me:guess@db/shop"),
        "postgresql://me@db/shop: a password may not stand in the address, where others see it; put it into "
        "PGPASSWORD or ~/.pgpass");
    EXPECT_EQ(
        complaintAbout("mariadb://me:gu@ess@db/shop"),
        "mariadb://me@db/shop: a password may not stand in the address, where others see it; put it into "
        "MYSQL_PWD or the group [client] of ~/.my.cnf");
    for (const char* name : {"password", "passwd", "pwd", "sslpassword", "pass%77ord"}) {
        const std::string message = complaintAbout("postgres://db/shop?" + std::string(name) + "=guess");
        EXPECT_THAT(message, HasSubstr("a password may not stand")) << name;
        EXPECT_THAT(message, testing::Not(HasSubstr("guess"))) << name;
    }
    EXPECT_THAT(complaintAbout("postgresql://:@db/shop"), HasSubstr("a password may not stand"));
}

TEST(CatalogUrl, OfNoServerThatIsReadIsRefusedWithThoseThatAre) {
    EXPECT_EQ(complaintAbout("oracle://db/shop"),
              "oracle://db/shop: no server is read by such an address; there are postgresql://, postgres://, "
              "mysql://, mariadb://");
}

TEST(CatalogUrl, HasParametersOfNameAndValue) {
    EXPECT_THAT(complaintAbout("mysql://db/shop?schema"), HasSubstr("\"schema\" has to be NAME=VALUE"));
}

TEST(ServerSettings, ComeFromTheAddress) {
    CatalogUrl url =
        parseUrl("postgresql://db/x?schema=a%20b&connect_timeout=3&statement_timeout=2&sslmode=require");
    const ServerSettings settings = takeSettings(url);
    EXPECT_EQ(settings.schema, "a b");
    EXPECT_EQ(settings.connectSeconds, 3u);
    EXPECT_EQ(settings.statementSeconds, 2u);
    EXPECT_EQ(settings.lockSeconds, 2u) << "a lock is not waited for longer than the statement may take";
    EXPECT_EQ(url.text(), "postgresql://db/x?sslmode=require") << "the rest is the client library's";
}

TEST(ServerSettings, TakeTheSchemaThatIsAskedForBesides) {
    CatalogUrl plain = parseUrl("mysql://db/x");
    EXPECT_EQ(takeSettings(plain, u"s").schema, "s");
    CatalogUrl same = parseUrl("mysql://db/x?schema=s");
    EXPECT_EQ(takeSettings(same, u"s").schema, "s");
    CatalogUrl other = parseUrl("mysql://db/x?schema=t");
    EXPECT_EQ(complaint([&] { takeSettings(other, u"s"); }),
              "mysql://db/x: the address names the schema t, and the schema s is asked for");
}

TEST(KindOfServer, IsToldByItsAddress) {
    EXPECT_EQ(kindOfSource("postgres://db/x"), DB_POSTGRESQL);
    EXPECT_EQ(kindOfSource("MariaDB://db/x"), DB_MYSQL);
    EXPECT_EQ(kindOfSource("oracle://db/x"), std::nullopt);
    EXPECT_EQ(kindOfSource("postgres"), std::nullopt);
}

TEST(ServerSettings, HaveTimesOutOfTheBox) {
    CatalogUrl url = parseUrl("mysql://db/x");
    const ServerSettings settings = takeSettings(url);
    EXPECT_EQ(settings.connectSeconds, 10u);
    EXPECT_EQ(settings.statementSeconds, 60u);
    EXPECT_EQ(settings.lockSeconds, 5u);
    EXPECT_FALSE(settings.tellsConnectSeconds);
}

TEST(ServerSettings, RefuseTimesThatAreNone) {
    for (const char* seconds : {"0", "-1", "x", "", "1.5", "86401", "99999999999"}) {
        const std::string word = std::string("mysql://db/x?statement_timeout=") + seconds;
        EXPECT_THAT(complaint([&] {
                        CatalogUrl url = parseUrl(word);
                        takeSettings(url);
                    }),
                    HasSubstr("statement_timeout has to be a number of seconds from 1 to 86400"))
            << seconds;
    }
}

}  // namespace
}  // namespace zr::host
