#pragma once

#include <string>
#include <string_view>
#include <unordered_map>

#include "host/stored_tree.h"

// Sections as JSON: a section is an object, its values first, then its sections, each in stored order. Texts
// are UTF-8. What UTF-8 can't hold, an unpaired surrogate, is written as U+FFFF and the four hexadecimal
// digits of the unit, and so is U+FFFF itself.
namespace zr::host {

// Appends a whole section, indented, a line a value.
void appendJson(std::string& out, const StoredSection& section);
// Appends the values of a section alone, in one line.
void appendValuesJson(std::string& out, const StoredSection& section);

// A name as it stands in JSON, but for quotes and what JSON escapes.
std::string nameInUtf8(const CString& name);

// Reads JSON texts of sections. One reader for many texts holds names that come again only once.
class JsonReader {
 public:
    // Puts the values and sections of the object into a section, which is to be empty. Places are lines from
    // 1 on. Raises StorageError, with the line and what is wrong, for a text that is no JSON object, a value
    // that is neither a text nor a whole number of 32 bits, a name that stands twice, more than
    // kMostValues values in a section, and sections more than kMostLevels deep. Needs no machine stack for
    // the depth.
    void read(std::string_view json, StoredSection& section);

    // The opposite of nameInUtf8; holds as long as the reader. Raises StorageError for a broken escape.
    const CString& name(const std::string& utf8);

 private:
    std::unordered_map<std::string, CString> names_;
};

}  // namespace zr::host
