#pragma once

#include <string>
#include <string_view>

namespace zr {

// Text of a filter value between its encodings (filter_info.h). UTF-16 is bytes in the machine's order.
std::u16string decodeFilterText(std::string_view bytes, int encoding);
std::string encodeFilterText(std::u16string_view units, int encoding);
inline std::string convertFilterText(std::string_view bytes, int from, int to) {
    return encodeFilterText(decodeFilterText(bytes, from), to);
}

}  // namespace zr
