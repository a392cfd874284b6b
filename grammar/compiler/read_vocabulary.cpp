#include <algorithm>

#include "grammar/compiler/error.h"
#include "grammar/compiler/readers.h"
#include "grammar/compiler/source.h"

namespace zr::gc {

std::u16string unquote(const std::string& quoted, const std::string& file, int line) {
    std::u16string text;
    for (std::size_t i = 1; i + 1 < quoted.size(); ++i) {
        if (quoted[i] != '\\') {
            text.push_back(static_cast<unsigned char>(quoted[i]));
            continue;
        }
        switch (const char c = quoted[++i]) {
            case 'n':
                text.push_back(u'\n');
                break;
            case 'r':
                text.push_back(u'\r');
                break;
            case 't':
                text.push_back(u'\t');
                break;
            case 'u': {
                const std::string hex = quoted.substr(i + 1, 4);
                if (hex.size() != 4 || hex.find_first_not_of("0123456789abcdefABCDEF") != std::string::npos)
                    throw GrammarError(file, line, "\\u needs four hexadecimal digits");
                text.push_back(static_cast<char16_t>(std::stoi(hex, nullptr, 16)));
                i += 4;
                break;
            }
            default:
                text.push_back(static_cast<unsigned char>(c));
        }
    }
    return text;
}

Vocabulary readVocabulary(const std::string& path) {
    Vocabulary vocabulary;
    vocabulary.file = path;
    Cursor in(path, scan(path, readFile(path)));
    std::map<int, std::string> names;
    while (in.peek().kind != Item::Kind::End) {
        const Item name = in.next();
        if (name.kind != Item::Kind::Name && name.kind != Item::Kind::Single)
            in.failAt(name.line, "expected a token name before '" + name.text + "'");
        in.expect("=");
        if (in.peek().kind != Item::Kind::Number)
            in.fail("expected a token number after '" + name.text + "='");
        const int number = in.expectNumber(name.text + "=");
        if (number < kFirstToken) in.failAt(name.line, "token numbers start at 4");
        if (!names.emplace(number, name.text).second)
            in.failAt(name.line, "token number " + std::to_string(number) + " is taken by " + names[number]);
        if (!vocabulary.numberOf.emplace(name.text, number).second)
            in.failAt(name.line, "token " + name.text + " stands twice");
        vocabulary.entries.push_back({name.text, number, name.line});
        vocabulary.maxNumber = std::max(vocabulary.maxNumber, number);
    }
    std::sort(vocabulary.entries.begin(), vocabulary.entries.end(),
              [](const auto& a, const auto& b) { return a.number < b.number; });
    return vocabulary;
}

}  // namespace zr::gc
