#include "lineage_format.h"

#include <map>
#include <set>

#include "expression_text.h"
#include "json_text.h"
#include "picture.h"
#include "text_table.h"

namespace zr::tool {

namespace {

using Text = std::u16string;
using Queries = std::vector<const CZRQueryInfo*>;

Text textOf(const CString& text) {
    return Text(text.View());
}

Text textOf(std::string_view ascii) {
    return Text(ascii.begin(), ascii.end());
}

void appendUtf8(std::string& out, const Text& text) {
    out += CString(text).toUtf8();
}

void join(Text& text, const Text& part) {
    if (!text.empty() && !part.empty()) text += u", ";
    text += part;
}

// Known origins first, then what is unknown and why.
Text originsText(const host::ColumnOrigins& origins) {
    Text known;
    Text unknown;
    for (const host::ColumnOrigin& origin : origins) {
        if (origin.isKnown())
            join(known, originName(origin));
        else
            join(unknown, originName(origin) + u" (" + textOf(host::explain(origin.why)) + u")");
    }
    Text text = known.empty() ? known : u"from " + known;
    join(text, unknown.empty() ? unknown : u"unknown: " + unknown);
    return text;
}

Text ringText(const host::Ring& ring) {
    Text text;
    for (const CZRQueryInfo* query : ring) text += textOf(query->GetSrcName()) + u" reads from ";
    return text + textOf(ring.front()->GetSrcName());
}

void appendRings(Text& out, const std::vector<host::Ring>& rings) {
    if (rings.empty()) return;
    TextTable lines;
    for (const host::Ring& ring : rings) lines.add({ringText(ring)});
    out += u"\nRings\n";
    lines.appendTo(out);
}

void appendPretty(std::string& out, TracedProject& project, const Queries& queries) {
    Text text;
    for (const CZRQueryInfo* query : queries) {
        if (!text.empty()) text += u'\n';
        text += u"Query " + textOf(query->GetSrcName()) + u"\n\n";
        TextTable columns;
        std::size_t place = 0;
        for (const host::ResultColumn& column : project.lineage().tracer().columnsOf(*query))
            columns.add(
                {number(++place), textOf(column.name), expressionOf(column), originsText(column.origins)});
        if (columns.isEmpty()) {
            const Text why = textOf(host::explain(project.lineage().tracer().missingOf(*query)));
            columns.add({why.empty() ? Text(u"no columns") : u"no columns: " + why});
        }
        columns.appendTo(text);
        appendStop(text, project.readPlaceOf(*query));
    }
    appendRings(text, project.lineage().rings());
    appendUtf8(out, text);
}

template <class List, class Append>
void appendJsonList(std::string& out, const List& list, Append append) {
    out += '[';
    bool isFirst = true;
    for (const auto& each : list) {
        if (!isFirst) out += ',';
        isFirst = false;
        append(each);
    }
    out += ']';
}

void appendOriginsJson(std::string& out, const host::ColumnOrigins& origins) {
    appendJsonList(out, origins, [&](const host::ColumnOrigin& origin) { appendOriginJson(out, origin); });
}

void appendRingsJson(std::string& out, const std::vector<host::Ring>& rings) {
    appendJsonList(out, rings, [&](const host::Ring& ring) {
        appendJsonList(out, ring,
                       [&](const CZRQueryInfo* query) { appendJsonString(out, query->GetSrcName().View()); });
    });
}

void appendQueryJson(std::string& out, TracedProject& project, const CZRQueryInfo& query) {
    out += '{';
    JsonMembers members(out);
    members.text("name", query.GetSrcName().View());
    members.name("columns");
    appendJsonList(out, project.lineage().tracer().columnsOf(query), [&](const host::ResultColumn& column) {
        out += '{';
        JsonMembers parts(out);
        parts.text("name", column.name.View());
        parts.text("expression", expressionOf(column));
        parts.name("from");
        appendOriginsJson(out, column.origins);
        parts.name("steps");
        appendOriginsJson(out, column.steps);
        out += '}';
    });
    members.name("read");
    appendRead(out, project.readPlaceOf(query));
    out += '}';
}

void appendJson(std::string& out, TracedProject& project, const Queries& queries) {
    out += '{';
    JsonMembers members(out);
    members.name("queries");
    appendJsonList(out, queries, [&](const CZRQueryInfo* query) { appendQueryJson(out, project, *query); });
    members.name("rings");
    appendRingsJson(out, project.lineage().rings());
    out += "}\n";
}

void appendCsvCell(Text& out, const Text& cell) {
    if (!out.empty() && out.back() != u'\n') out += u',';
    if (cell.find_first_of(u",\"\r\n") == Text::npos && !cell.empty()) {
        out += cell;
        return;
    }
    out += u'"';
    for (const char16_t unit : cell) {
        if (unit == u'"') out += unit;
        out += unit;
    }
    out += u'"';
}

void appendCsv(std::string& out, TracedProject& project, const Queries& queries) {
    out += "query,place,column,source,source column,known,why\n";
    for (const CZRQueryInfo* query : queries) {
        Text text;
        std::size_t place = 0;
        for (const host::ResultColumn& column : project.lineage().tracer().columnsOf(*query)) {
            ++place;
            host::ColumnOrigins origins = column.origins;
            const bool isNone = origins.empty();  // such as a constant
            if (isNone) origins.emplace_back();
            for (const host::ColumnOrigin& origin : origins) {
                for (const Text& cell : {textOf(query->GetSrcName()), number(place), textOf(column.name),
                                         textOf(origin.source), textOf(origin.column),
                                         Text(isNone             ? u""
                                              : origin.isKnown() ? u"yes"
                                                                 : u"no"),
                                         textOf(host::explain(origin.why))})
                    appendCsvCell(text, cell);
                text += u'\n';
            }
        }
        appendUtf8(out, text);
    }
}

Text dotQuoted(const Text& text) {
    Text quoted = u"\"";
    for (const char16_t unit : text) {
        if (unit == u'"' || unit == u'\\') quoted += u'\\';
        quoted += unit == u'\n' || unit == u'\r' ? u' ' : unit;
    }
    return quoted + u'"';
}

// A box for each table and query, with its columns, and an arrow from each column to those made of it.
class DotGraph {
 public:
    explicit DotGraph(TracedProject& project) : project_(project) {}

    void add(const CZRQueryInfo& query) {
        const Text name = textOf(query.GetSrcName());
        nodeOf(name, Text());
        for (const host::ResultColumn& column : project_.lineage().tracer().columnsOf(query)) {
            const Text to = nodeOf(name, textOf(column.name));
            for (const host::ColumnOrigin& step : column.steps) {
                const Text source = step.source.IsEmpty() ? Text(u"?") : textOf(step.source);
                if (step.why == host::Unknown::PartOfText && step.column.IsEmpty()) continue;
                arrows_.insert({nodeOf(source, textOf(step.column)), to, step.isKnown()});
            }
        }
    }

    void appendTo(std::string& out) const {
        Text text = u"digraph lineage {\n  rankdir=LR;\n  node [shape=box];\n";
        std::size_t place = 0;
        for (const auto& [box, columns] : boxes_) {
            text += u"  subgraph cluster" + number(place++) + u" {\n    label=" + dotQuoted(box) + u";\n";
            for (const auto& [column, node] : columns)
                text += u"    " + node + u" [label=" + dotQuoted(column) + u"];\n";
            text += u"  }\n";
        }
        for (const Arrow& arrow : arrows_)
            text +=
                u"  " + arrow.from + u" -> " + arrow.to + (arrow.isKnown ? u"" : u" [style=dashed]") + u";\n";
        appendUtf8(out, text + u"}\n");
    }

 private:
    struct Arrow {
        Text from;
        Text to;
        bool isKnown;
        auto operator<=>(const Arrow&) const = default;
    };

    Text nodeOf(const Text& box, const Text& column) {
        auto& columns = boxes_[box];
        if (column.empty()) return {};
        const auto [place, isNew] = columns.try_emplace(column);
        if (isNew) place->second = u"c" + number(++nodes_);
        return place->second;
    }

    TracedProject& project_;
    std::map<Text, std::map<Text, Text>> boxes_;
    std::set<Arrow> arrows_;
    std::size_t nodes_ = 0;
};

Text nameOf(const host::LineageTarget& target) {
    Text name = textOf(target.object->GetSrcName());
    if (target.column) name += u"." + textOf(*target.column);
    return name;
}

Text listOf(const std::vector<CString>& names) {
    Text list;
    for (const CString& name : names) join(list, textOf(name));
    return list;
}

Text usesText(const std::vector<host::DependentQuery::Use>& uses) {
    std::map<std::string_view, Text> byClause;
    Text text;
    for (const auto& use : uses) join(byClause[use.clause], originName(use.step));
    for (const auto& [clause, columns] : byClause)
        text += (text.empty() ? Text() : Text(u"; ")) + u"in " + textOf(clause) + u": " + columns;
    return text;
}

Text readsText(const std::vector<const CZRSourceInfo*>& objects) {
    Text text;
    for (const CZRSourceInfo* object : objects) join(text, textOf(object->GetSrcName()));
    return text;
}

void appendImpactPretty(std::string& out, const host::Impact& impact, const host::LineageTarget& target) {
    Text text = u"What depends on " + nameOf(target) + u'\n';
    const auto block = [&](const char16_t* title, const TextTable& lines) {
        if (lines.isEmpty()) return;
        text += u'\n' + Text(title) + u'\n';
        lines.appendTo(text);
    };
    TextTable queries;
    for (const host::DependentQuery& query : impact.queries) {
        Text what = query.columns.empty() ? Text() : u"columns: " + listOf(query.columns);
        for (const Text& part :
             {usesText(query.uses), query.reads.empty() ? Text() : u"reads from: " + readsText(query.reads)})
            if (!part.empty()) what += (what.empty() ? Text() : Text(u"; ")) + part;
        queries.add({number(query.distance), textOf(query.query->GetSrcName()), what});
    }
    block(u"Queries, by distance", queries);
    TextTable keys;
    for (const host::DependentKey& key : impact.keys)
        keys.add({textOf(key.table->GetSrcName()), textOf(key.key->GetSrcName()),
                  key.isForeign ? u"foreign key" : u"index"});
    block(u"Keys", keys);
    TextTable uncertain;
    for (const host::UncertainQuery& query : impact.uncertain)
        uncertain.add({textOf(query.query->GetSrcName()),
                       query.open.column.IsEmpty() ? Text() : originName(query.open),
                       textOf(host::explain(query.open.why))});
    block(u"Perhaps", uncertain);
    if (impact.queries.empty() && impact.keys.empty() && impact.uncertain.empty()) text += u"\n  nothing\n";
    appendUtf8(out, text);
}

void appendImpactJson(std::string& out, const host::Impact& impact, const host::LineageTarget& target) {
    out += '{';
    JsonMembers members(out);
    members.text("target", nameOf(target));
    members.name("queries");
    appendJsonList(out, impact.queries, [&](const host::DependentQuery& query) {
        out += '{';
        JsonMembers parts(out);
        parts.text("name", query.query->GetSrcName().View());
        parts.number("distance", static_cast<std::int64_t>(query.distance));
        parts.name("columns");
        appendJsonList(out, query.columns, [&](const CString& name) { appendJsonString(out, name.View()); });
        parts.name("uses");
        appendJsonList(out, query.uses, [&](const host::DependentQuery::Use& use) {
            out += '{';
            JsonMembers each(out);
            each.ascii("clause", use.clause);
            each.text("source", use.step.source.View());
            each.text("column", use.step.column.View());
            out += '}';
        });
        parts.name("reads");
        appendJsonList(out, query.reads, [&](const CZRSourceInfo* object) {
            appendJsonString(out, object->GetSrcName().View());
        });
        out += '}';
    });
    members.name("keys");
    appendJsonList(out, impact.keys, [&](const host::DependentKey& key) {
        out += '{';
        JsonMembers parts(out);
        parts.text("table", key.table->GetSrcName().View());
        parts.text("key", key.key->GetSrcName().View());
        parts.ascii("is", key.isForeign ? "foreign key" : "index");
        out += '}';
    });
    members.name("perhaps");
    appendJsonList(out, impact.uncertain, [&](const host::UncertainQuery& query) {
        out += '{';
        JsonMembers parts(out);
        parts.text("name", query.query->GetSrcName().View());
        parts.name("open");
        appendOriginJson(out, query.open);
        out += '}';
    });
    out += "}\n";
}

}  // namespace

Text originName(const host::ColumnOrigin& origin) {
    Text name = origin.source.IsEmpty() ? Text(u"?") : textOf(origin.source);
    if (!origin.column.IsEmpty()) name += u"." + textOf(origin.column);
    return name;
}

Text expressionOf(const host::ResultColumn& column) {
    if (!column.expression) return u"*";
    return expressionText(*column.expression, [](const CZRQueryInfo&) { return Text(u"(query)"); });
}

void appendOriginJson(std::string& out, const host::ColumnOrigin& origin) {
    out += '{';
    JsonMembers members(out);
    members.name("source");
    if (origin.source.IsEmpty())
        out += "null";
    else
        appendJsonString(out, origin.source.View());
    members.text("column", origin.column.View());
    members.name("known");
    out += origin.isKnown() ? "true" : "false";
    if (!origin.isKnown()) members.ascii("why", host::explain(origin.why));
    out += '}';
}

void appendLineage(std::string& out, LineageFormat format, TracedProject& project, const Queries& queries) {
    switch (format) {
        case LineageFormat::Pretty:
            return appendPretty(out, project, queries);
        case LineageFormat::Json:
            return appendJson(out, project, queries);
        case LineageFormat::Csv:
            return appendCsv(out, project, queries);
        case LineageFormat::Dot: {
            DotGraph graph(project);
            for (const CZRQueryInfo* query : queries) graph.add(*query);
            return graph.appendTo(out);
        }
    }
}

void appendImpact(std::string& out, LineageFormat format, TracedProject& project,
                  const host::LineageTarget& target) {
    const host::Impact impact = project.lineage().impactOf(target);
    if (format == LineageFormat::Json)
        appendImpactJson(out, impact, target);
    else
        appendImpactPretty(out, impact, target);
}

}  // namespace zr::tool
