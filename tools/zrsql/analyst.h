#pragma once

#include <cstddef>
#include <memory>
#include <optional>
#include <string>

#include "dialects.h"
#include "zrparsersql/database_info.h"
#include "zrparsersql/query_info.h"

namespace zr::tool {

// How far a query's text was read.
struct ReadPlace {
    // The first token that the query did not take. Offset and column count UTF-16 units, the offset from 0,
    // line and column from 1; a line ends with CR LF, LF or CR.
    struct Stop {
        std::size_t offset = 0;
        std::size_t line = 1;
        std::size_t column = 1;
        std::u16string text;
    };
    std::size_t taken = 0;  // tokens
    std::size_t all = 0;
    std::optional<Stop> stop;  // none when all were taken
};

// Analyses one text after the other against one database. An object belongs to one thread at a time.
class Analyst {
 public:
    // Both are to outlive the object. User functions of the database are emptied ahead of each text.
    Analyst(const Dialect& dialect, CZRDatabaseInfo& database) : dialect_(dialect), database_(database) {}

    // {"query":..,"UserFunctions":..,"read":..} without the braces.
    void appendJsonMembers(std::string& out, const CString& text);
    // Lines for a person.
    void appendPicture(std::string& out, const CString& text);

 private:
    std::unique_ptr<CZRQueryInfo> analyse(const CString& text);

    const Dialect& dialect_;
    CZRDatabaseInfo& database_;
};

// Offsets count in the text as it is parsed.
ReadPlace readPlace(const Dialect& dialect, const CString& given);

// {"tokens":..,"of":..,"stop":..}
void appendRead(std::string& out, const ReadPlace& place);

}  // namespace zr::tool
