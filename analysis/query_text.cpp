#include "zrparsersql/query_text.h"

#include <algorithm>
#include <memory>
#include <string_view>
#include <vector>

#include "zrparsersql/database_info.h"
#include "zrparsersql/query_info.h"

namespace {

constexpr std::size_t kNowhere = std::u16string_view::npos;

// Where a word stands from a place on, searched again only when the place has passed the last hit: a text is
// read once however often it is asked.
class WordFinder {
 public:
    WordFinder(std::u16string_view text, std::u16string_view word)
        : text_(text), word_(word), at_(text.find(word)) {}

    std::size_t from(std::size_t place) {
        if (at_ != kNowhere && at_ < place) at_ = text_.find(word_, place);
        return at_;
    }

 private:
    std::u16string_view text_;
    std::u16string_view word_;
    std::size_t at_;
};

}  // namespace

CString FindJoinPart(CString text) {
    std::u16string_view rest = text;
    for (std::size_t comma; (comma = rest.find(u',')) != kNowhere; rest.remove_prefix(comma + 1)) {
        const std::u16string_view head = rest.substr(0, comma);
        if (head.find(u"JOIN") != kNowhere) return CString(head);
    }
    return CString(rest);
}

int FindFromPosition(CString text) {
    constexpr std::u16string_view kFrom = u"FROM";
    const std::u16string_view whole = text;
    const std::size_t where = whole.find(u"WHERE");
    // Each candidate is the rightmost one left of the candidate before.
    for (std::size_t end = whole.size(); end >= kFrom.size();) {
        const std::size_t at = whole.rfind(kFrom, end - kFrom.size());
        if (at == kNowhere) break;
        const bool hasTextBehind = at + kFrom.size() < end;
        const bool hasWhereToTheLeft = where != kNowhere && where + 5 <= at;
        if (hasTextBehind && !hasWhereToTheLeft) return static_cast<int>(at);
        end = at;
    }
    return -1;
}

CString GetFromClauseText(CString text) {
    const int from = FindFromPosition(text);
    if (from < 0) return CString();
    // Behind the word and the blank.
    CString clause = text.Right(text.GetLength() - from - 5);
    // "COMRUTE" is intended: stored queries were cut by this list.
    for (const char16_t* word :
         {u"WHERE", u"GROUP BY", u"HAVING", u"UNION", u"ORDER BY", u"COMRUTE", u"FOR", u"OPTION"}) {
        const int at = clause.Find(word);
        if (at >= 0) return clause.Left(at);
    }
    return clause;
}

CString Utf8ToWide(const char* bytes) {
    return CString(bytes);
}

void SplitUnions(CString text, CZRQueryInfo* query) {
    constexpr std::u16string_view kUnion = u"UNION", kUnionAll = u"UNION ALL";
    const std::u16string_view whole = text;
    WordFinder unions(whole, kUnion), unionAlls(whole, kUnionAll);
    if (unions.from(0) == kNowhere) return;
    // Every branch starts from the query as it came, not from the branches before it.
    const std::unique_ptr<CZRQueryInfo> pattern(query->Clone());
    for (std::size_t start = 0; start < whole.size();) {
        auto record = std::make_unique<CZRQueryUnionInfo>();
        const std::size_t at = unions.from(start);
        const std::size_t all = unionAlls.from(start);
        std::size_t end = whole.size();
        if (at != kNowhere) {
            record->UnionKind = all == at;
            // The blank behind the word goes with UNION, but not with UNION ALL.
            end = std::min(end, at + (all == at ? kUnionAll.size() : kUnion.size() + 1));
        }
        CString branch(whole.substr(start, std::min(at, end) - start));
        branch.Replace(u"\r\n", u" ");
        pattern->m_sql = branch.TrimRight();
        record->Query = pattern->Clone();
        query->m_unions.AddTail(record.get());
        static_cast<void>(record.release());
        start = end;
    }
}

void ResolveKnownSources(CZRQueryInfo* query) {
    std::vector<CZRQueryInfo*> open{query};
    while (!open.empty()) {
        CZRQueryInfo* const at = open.back();
        open.pop_back();
        for (CZRQueryInfo* nested : at->m_subQueries)
            if (nested) open.push_back(nested);
        for (auto& entry : at->m_sourceTables) {
            const CZRSourceInfo* const source = at->m_database ? at->FindSource(entry.key) : nullptr;
            entry.value = source ? source->GetID() : CString();
        }
    }
}
