#include "coloured_sql.h"

#include <string_view>
#include <vector>

#include "html_text.h"
#include "recogniser.h"

namespace zr::tool {

namespace {

struct ClauseWord {
    const char16_t* word;
    std::string_view clause;
};

constexpr ClauseWord kClauseWords[] = {
    {u"SELECT", "c-select"}, {u"FROM", "c-from"},   {u"WHERE", "c-where"},   {u"GROUP", "c-group"},
    {u"HAVING", "c-having"}, {u"ORDER", "c-order"}, {u"UNION", "c-union"},   {u"INTERSECT", "c-union"},
    {u"EXCEPT", "c-union"},  {u"MINUS", "c-union"}, {u"LIMIT", "c-limit"},   {u"OFFSET", "c-limit"},
    {u"FETCH", "c-limit"},   {u"START", "c-where"}, {u"CONNECT", "c-where"},
};

std::string_view clauseOf(std::u16string_view word) {
    const CString text(word);
    for (const ClauseWord& each : kClauseWords)
        if (text.EqualsNoCase(each.word)) return each.clause;
    return {};
}

// Which clause each token stands in. Clauses begin anew in parentheses that hold a query; in others, such as
// those of EXTRACT(YEAR FROM day), the clause around them goes on.
class Clauses {
 public:
    std::string_view next(std::u16string_view token) {
        if (token == u"(") {
            levels_.push_back({levels_.back().clause, false, true});
            return levels_.back().clause;
        }
        if (token == u")") {
            if (levels_.size() > 1) levels_.pop_back();
            return levels_.back().clause;
        }
        Level& level = levels_.back();
        const std::string_view clause = clauseOf(token);
        if (level.isNew) level.isQuery = clause == "c-select" || levels_.size() == 1;
        level.isNew = false;
        if (level.isQuery && !clause.empty()) level.clause = clause;
        return level.clause;
    }

 private:
    struct Level {
        std::string_view clause;
        bool isQuery = true;
        bool isNew = true;
    };
    std::vector<Level> levels_{Level{}};
};

}  // namespace

void appendColouredSql(std::string& out, const Dialect& dialect, const CString& text, std::size_t readTo) {
    Recogniser recogniser(*dialect.grammar, text);
    Clauses clauses;
    std::string_view current;
    bool isUnread = false;
    std::size_t written = 0;
    const auto close = [&](std::size_t at) {
        if (at > written) {
            out += "<span class=\"" + std::string(current) + (isUnread ? " unread" : "") + "\">";
            appendHtml(out, text.View().substr(written, at - written));
            out += "</span>";
        }
        written = at;
    };
    for (const pANTLR3_COMMON_TOKEN token : recogniser.tokens()) {
        const std::size_t at = recogniser.offset(token);
        const std::string_view clause = clauses.next(runtimeText(token->getText(token)));
        const bool isBehind = at >= readTo;
        if (clause == current && isBehind == isUnread) continue;
        close(at);
        current = clause;
        isUnread = isBehind;
    }
    close(text.View().size());
}

}  // namespace zr::tool
