#pragma once

#include <string>
#include <string_view>

#include "zrparsersql/wide_string.h"

namespace zr::tool {

// Appends a text as content or as an attribute's value in quotes. Units that no page may hold become U+FFFD.
inline void appendHtml(std::string& out, std::u16string_view text) {
    std::u16string allowed(text);
    for (char16_t& unit : allowed) {
        const bool isControl = unit < u' ' && unit != u'\n' && unit != u'\t' && unit != u'\r';
        if (isControl || unit == 0x7F || unit >= 0xFFFE) unit = 0xFFFD;
    }
    for (std::size_t at = 0; at < allowed.size(); ++at) {
        const bool isHigh = (allowed[at] & 0xFC00) == 0xD800;
        const bool isPair = isHigh && at + 1 < allowed.size() && (allowed[at + 1] & 0xFC00) == 0xDC00;
        if (isPair)
            ++at;
        else if ((allowed[at] & 0xF800) == 0xD800)
            allowed[at] = 0xFFFD;
    }
    for (const char unit : CString(allowed).toUtf8()) {
        switch (unit) {
            case '&':
                out += "&amp;";
                break;
            case '<':
                out += "&lt;";
                break;
            case '>':
                out += "&gt;";
                break;
            case '"':
                out += "&quot;";
                break;
            case '\'':
                out += "&#39;";
                break;
            default:
                out += unit;
        }
    }
}

}  // namespace zr::tool
