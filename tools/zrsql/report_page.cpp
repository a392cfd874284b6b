#include "report_page.h"

#include "coloured_sql.h"
#include "html_text.h"
#include "lineage_format.h"
#include "report_assets.h"
#include "report_graph.h"
#include "tree_format.h"

namespace zr::tool {

namespace {

class Page {
 public:
    Page(std::string& out, TracedProject& project, const std::string& title)
        : out_(out), project_(project), title_(CString::fromUtf8(title)) {
        int tables = 0;
        for (const CZRTableInfo* table : project_.database().Tables)
            anchors_[table] = "t" + std::to_string(++tables);
        int queries = 0;
        for (const CZRQueryInfo* query : project_.database().Queries) {
            anchors_[query] = "q" + std::to_string(++queries);
            for (const CZRSourceInfo* object : tracer().objectsReadBy(*query))
                readers_[object].push_back(query);
        }
    }

    void append() {
        appendHead();
        appendOverview();
        appendUnread();
        out_ +=
            "<section aria-labelledby=\"h-graph\"><h2 id=\"h-graph\">What reads from what</h2>\n"
            "<p><button type=\"button\" id=\"in\">Zoom in</button> <button type=\"button\" "
            "id=\"out\">Zoom out</button> <button type=\"button\" id=\"fit\">Show all</button> <span "
            "class=\"soft\">Keys in the graph: arrows, +, -, 0. A click goes to the query or "
            "table.</span></p>\n";
        appendGraph(out_, project_, anchors_);
        out_ += "</section>\n<section aria-labelledby=\"h-queries\"><h2 id=\"h-queries\">Queries</h2>\n";
        std::size_t done = 0;
        for (const CZRQueryInfo* query : project_.database().Queries) {
            project_.step(done++);
            appendQuery(*query);
        }
        out_ += "</section>\n<section aria-labelledby=\"h-tables\"><h2 id=\"h-tables\">Tables</h2>\n";
        for (const CZRTableInfo* table : project_.database().Tables) appendTable(*table);
        out_ += "</section>\n</main>\n<script>//<![CDATA[\n";
        out_ += kReportScript;
        out_ += "//]]></script>\n</body>\n</html>\n";
    }

 private:
    host::ColumnTracer& tracer() { return project_.lineage().tracer(); }

    void appendHead() {
        out_ +=
            "<!DOCTYPE html>\n<html xmlns=\"http://www.w3.org/1999/xhtml\" lang=\"en\">\n<head>\n"
            "<meta charset=\"utf-8\"/>\n<meta http-equiv=\"Content-Security-Policy\" content=\"default-src "
            "&#39;none&#39;; style-src &#39;unsafe-inline&#39;; script-src &#39;unsafe-inline&#39;\"/>\n"
            "<meta name=\"viewport\" content=\"width=device-width, initial-scale=1\"/>\n<title>";
        appendHtml(out_, title_);
        out_ += "</title>\n<style>/*<![CDATA[*/";
        out_ += kReportStyle;
        out_ +=
            "/*]]>*/</style>\n</head>\n<body>\n<a class=\"skip\" href=\"#h-queries\">To the "
            "queries</a>\n<h1>";
        appendHtml(out_, title_);
        out_ +=
            "</h1>\n<header class=\"bar\"><label for=\"search\">Search</label> <input id=\"search\" "
            "type=\"search\" placeholder=\"name, column or text; / comes here, Enter opens the first\"/> "
            "<button type=\"button\" id=\"next\">Next in graph</button> <button type=\"button\" "
            "id=\"theme\">Light or dark</button> <span id=\"found\" "
            "role=\"status\"></span></header>\n<main>\n";
    }

    void appendCount(std::size_t count, const char* what) {
        out_ += "<li><b>" + std::to_string(count) + "</b> " + what + "</li>\n";
    }

    void appendOverview() {
        std::size_t columns = 0;
        std::size_t known = 0;
        std::size_t whole = 0;
        for (const CZRQueryInfo* query : project_.database().Queries) {
            if (!project_.readPlaceOf(*query).stop) ++whole;
            for (const host::ResultColumn& column : tracer().columnsOf(*query)) {
                ++columns;
                bool isKnown = true;
                for (const host::ColumnOrigin& origin : column.origins) isKnown = isKnown && origin.isKnown();
                if (isKnown) ++known;
            }
        }
        out_ +=
            "<section aria-labelledby=\"h-overview\"><h2 id=\"h-overview\">Overview</h2>\n<ul "
            "class=\"counts\">\n";
        appendCount(static_cast<std::size_t>(project_.database().Tables.GetCount()), "tables");
        appendCount(static_cast<std::size_t>(project_.database().Queries.GetCount()), "queries");
        appendCount(whole, "queries read to their end");
        appendCount(columns, "result columns");
        appendCount(known, "with all sources known");
        appendCount(project_.lineage().rings().size(), "rings");
        out_ += "</ul>\n";
        for (const host::Ring& ring : project_.lineage().rings()) {
            out_ += "<p class=\"bad\">Ring: ";
            for (const CZRQueryInfo* query : ring) {
                appendLink(*query);
                out_ += " reads from ";
            }
            appendLink(*ring.front());
            out_ += "</p>\n";
        }
        out_ += "</section>\n";
    }

    void appendUnread() {
        out_ += "<section aria-labelledby=\"h-unread\"><h2 id=\"h-unread\">What could not be analysed</h2>\n";
        std::string rows;
        std::swap(rows, out_);
        for (const CZRQueryInfo* query : project_.database().Queries) {
            const ReadPlace& place = project_.readPlaceOf(*query);
            const host::Unknown missing = tracer().missingOf(*query);
            if (missing == host::Unknown::No) continue;
            out_ += "<tr><td>";
            appendLink(*query);
            out_ += "</td><td>" + std::string(host::explain(missing)) + "</td><td>";
            appendStop(place);
            out_ += "</td></tr>\n";
        }
        std::swap(rows, out_);
        out_ += rows.empty()
                    ? "<p>Every query was read and analysed to its end.</p>\n"
                    : "<table><thead><tr><th>Query</th><th>Why</th><th>Where</th></tr></thead><tbody>\n" +
                          rows + "</tbody></table>\n";
        out_ += "</section>\n";
    }

    void appendStop(const ReadPlace& place) {
        if (!place.stop) return;
        out_ += "read " + std::to_string(place.taken) + " of " + std::to_string(place.all) +
                " tokens; stopped at line " + std::to_string(place.stop->line) + ", column " +
                std::to_string(place.stop->column) + ", before <code>";
        appendHtml(out_, place.stop->text);
        out_ += "</code>";
    }

    void appendLink(const CZRSourceInfo& object) {
        out_ += "<a href=\"#" + anchors_.at(&object) + "\">";
        appendHtml(out_, object.GetSrcName());
        out_ += "</a>";
    }

    void beginObject(const CZRSourceInfo& object, const std::string& kind, const std::string& note) {
        const std::string& anchor = anchors_.at(&object);
        out_ += "<details class=\"object " + kind + "\" id=\"" + anchor + "\"><summary><b>";
        appendHtml(out_, object.GetSrcName());
        out_ += "</b> <span class=\"soft\">" + note +
                "</span></summary>\n<p><button type=\"button\" class=\"look\" " + "value=\"" + anchor +
                "\">Show in graph</button></p>\n";
    }

    void appendReaders(const CZRSourceInfo& object) {
        const auto found = readers_.find(&object);
        if (found == readers_.end()) return;
        out_ += "<p class=\"readers\">Read by: ";
        bool isFirst = true;
        for (const CZRQueryInfo* reader : found->second) {
            if (!isFirst) out_ += ", ";
            isFirst = false;
            appendLink(*reader);
        }
        out_ += "</p>\n";
    }

    void appendQuery(const CZRQueryInfo& query) {
        const ReadPlace& place = project_.readPlaceOf(query);
        const auto& columns = tracer().columnsOf(query);
        beginObject(query, "query",
                    std::to_string(columns.size()) + (columns.size() == 1 ? " column" : " columns") +
                        (place.stop ? ", not read to its end" : ""));
        const Dialect& dialect = project_.dialect();
        const CString text = dialect.prepare ? dialect.prepare(query.m_sql) : query.m_sql;
        out_ += "<pre class=\"sql\">";
        appendColouredSql(out_, dialect, text, place.stop ? place.stop->offset : std::string::npos);
        out_ += "</pre>\n";
        if (place.stop) {
            out_ += "<p class=\"bad\">";
            appendStop(place);
            out_ += "</p>\n";
        }
        if (columns.empty()) {
            out_ += "<p>No result columns are known. " +
                    std::string(host::explain(tracer().missingOf(query))) + "</p>\n";
        } else {
            out_ +=
                "<table><thead><tr><th>Column</th><th>Expression</th><th>Sources</th></tr></thead><tbody>\n";
            for (const host::ResultColumn& column : columns) appendColumn(column);
            out_ += "</tbody></table>\n";
        }
        appendReaders(query);
        std::string tree;
        appendTree(tree, TreeFormat::Pretty, *dialect.grammar, text);
        out_ += "<details class=\"tree\"><summary>Syntax tree</summary>\n<pre>";
        appendHtml(out_, CString::fromUtf8(tree));
        out_ += "</pre></details>\n</details>\n";
    }

    void appendColumn(const host::ResultColumn& column) {
        out_ += "<tr><td>";
        appendHtml(out_, column.name);
        out_ += "</td><td><code>";
        appendHtml(out_, expressionOf(column));
        out_ += "</code></td><td>";
        bool isFirst = true;
        for (const host::ColumnOrigin& origin : column.origins) {
            if (!isFirst) out_ += "<br/>";
            isFirst = false;
            if (!origin.isKnown()) out_ += "<span class=\"bad\">unknown: ";
            const bool hasAnchor = origin.object && anchors_.contains(origin.object);
            if (hasAnchor) out_ += "<a href=\"#" + anchors_.at(origin.object) + "\">";
            appendHtml(out_, originName(origin));
            if (hasAnchor) out_ += "</a>";
            if (!origin.isKnown()) out_ += " (" + std::string(host::explain(origin.why)) + ")</span>";
        }
        out_ += "</td></tr>\n";
    }

    void appendTable(const CZRTableInfo& table) {
        const int count = table.Fields.GetCount();
        beginObject(table, "table", std::to_string(count) + (count == 1 ? " column" : " columns"));
        if (count) {
            out_ += "<table><thead><tr><th>Column</th><th>Type</th></tr></thead><tbody>\n";
            for (const CZRFieldInfo* field : table.Fields) {
                out_ += "<tr><td>";
                appendHtml(out_, field->GetSrcName());
                out_ += "</td><td>";
                appendHtml(out_, field->GetTypeDefinition());
                out_ += "</td></tr>\n";
            }
            out_ += "</tbody></table>\n";
        }
        appendReaders(table);
        out_ += "</details>\n";
    }

    std::string& out_;
    TracedProject& project_;
    const CString title_;
    Anchors anchors_;
    std::unordered_map<const CZRSourceInfo*, std::vector<const CZRQueryInfo*>> readers_;
};

}  // namespace

void appendReport(std::string& out, TracedProject& project, const std::string& title) {
    Page(out, project, title).append();
}

}  // namespace zr::tool
