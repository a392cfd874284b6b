#include "analyst.h"

#include "descriptor_json.h"
#include "json_text.h"
#include "picture.h"
#include "zrparsersql/analysis.h"

namespace zr::tool {

namespace {

ReadPlace::Stop placeOf(std::u16string_view text, std::size_t offset) {
    ReadPlace::Stop stop;
    stop.offset = offset;
    std::size_t lineStart = 0;
    for (std::size_t at = 0; at < offset; ++at) {
        const bool lineEnds = text[at] == u'\n' || (text[at] == u'\r' && text[at + 1] != u'\n');
        if (lineEnds) {
            ++stop.line;
            lineStart = at + 1;
        }
    }
    stop.column = offset - lineStart + 1;
    return stop;
}

}  // namespace

void appendRead(std::string& out, const ReadPlace& place) {
    out += '{';
    JsonMembers members(out);
    members.number("tokens", static_cast<std::int64_t>(place.taken));
    members.number("of", static_cast<std::int64_t>(place.all));
    members.name("stop");
    if (place.stop) {
        out += '{';
        JsonMembers stop(out);
        stop.number("offset", static_cast<std::int64_t>(place.stop->offset));
        stop.number("line", static_cast<std::int64_t>(place.stop->line));
        stop.number("column", static_cast<std::int64_t>(place.stop->column));
        stop.text("text", place.stop->text);
        out += '}';
    } else {
        out += "null";
    }
    out += '}';
}

ReadPlace readPlace(const Dialect& dialect, const CString& given) {
    const CString text = dialect.prepare ? dialect.prepare(given) : given;
    Recogniser recogniser(*dialect.grammar, text);
    const ReadResult read = recogniser.readQuery();
    ReadPlace place;
    place.taken = read.taken;
    place.all = read.all;
    if (read.stoppedAt) {
        place.stop = placeOf(text, recogniser.offset(read.stoppedAt));
        place.stop->text = runtimeText(read.stoppedAt->getText(read.stoppedAt));
    }
    return place;
}

std::unique_ptr<CZRQueryInfo> Analyst::analyse(const CString& text) {
    database_.UserFunctions.RemoveAll();
    auto query = std::make_unique<CZRQueryInfo>();
    query->SetSQL(text);
    query->SetDatabase(&database_);
    BuildQueryInfo(query.get(), dialect_.kind);
    return query;
}

void Analyst::appendJsonMembers(std::string& out, const CString& text) {
    const auto query = analyse(text);
    JsonMembers members(out);
    members.name("query");
    appendQuery(out, *query);
    members.name("UserFunctions");
    appendTextMap(out, database_.UserFunctions);
    members.name("read");
    appendRead(out, readPlace(dialect_, text));
}

void Analyst::appendPicture(std::string& out, const CString& text) {
    const auto query = analyse(text);
    drawPicture(out, text, *query, readPlace(dialect_, text));
}

}  // namespace zr::tool
