#include "docs/diagrams/railroad.h"

#include <algorithm>
#include <vector>

namespace zr::diagrams {

namespace {

constexpr int kUnit = 8;        // width of a character
constexpr int kGap = 10;        // a piece of line between two pieces
constexpr int kRadius = 10;     // of the bends
constexpr int kHalf = 11;       // half the height of a box
constexpr int kSpace = 8;       // between two tracks
constexpr int kRowWidth = 900;  // a longer sequence goes on in a further row

std::string escaped(const std::string& text) {
    std::string result;
    for (const char c : text) {
        if (c == '&')
            result += "&amp;";
        else if (c == '<')
            result += "&lt;";
        else if (c == '>')
            result += "&gt;";
        else if (c == '"')
            result += "&quot;";
        else
            result += c;
    }
    return result;
}

std::string number(int value) {
    return std::to_string(value);
}

std::string path(int x, int y, const std::string& steps) {
    return "<path d=\"M" + number(x) + " " + number(y) + steps + "\"/>\n";
}
std::string line(int x, int y, int width) {
    return width > 0 ? path(x, y, "h" + number(width)) : std::string();
}
// A quarter of a circle to the point (dx, dy) away; `clockwise` as it is drawn.
std::string bend(int dx, int dy, bool clockwise) {
    return "a" + number(kRadius) + " " + number(kRadius) + " 0 0 " + (clockwise ? "1 " : "0 ") + number(dx) +
           " " + number(dy);
}

// Something the line runs through, at the height of its entry. `up` and `down` are what it needs above and
// below.
struct Piece {
    int width = 0;
    int up = 0;
    int down = 0;
    std::function<std::string(int x, int y)> draw = [](int, int) { return std::string(); };
};

Piece box(const std::string& text, const std::string& kind, const std::string& link) {
    Piece piece;
    // What is no ASCII counts by its bytes: the box is a little wide then.
    piece.width = static_cast<int>(text.size()) * kUnit + 2 * kGap;
    piece.up = piece.down = kHalf;
    piece.draw = [=, width = piece.width](int x, int y) {
        std::string svg = "<g class=\"" + kind + "\"><rect x=\"" + number(x) + "\" y=\"" + number(y - kHalf) +
                          "\" width=\"" + number(width) + "\" height=\"" + number(2 * kHalf) + "\" rx=\"" +
                          (link.empty() ? "11" : "0") + "\"/><text x=\"" + number(x + width / 2) + "\" y=\"" +
                          number(y + 4) + "\">" + escaped(text) + "</text></g>\n";
        return link.empty() ? svg : "<a href=\"#" + link + "\">" + svg + "</a>";
    };
    return piece;
}

Piece sequence(std::vector<Piece> parts) {
    Piece piece;
    for (const Piece& part : parts) {
        piece.width += part.width + (piece.width ? kGap : 0);
        piece.up = std::max(piece.up, part.up);
        piece.down = std::max(piece.down, part.down);
    }
    piece.draw = [parts = std::move(parts)](int x, int y) {
        std::string svg;
        for (std::size_t i = 0; i < parts.size(); ++i) {
            if (i > 0) {
                svg += line(x, y, kGap);
                x += kGap;
            }
            svg += parts[i].draw(x, y);
            x += parts[i].width;
        }
        return svg;
    };
    return piece;
}

// Ways below each other, the first on the line. A way that is shorter is followed by line.
Piece choice(std::vector<Piece> ways) {
    if (ways.size() == 1) return std::move(ways.front());
    Piece piece;
    int widest = 0;
    for (const Piece& way : ways) widest = std::max(widest, way.width);
    piece.width = widest + 4 * kRadius;
    piece.up = ways.front().up;
    std::vector<int> below = {0};  // how far each way is below the first
    piece.down = ways.front().down;
    for (std::size_t i = 1; i < ways.size(); ++i) {
        below.push_back(std::max(piece.down + kSpace + ways[i].up, 2 * kRadius));
        piece.down = below.back() + ways[i].down;
    }
    piece.draw = [ways = std::move(ways), below, widest](int x, int y) {
        std::string svg;
        const int inner = x + 2 * kRadius;
        for (std::size_t i = 0; i < ways.size(); ++i) {
            const int at = y + below[i];
            if (i == 0) {
                svg += line(x, y, 2 * kRadius) + line(inner + widest, y, 2 * kRadius);
            } else {
                const int fall = below[i] - 2 * kRadius;
                svg += path(
                    x, y, bend(kRadius, kRadius, true) + "v" + number(fall) + bend(kRadius, kRadius, false));
                svg += path(
                    inner + widest, at,
                    bend(kRadius, -kRadius, false) + "v" + number(-fall) + bend(kRadius, -kRadius, true));
            }
            svg += ways[i].draw(inner, at) + line(inner + ways[i].width, at, widest - ways[i].width);
        }
        return svg;
    };
    return piece;
}

// A way around above the piece.
Piece optional(Piece inner) {
    Piece piece;
    const int height = std::max(inner.up + kSpace, 2 * kRadius);
    piece.width = inner.width + 4 * kRadius;
    piece.up = height;
    piece.down = inner.down;
    piece.draw = [inner = std::move(inner), height](int x, int y) {
        const int rise = height - 2 * kRadius;
        return line(x, y, 2 * kRadius) + inner.draw(x + 2 * kRadius, y) +
               line(x + 2 * kRadius + inner.width, y, 2 * kRadius) +
               path(x, y,
                    bend(kRadius, -kRadius, false) + "v" + number(-rise) + bend(kRadius, -kRadius, true) +
                        "h" + number(inner.width) + bend(kRadius, kRadius, true) + "v" + number(rise) +
                        bend(kRadius, kRadius, false));
    };
    return piece;
}

// A way back below the piece.
Piece loop(Piece inner) {
    Piece piece;
    const int height = std::max(inner.down + kSpace, 2 * kRadius);
    piece.width = inner.width + 2 * kRadius;
    piece.up = inner.up;
    piece.down = height;
    piece.draw = [inner = std::move(inner), height](int x, int y) {
        const int rise = height - 2 * kRadius;
        return line(x, y, kRadius) + inner.draw(x + kRadius, y) +
               line(x + kRadius + inner.width, y, kRadius) +
               path(x + kRadius + inner.width, y,
                    bend(kRadius, kRadius, true) + "v" + number(rise) + bend(-kRadius, kRadius, true) + "h" +
                        number(-inner.width) + bend(-kRadius, -kRadius, true) + "v" + number(-rise) +
                        bend(kRadius, -kRadius, true));
    };
    return piece;
}

// Rows below each other, each begun where the one above it ends. Behind the last one the line goes up again.
Piece rows(std::vector<Piece> all) {
    if (all.size() == 1) return std::move(all.front());
    Piece piece;
    std::vector<int> below = {0};
    piece.up = all.front().up;
    piece.down = all.front().down;
    for (std::size_t i = 0; i < all.size(); ++i) {
        piece.width = std::max(piece.width, all[i].width);
        if (i == 0) continue;
        below.push_back(piece.down + 2 * kSpace + 2 * kRadius + all[i].up);
        piece.down = below.back() + all[i].down;
    }
    piece.width += 4 * kRadius;
    piece.draw = [all = std::move(all), below, width = piece.width](int x, int y) {
        std::string svg;
        for (std::size_t i = 0; i < all.size(); ++i) {
            const int at = y + below[i];
            const int start = x + kRadius;
            svg += (i == 0 ? line(x, at, kRadius) : "") + all[i].draw(start, at);
            const int end = start + all[i].width;
            if (i + 1 == all.size()) {
                const int corner = x + width - 2 * kRadius;
                svg += line(end, at, corner - end) +
                       path(corner, at,
                            bend(kRadius, -kRadius, false) + "v" + number(2 * kRadius - below[i]) +
                                bend(kRadius, -kRadius, true));
                break;
            }
            // Down between the rows, back to the left, and down to the next one.
            const int middle = all[i].down + kSpace + kRadius;
            const int rest = below[i + 1] - below[i] - middle - 2 * kRadius;
            svg +=
                path(end, at,
                     bend(kRadius, kRadius, true) + "v" + number(middle - 2 * kRadius) +
                         bend(-kRadius, kRadius, true) + "h" + number(-all[i].width) +
                         bend(-kRadius, kRadius, false) + "v" + number(rest) + bend(kRadius, kRadius, false));
        }
        return svg;
    };
    return piece;
}

class Drawer {
 public:
    Drawer(const gc::Vocabulary& vocabulary, const Spelling& spelling)
        : vocabulary_(vocabulary), spelling_(spelling) {}

    Piece alternatives(const std::vector<gc::Alternative>& all, bool mayWrap) const {
        std::vector<Piece> ways;
        for (const gc::Alternative& alternative : all) {
            std::vector<Piece> row;
            std::vector<Piece> finished;
            int width = 0;
            for (const gc::Element& element : alternative.elements) {
                Piece piece = repeated(element);
                if (mayWrap && width > 0 && width + piece.width > kRowWidth) {
                    finished.push_back(sequence(std::move(row)));
                    row.clear();
                    width = 0;
                }
                width += piece.width + kGap;
                row.push_back(std::move(piece));
            }
            finished.push_back(sequence(std::move(row)));
            ways.push_back(rows(std::move(finished)));
        }
        return choice(std::move(ways));
    }

 private:
    Piece repeated(const gc::Element& element) const {
        Piece piece = once(element);
        const gc::Repeat repeat = element.repeat;
        if (repeat == gc::Repeat::Star || repeat == gc::Repeat::Plus) piece = loop(std::move(piece));
        if (repeat == gc::Repeat::Star || repeat == gc::Repeat::Optional) piece = optional(std::move(piece));
        return piece;
    }

    Piece once(const gc::Element& element) const {
        if (element.kind == gc::Element::Kind::Group) return alternatives(element.alternatives, false);
        const char* mark = element.mark == gc::Mark::Drop   ? " dropped"
                           : element.mark == gc::Mark::Root ? " root"
                                                            : "";
        if (element.kind == gc::Element::Kind::Rule)
            return box(element.rule, std::string("rule") + mark, element.rule);
        return box(textOf(element), std::string("token") + mark, "");
    }

    std::string textOf(const gc::Element& element) const {
        if (element.single) return nameOf(*element.tokens.begin());
        std::string others;
        for (const gc::Vocabulary::Entry& entry : vocabulary_.entries)
            if (!element.tokens.contains(entry.number))
                others += (others.empty() ? "" : ", ") + spelling_(entry.number);
        return others.empty() ? "any token" : "any but " + others;
    }

    std::string nameOf(int token) const { return token == gc::kEof ? "end of text" : spelling_(token); }

    const gc::Vocabulary& vocabulary_;
    const Spelling& spelling_;
};

constexpr const char* kStyle =
    "<style>path{fill:none;stroke:#456;stroke-width:1.5}rect{stroke:#456;stroke-width:1.2;fill:#fff}"
    ".token rect{fill:#eef6e8}.rule rect{fill:#e8eef8}.dropped rect{stroke-dasharray:4 3}"
    ".root rect{stroke-width:3}text{font:13px monospace;text-anchor:middle}"
    ".name{font-weight:bold;text-anchor:start}.note{text-anchor:start;fill:#666}</style>\n";

}  // namespace

std::string drawRules(const gc::ParserGrammar& grammar, const gc::Vocabulary& vocabulary,
                      const Spelling& spelling) {
    const Drawer drawer(vocabulary, spelling);
    constexpr int kLeft = 20;
    int width = 700;
    int y = 30;
    std::string body = "<text class=\"name\" x=\"20\" y=\"" + number(y) + "\">" + escaped(grammar.name) +
                       "</text><text class=\"note\" x=\"20\" y=\"" + number(y + 20) +
                       "\">round: a token; square: a rule, and a link to it; dashed: leaves no node; thick: "
                       "becomes the root</text>\n";
    y += 50;
    for (const gc::Rule& rule : grammar.rules) {
        const Piece piece = drawer.alternatives(rule.alternatives, true);
        body += "<g id=\"" + escaped(rule.name) + "\"><text class=\"name\" x=\"20\" y=\"" + number(y) +
                "\">" + escaped(rule.name) + "</text>";
        const int root = rule.alternatives.front().root;
        if (root >= 0)
            body += "<text class=\"note\" x=\"" +
                    number(kLeft + kUnit * (static_cast<int>(rule.name.size()) + 2)) + "\" y=\"" + number(y) +
                    "\">a node " + escaped(spelling(root)) + "</text>";
        const int at = y + 16 + piece.up;
        body +=
            line(kLeft, at, kGap) + piece.draw(kLeft + kGap, at) + line(kLeft + kGap + piece.width, at, kGap);
        body += "</g>\n";
        y = at + piece.down + 40;
        width = std::max(width, piece.width + 4 * kLeft);
    }
    return "<svg xmlns=\"http://www.w3.org/2000/svg\" width=\"" + number(width) + "\" height=\"" + number(y) +
           "\">\n" + kStyle +
           "<rect x=\"0\" y=\"0\" width=\"100%\" height=\"100%\" style=\"stroke:none\"/>\n" + body +
           "</svg>\n";
}

}  // namespace zr::diagrams
