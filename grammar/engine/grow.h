#pragma once

namespace zr::engine {

/// Makes room for one more. What a text needs is mostly guessed well, so half as much again is enough, where
/// a vector would take twice as much.
template <typename Vector>
void growSlowly(Vector& vector) {
    if (vector.size() == vector.capacity()) vector.reserve(vector.size() + vector.size() / 2 + 8);
}

}  // namespace zr::engine
