#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace zr::tool {

// One line of a JSON-lines input: {"id": ..., "sql": "..."}; other members are passed over, of members that
// stand twice the last counts.
struct JsonLine {
    std::string id = "null";            // JSON text of the id, ASCII only; null where the line has none
    std::optional<std::u16string> sql;  // escapes of unpaired surrogates included
    std::string error;                  // empty, or why there is no sql
};

// Reads a line. A line that is no JSON object has the id null; one that is, but holds no text "sql", keeps
// its id. Needs no machine stack for nested values.
JsonLine readJsonLine(std::string_view line);

}  // namespace zr::tool
