#include "tests/fuzz/pieces.h"

#include <algorithm>

namespace zr::fuzz {

namespace {

using Pieces = std::vector<std::string>;

std::size_t below(Random& random, std::size_t limit) {
    return limit ? random() % limit : 0;
}

/// A run of pieces, mostly a short one.
struct Run {
    std::size_t first, last;
};

Run runOf(const Pieces& pieces, Random& random) {
    const std::size_t first = below(random, pieces.size());
    const std::size_t longest = pieces.size() - first;
    const std::size_t length =
        1 + below(random, below(random, 4) ? std::min<std::size_t>(longest, 6) : longest);
    return {first, std::min(first + length, pieces.size())};
}

Pieces::iterator at(Pieces& pieces, std::size_t index) {
    return pieces.begin() + static_cast<std::ptrdiff_t>(index);
}

Pieces copyOf(Pieces& pieces, Run run) {
    return Pieces(at(pieces, run.first), at(pieces, run.last));
}

/// A piece that is to stand by itself, whatever stands beside it.
std::string apart(const std::string& piece) {
    return " " + piece + " ";
}

const std::string& wordOf(const Language& language, Random& random) {
    return language.words()[below(random, language.words().size())];
}

void insert(Pieces& pieces, std::size_t index, const Pieces& more) {
    pieces.insert(at(pieces, index), more.begin(), more.end());
}

void nest(Language& language, Pieces& pieces, Run run, std::size_t depth) {
    insert(pieces, run.last, Pieces(depth, apart(language.closer())));
    insert(pieces, run.first, Pieces(depth, apart(language.opener())));
}

void edit(Language& language, Pieces& pieces, Random& random) {
    const std::size_t place = below(random, pieces.size() + 1);
    if (pieces.empty()) return insert(pieces, 0, {apart(language.phrase(random))});
    const Run run = runOf(pieces, random);
    switch (below(random, 9)) {
        case 0:
            pieces.erase(at(pieces, run.first), at(pieces, run.last));
            break;
        case 1:
            insert(pieces, place, copyOf(pieces, run));
            break;
        case 2:
            std::swap(pieces[run.first], pieces[below(random, pieces.size())]);
            break;
        case 3:
            nest(language, pieces, run, below(random, 4) ? 1 : 1 + below(random, 40));
            break;
        case 4: {
            const Pieces part = copyOf(pieces, run);
            const std::size_t times = 1 + below(random, below(random, 4) ? 3 : 30);
            for (std::size_t i = 0; i < times; ++i) insert(pieces, run.last, part);
            break;
        }
        case 5:
            pieces[run.first] = apart(wordOf(language, random));
            break;
        case 6:
            insert(pieces, place, {apart(wordOf(language, random))});
            break;
        case 7: {
            const Pieces part = copyOf(pieces, run);
            pieces.erase(at(pieces, run.first), at(pieces, run.last));
            insert(pieces, below(random, pieces.size() + 1), part);
            break;
        }
        default:
            insert(pieces, place, {apart(language.phrase(random))});
    }
}

std::string joined(const Pieces& pieces, std::size_t maxSize) {
    std::string out;
    for (const std::string& piece : pieces) {
        if (out.size() + piece.size() > maxSize) break;
        out += piece;
    }
    return out;
}

}  // namespace

std::string mutated(Language& language, std::string_view input, std::size_t maxSize, std::uint32_t seed) {
    Random random(seed);
    Pieces pieces = language.cut(input);
    for (std::size_t times = 1 + below(random, 4); times > 0; --times) edit(language, pieces, random);
    return joined(pieces, maxSize);
}

std::string crossed(Language& language, std::string_view first, std::string_view second, std::size_t maxSize,
                    std::uint32_t seed) {
    Random random(seed);
    Pieces one = language.cut(first), other = language.cut(second);
    const std::size_t place = below(random, one.size() + 1);
    if (below(random, 2) || other.empty()) {
        one.resize(place);
        const std::size_t from = below(random, other.size() + 1);
        insert(one, place, Pieces(at(other, from), other.end()));
    } else {
        insert(one, place, copyOf(other, runOf(other, random)));
    }
    return joined(one, maxSize);
}

}  // namespace zr::fuzz
