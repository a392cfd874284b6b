#pragma once

#include <functional>

#include "zrparsersql/export.h"
#include "zrparsersql/wide_string.h"

class CZRQueryInfo;

// Work on the raw text of a query, for hosts that need no more than that. Nothing here parses: words are
// searched as they are written here, in capitals, wherever they stand, and the first hit from the left counts
// unless said otherwise. Positions count UTF-16 units. Free of shared state; failure: only an exhausted heap,
// as std::bad_alloc. A pointer to a query may not be null; the caller goes on owning it.

// The first piece between commas that holds "JOIN"; the last piece when none does.
ZR_SHARED_DECLARATION CString FindJoinPart(CString text);

// Position of the rightmost "FROM" that has no "WHERE" to its left and at least one unit behind it; -1 when
// there is none.
ZR_SHARED_DECLARATION int FindFromPosition(CString text);

// The text of the FROM clause that FindFromPosition finds, up to the first of the words "WHERE", "GROUP BY",
// "HAVING", "UNION", "ORDER BY", "COMRUTE", "FOR", "OPTION" that occurs at all: the words are tried in this
// order, wherever they stand. Empty without such a clause.
ZR_SHARED_DECLARATION CString GetFromClauseText(CString text);

// From UTF-8 that ends with a zero; a null pointer gives an empty text.
ZR_SHARED_DECLARATION CString Utf8ToWide(const char* bytes);

// Cuts a text at its unions and appends a record for each branch to the query's m_unions: kind 0 in front of
// a "UNION", 1 in front of a "UNION ALL"; the last branch's kind is left as it is. A text without a union
// appends nothing. The record's query is a copy of the given one, as it was at the call, with the branch's
// text.
ZR_SHARED_DECLARATION void SplitUnions(CString text, CZRQueryInfo* query);

// The text of an MS Access query as its parser wants it: a bracketed name of two words with a full stop
// between them, "[Orders.Total]", becomes two, "[Orders].[Total]", wherever it stands, in strings as well.
// Words are what \w stands for in the wide expressions of the standard library: letters and digits as the
// process's global locale has them, and "_". `trace` gets three lines for each such name (the name, its
// place, the place behind its bracket) and one with the result.
ZR_SHARED_DECLARATION CString
PrepareAccessQueryText(const CString& text, const std::function<void(const CString& line)>& trace = {});

// Puts the IDs of sources into m_sourceTables, here and in all m_subQueries, as CZRQueryInfo::ResolveSources
// does, for queries whose sources are all known: the value of an unknown one becomes empty.
ZR_SHARED_DECLARATION void ResolveKnownSources(CZRQueryInfo* query);
