#pragma once

#include <string>
#include <vector>

namespace zr::fuzz {

/// Inputs to start from, for the targets whose inputs are no SQL.
std::vector<std::string> projectSamples();
std::vector<std::string> sqliteSamples();
std::vector<std::string> grammarSamples();

/// Stands in front of an input of the SQLite target that is rows and no file.
constexpr char kRowsMark = 'R';

/// Stands between vocabulary, lexer and rules in an input of the grammar compiler's target.
constexpr const char* kNextFile = "\n%%%%\n";

}  // namespace zr::fuzz
