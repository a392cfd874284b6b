#include "grammar/engine/reports.h"

#include <new>
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

/// A report that there is no memory for is lost: it comes from below functions in C, which no exception may
/// go through.
template <class Text>
void tell(Text text) noexcept {
    try {
        zr::diagnose(text());
    } catch (const std::bad_alloc&) {
    }
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

void reportDropped(const TextPlace& place, char16_t unit) noexcept {
    tell([&] { return placeText(place) + u" no token starts with '" + unit + u"'"; });
}

void reportUnreadable(const TextPlace& place, std::u16string_view token) noexcept {
    tell([&] {
        std::u16string text = placeText(place) + u" no way to read on";
        if (!token.empty()) (text += u" at '").append(token) += u"'";
        return text;
    });
}

void reportUnreadableEnd(std::uint32_t line) noexcept {
    // The runtime gives its end of the text no column, and counts that of the first line from -1.
    tell([&] {
        return placeText({line, line == 1 ? 1u : 0u}) + u" no way to read on at the end of the text";
    });
}

void reportTooLong() noexcept {
    zr::diagnose(u"the text is too long to be read");
}

}  // namespace zr::engine
