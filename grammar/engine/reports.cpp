#include "grammar/engine/reports.h"

#include <string>

#include "grammar/engine/diagnostics.h"

namespace zr::engine {
namespace {

std::u16string placeText(const TextPlace& place) {
    std::u16string text;
    const auto append = [&text](std::uint32_t number) {
        for (const char c : std::to_string(number)) text.push_back(static_cast<char16_t>(c));
        text.push_back(u':');
    };
    append(place.line);
    append(place.column);
    return text;
}

}  // namespace

TextPlace PlaceFinder::at(std::uint32_t unit) {
    for (; seen_ < unit; ++seen_) {
        if (text_[seen_] != u'\n') continue;
        ++line_;
        lineStart_ = seen_ + 1;
    }
    return {line_, unit - lineStart_};
}

void reportDropped(const TextPlace& place, char16_t unit) {
    std::u16string text = placeText(place);
    text += u" no token starts with '";
    text += unit;
    text += u"'";
    zr::diagnose(text);
}

void reportUnreadable(const TextPlace& place, std::u16string_view token) {
    std::u16string text = placeText(place);
    text += u" no way to read on";
    if (!token.empty()) {
        text += u" at '";
        text += token;
        text += u"'";
    }
    zr::diagnose(text);
}

void reportUnreadableEnd(std::uint32_t line) {
    // The runtime gives its end of the text no column, and counts that of the first line from -1.
    std::u16string text = placeText({line, line == 1 ? 1u : 0u});
    text += u" no way to read on at the end of the text";
    zr::diagnose(text);
}

}  // namespace zr::engine
