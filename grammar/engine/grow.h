#pragma once

#include <cstddef>

namespace zr::engine {

/// Makes room for one more. What a text needs is mostly guessed well, so half as much again is enough, where
/// a vector would take twice as much.
template <typename Vector>
void growSlowly(Vector& vector) {
    if (vector.size() == vector.capacity()) vector.reserve(vector.size() + vector.size() / 2 + 8);
}

/// The same for several more.
template <typename Vector>
void growSlowly(Vector& vector, std::size_t more) {
    const std::size_t wanted = vector.size() + more;
    if (wanted > vector.capacity()) vector.reserve(wanted + vector.size() / 2 + 8);
}

/// Gives back what a vector holds; assigning an empty list would keep its memory.
template <typename Vector>
void giveBack(Vector& vector) {
    Vector().swap(vector);
}

}  // namespace zr::engine
