#pragma once

#include <cstdint>
#include <random>
#include <string>
#include <string_view>
#include <vector>

namespace zr::fuzz {

using Random = std::mt19937;

/// What there is to know of the inputs of a target: where one can be cut, what can stand in it, and some of
/// them.
class Language {
 public:
    virtual ~Language() = default;
    /// The pieces of an input, whose concatenation it is.
    virtual std::vector<std::string> cut(std::string_view input) const = 0;
    /// The vocabulary, which is not empty.
    virtual const std::vector<std::string>& words() const = 0;
    /// Several words that go together.
    virtual std::string phrase(Random& random) { return words()[random() % words().size()]; }
    /// Inputs to start from.
    virtual std::vector<std::string> samples() = 0;
    /// What can stand around other pieces.
    virtual std::string opener() const { return "("; }
    virtual std::string closer() const { return ")"; }
};

/// The language of the target that this program is; the target defines it.
Language& languageOfTarget();

/// Deletes, doubles, swaps, repeats, nests, replaces or inserts pieces of an input.
std::string mutated(Language& language, std::string_view input, std::size_t maxSize, std::uint32_t seed);

/// The start of one input and the end of another, or a run of one within the other.
std::string crossed(Language& language, std::string_view first, std::string_view second, std::size_t maxSize,
                    std::uint32_t seed);

}  // namespace zr::fuzz
