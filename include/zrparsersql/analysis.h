#pragma once

#include "zrparsersql/db_types.h"
#include "zrparsersql/export.h"

class CZRQueryInfo;

// Parses the query's text (CZRQueryInfo::SetSQL) as the dialect of that kind of database and fills the
// query's clauses, aliases, sources, column references and nested queries. Sources that the query's database
// knows are resolved to their IDs, and user functions are noted in the database.
//
// Lists that the text has a clause for are filled anew; m_aliases, m_sourceTables and m_fields only grow.
// What a second analysis replaces stays alive as long as the query.
//
// A kind without a dialect, a null query and a text without a statement change nothing. Wrong SQL is not
// reported: the query is left empty or partly filled. Never throws.
//
// Threads: runs on the caller's thread. Two calls on two queries are independent, also where the queries
// share a database that nobody changes, unless a text calls a user function: that writes into the database
// (CZRQueryInfo::AddUserFunction). For texts that may do so each thread has a database of its own, or the
// caller guards the calls.
ZR_API void BuildQueryInfo(CZRQueryInfo* query, DBTypes kind);
