#pragma once

#include <string>

#include "zrparsersql/query_info.h"

// A descriptor as text, a line a fact and nested queries indented, without what names a dialect: token
// numbers and DataType. Maps are in the order of their keys.
std::string plainDescriptor(const CZRQueryInfo& query);
