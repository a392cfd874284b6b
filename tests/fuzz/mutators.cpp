// What the fuzzer asks for new inputs: mostly pieces moved about, now and then bytes.

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <string>

#include "tests/fuzz/pieces.h"

extern "C" std::size_t LLVMFuzzerMutate(std::uint8_t* data, std::size_t size, std::size_t maxSize);
extern "C" std::size_t LLVMFuzzerCustomMutator(std::uint8_t* data, std::size_t size, std::size_t maxSize,
                                               unsigned seed);
extern "C" std::size_t LLVMFuzzerCustomCrossOver(const std::uint8_t* first, std::size_t firstSize,
                                                 const std::uint8_t* second, std::size_t secondSize,
                                                 std::uint8_t* out, std::size_t maxSize, unsigned seed);

namespace {

std::string_view textOf(const std::uint8_t* data, std::size_t size) {
    return {reinterpret_cast<const char*>(data), size};
}

}  // namespace

std::size_t LLVMFuzzerCustomMutator(std::uint8_t* data, std::size_t size, std::size_t maxSize,
                                    unsigned seed) {
    if (seed % 4 == 0) return LLVMFuzzerMutate(data, size, maxSize);
    const std::string text =
        zr::fuzz::mutated(zr::fuzz::languageOfTarget(), textOf(data, size), maxSize, seed);
    std::copy(text.begin(), text.end(), data);
    return text.size();
}

std::size_t LLVMFuzzerCustomCrossOver(const std::uint8_t* first, std::size_t firstSize,
                                      const std::uint8_t* second, std::size_t secondSize, std::uint8_t* out,
                                      std::size_t maxSize, unsigned seed) {
    const std::string text = zr::fuzz::crossed(zr::fuzz::languageOfTarget(), textOf(first, firstSize),
                                               textOf(second, secondSize), maxSize, seed);
    std::copy(text.begin(), text.end(), out);
    return text.size();
}
