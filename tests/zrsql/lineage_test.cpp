// zrsql lineage, impact and report, and imports, as their users meet them.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <nlohmann/json.hpp>

#include "program.h"

namespace zr::test {
namespace {

using nlohmann::json;
using testing::HasSubstr;
using testing::Not;

// Empty, or what is wrong with the nesting and quoting of the page's tags.
std::string faultIn(const std::string& page) {
    std::vector<std::string> open;
    std::size_t at = 0;
    while ((at = page.find('<', at)) != std::string::npos) {
        if (page.compare(at, 2, "<!") == 0) {
            at = page.find('>', at) + 1;
            continue;
        }
        std::size_t end = at + 1;
        for (char quote = 0; end < page.size() && (quote || page[end] != '>'); ++end) {
            if (page[end] == '<') return "< within a tag: " + page.substr(at, 80);
            if (page[end] == '"') quote = quote ? 0 : '"';
        }
        const std::string tag = page.substr(at + 1, end - at - 1);
        const std::string name = tag.substr(0, tag.find_first_of(" \n"));
        at = end + 1;
        if (tag.starts_with("/")) {
            if (open.empty() || "/" + open.back() != name) return "ends what is not open: " + tag;
            open.pop_back();
        } else if (!tag.ends_with("/")) {
            open.push_back(name);
            // Neither of these ends before its end tag.
            if (name == "script" || name == "style") at = page.find("</" + name + ">", at);
        }
    }
    return open.empty() ? "" : "left open: " + open.back();
}

int countOf(const std::string& wanted, const std::string& text) {
    int count = 0;
    for (std::size_t at = 0; (at = text.find(wanted, at)) != std::string::npos; at += wanted.size()) ++count;
    return count;
}

class ZrsqlLineage : public testing::Test {
 protected:
    ZrsqlLineage() : folder_(testing::TempDir() + "zrsql_lineage_XXXXXX") {
        EXPECT_NE(mkdtemp(folder_.data()), nullptr);
        output({"project", "new", file(), "-d", "mssql"});
        output({"project", "add-table", file(), "orders", "id", "<b>&\"'", "--key", "id"});
    }
    ~ZrsqlLineage() override { std::filesystem::remove_all(folder_); }

    std::string file(const std::string& name = "p.json") const { return folder_ + "/" + name; }
    static std::string output(const std::vector<std::string>& words) {
        const ProgramResult result = runZrsql(words);
        EXPECT_EQ(result.exitStatus, 0) << words[0] << ": " << result.errors;
        return result.output;
    }
    void addQuery(const std::string& name, const std::string& sql) {
        output({"project", "add-query", file(), name, sql});
    }

 private:
    std::string folder_;
};

TEST_F(ZrsqlLineage, QuotesNamesInCsvAndDot) {
    addQuery("a,\"b\"", "SELECT id AS [x\"y] FROM orders");
    EXPECT_THAT(output({"lineage", file(), "--format", "csv"}),
                HasSubstr("\n\"a,\"\"b\"\"\",1,\"x\"\"y\",orders,id,yes,\"\"\n"));
    EXPECT_THAT(output({"lineage", file(), "--format", "dot"}), HasSubstr("label=\"a,\\\"b\\\"\";"));
}

TEST_F(ZrsqlLineage, ReportsRings) {
    addQuery("a", "SELECT x FROM b");
    addQuery("b", "SELECT x FROM a");
    EXPECT_THAT(output({"lineage", file()}), HasSubstr("\nRings\n  a reads from b reads from a\n"));
    const json answer = json::parse(output({"lineage", file(), "--format", "json"}));
    EXPECT_EQ(answer["rings"], json::parse(R"([["a", "b"]])"));
    EXPECT_THAT(output({"report", file()}), HasSubstr("Ring: <a href=\"#q"));
}

TEST_F(ZrsqlLineage, MarksTheColumnsOfATextThatWasNotReadToItsEnd) {
    addQuery("cut", "SELECT id FROM orders what is this");
    const json column =
        json::parse(output({"lineage", file(), "--format", "json"}))["queries"][0]["columns"][0];
    ASSERT_EQ(column["from"].size(), 2u);
    EXPECT_EQ(column["from"][0]["known"], true);
    EXPECT_EQ(column["from"][1]["why"], "the text was not read to its end");
}

TEST_F(ZrsqlLineage, RefusesWhatIsNotThere) {
    for (const std::vector<std::string>& words : std::vector<std::vector<std::string>>{
             {"lineage", file(), "--query", "none"}, {"impact", file(), "none"}, {"report", file("none")}}) {
        const ProgramResult result = runZrsql(words);
        EXPECT_EQ(result.exitStatus, 1) << words[0];
        EXPECT_THAT(result.errors, HasSubstr("none")) << words[0];
        EXPECT_EQ(result.output, "") << words[0];
    }
    EXPECT_EQ(runZrsql({"lineage", file(), "--format", "sexpr"}).exitStatus, 2);
    EXPECT_EQ(runZrsql({"impact", file()}).exitStatus, 2);
}

class ZrsqlReport : public ZrsqlLineage {
 protected:
    ZrsqlReport() {
        addQuery("</details><script>alert(1)</script>",
                 "SELECT id AS [</td>], '<i>' AS t FROM orders WHERE id > 5");
        addQuery("second", "SELECT id AS [plain one] FROM orders ORDER BY id what");
        output({"report", file(), "-o", file("page.html")});
        page = readFile(file("page.html"));
    }

    std::string page;
};

TEST_F(ZrsqlReport, IsWellFormed) {
    EXPECT_EQ(faultIn(page), "");
    EXPECT_EQ(faultIn("<a><b></a></b>"), "ends what is not open: /a");
}

TEST_F(ZrsqlReport, HoldsEveryQueryTableAndColumn) {
    EXPECT_EQ(countOf("<details class=\"object query\"", page), 2);
    EXPECT_EQ(countOf("<details class=\"object table\"", page), 1);
    for (const char* column : {"<td>&lt;/td&gt;</td>", "<td>t</td>", "<td>plain one</td>", "<td>id</td>",
                               "<td>&lt;b&gt;&amp;&quot;&#39;</td>"})
        EXPECT_THAT(page, HasSubstr(column));
    EXPECT_EQ(
        countOf("<a href=\"#q", page.substr(page.find("<svg"), page.find("</svg>") - page.find("<svg"))), 2);
    EXPECT_EQ(countOf("data-from=\"t1\"", page), 2);
}

TEST_F(ZrsqlReport, LetsNoNameBecomeATag) {
    EXPECT_EQ(countOf("<script", page), 1);
    EXPECT_EQ(countOf("<i>", page), 0);
    EXPECT_THAT(page, HasSubstr("<b>&lt;/details&gt;&lt;script&gt;alert(1)&lt;/script&gt;</b>"));
}

TEST_F(ZrsqlReport, NeedsNoNetwork) {
    EXPECT_THAT(page, HasSubstr("default-src &#39;none&#39;"));
    EXPECT_THAT(page, Not(HasSubstr(" src=")));
    EXPECT_EQ(countOf("http", page),
              countOf("http-equiv", page) + countOf("xmlns=\"http://www.w3.org/1999/xhtml\"", page));
}

TEST_F(ZrsqlReport, ColoursClausesAndTellsWhereReadingStopped) {
    EXPECT_THAT(
        page,
        HasSubstr(
            "<span class=\"c-from\">FROM orders </span><span class=\"c-where\">WHERE id &gt; 5</span>"));
    EXPECT_THAT(page, HasSubstr("<span class=\"c-order unread\">what</span>"));
    EXPECT_THAT(page, HasSubstr("stopped at line 1, column 50, before <code>what</code>"));
}

TEST_F(ZrsqlReport, LinksEveryAnchorThatItRefersTo) {
    for (std::size_t at = 0; (at = page.find("href=\"#", at)) != std::string::npos; ++at) {
        const std::string id = page.substr(at + 7, page.find('"', at + 7) - at - 7);
        EXPECT_EQ(countOf(" id=\"" + id + "\"", page), 1) << id;
    }
}

TEST_F(ZrsqlLineage, ImportsWhatItCanAndTellsTheRest) {
    const TemporaryFile dump("TABLE_NAME,COLUMN_NAME,DATA_TYPE\nt,a,int\nt,a,int\n");
    const ProgramResult result =
        runZrsql({"project", "import", dump.path(), file("new.json"), "-d", "oracle"});
    EXPECT_EQ(result.exitStatus, 0) << result.errors;
    EXPECT_EQ(result.summary, "1 table and 0 queries done, 1 left out");
    EXPECT_EQ(result.errors, "zrsql: column t.a: left out; it is told twice\n");
    EXPECT_EQ(runZrsql({"project", "import", dump.path(), file("new.json"), "-d", "oracle"}).exitStatus, 1);
    const TemporaryFile empty("TABLE_NAME,COLUMN_NAME\n");
    EXPECT_THAT(runZrsql({"project", "import", empty.path(), file("e.json"), "-d", "oracle"}).errors,
                HasSubstr("there is no table or view in it"));
    EXPECT_FALSE(std::filesystem::exists(file("e.json")));
    EXPECT_EQ(runZrsql({"project", "import", empty.path(), file("e.json"), "-d", "none"}).exitStatus, 2);
}

}  // namespace
}  // namespace zr::test
