#pragma once

#include <cstdint>
#include <string_view>

/// What lexer and parser have to say, as the text that goes to whoever listens.
namespace zr::engine {

/// Lines count from 1, columns from 0.
struct TextPlace {
    std::uint32_t line = 1, column = 0;
};

/// Finds the places of units that are asked for in ascending order.
class PlaceFinder {
 public:
    explicit PlaceFinder(std::u16string_view text) : text_(text) {}
    TextPlace at(std::uint32_t unit);

 private:
    std::u16string_view text_;
    std::uint32_t seen_ = 0, line_ = 1, lineStart_ = 0;
};

/// A unit that starts no token.
void reportDropped(const TextPlace& place, char16_t unit) noexcept;

/// A token, given by its units, that nothing could go on with.
void reportUnreadable(const TextPlace& place, std::u16string_view token) noexcept;

/// The same at the end of a text whose last line is `line`.
void reportUnreadableEnd(std::uint32_t line) noexcept;

/// More units or tokens than the options allow.
void reportTooLong() noexcept;

}  // namespace zr::engine
