#pragma once

#include <string>

#include "zrparsersql/query_info.h"

// What a dialect writes differently for the same query. Each of these has a test of its own with the dialect.
struct Differences {
    bool aliasesAreKept = false;    // apart by a suffix of their key, and with the name that they stand for
    bool stringsAreQuoted = false;  // in the text of their item
    bool joinPartsAreNested = false;
};

// A descriptor as text, a line a fact and nested queries indented, without what names a dialect: token
// numbers and DataType. Maps are in the order of their keys. What differs is written as if it did not.
std::string plainDescriptor(const CZRQueryInfo& query, const Differences& differences = {});
