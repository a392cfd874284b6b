#pragma once

#include <zrparsersql/database_info.h>
#include <zrparsersql/wide_string.h>

#include <array>
#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "grammar/engine/tables.h"

/// The dialects and the queries that benchmarks measure them with.
namespace zr::bench {

struct Query {
    CString text;
    std::uint32_t tokens = 0;
    bool isReadToEnd = false;
};

struct Dialect {
    const char* name;
    const engine::GrammarTable& grammar;
    DBTypes kind;
    /// `SetSQL`, `ParseSQL`, `GetSQLTree`, and the end of all that.
    void (*facade)(CString& text);
    /// Everything behind the parse: the views, the passes over them, and the descriptor's end.
    std::function<void()> (*walk)(CString& text);
};

const std::array<Dialect, 5>& dialects();

/// The queries of a folder's file DIALECT.jsonl, or without a folder the plain ones, of which a dialect can
/// have a form of its own.
std::vector<Query> readQueries(const Dialect& dialect, const std::string& folder);

}  // namespace zr::bench
