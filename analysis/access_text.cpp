#include <optional>
#include <regex>
#include <string>
#include <string_view>

#include "zrparsersql/query_text.h"

namespace {

// \w of a wide expression. The expressions themselves, of which one would do, need machine stack for each
// unit of a match: a name of thirty thousand letters would end the process.
class WordUnits {
 public:
    bool contains(char16_t unit) const { return traits_.isctype(static_cast<wchar_t>(unit), word_); }
    // Where the run of such units from a place on ends.
    std::size_t runEnd(std::u16string_view text, std::size_t at) const {
        while (at < text.size() && contains(text[at])) ++at;
        return at;
    }

 private:
    static constexpr std::wstring_view kName = L"w";

    std::regex_traits<wchar_t> traits_;  // of the global locale
    std::regex_traits<wchar_t>::char_class_type word_ = traits_.lookup_classname(kName.begin(), kName.end());
};

// [word.word]
struct BracketedName {
    std::size_t begin;
    std::size_t stop;
    std::size_t end;
};

std::optional<BracketedName> nameAt(std::u16string_view text, std::size_t bracket, const WordUnits& words) {
    const std::size_t stop = words.runEnd(text, bracket + 1);
    if (stop == bracket + 1 || stop == text.size() || text[stop] != u'.') return std::nullopt;
    const std::size_t last = words.runEnd(text, stop + 1);
    if (last == stop + 1 || last == text.size() || text[last] != u']') return std::nullopt;
    return BracketedName{bracket, stop, last + 1};
}

CString decimal(std::size_t number) {
    return CString(std::to_string(number).c_str());
}

}  // namespace

CString PrepareAccessQueryText(const CString& text, const std::function<void(const CString& line)>& trace) {
    const std::u16string_view source = text.View();
    CString result;
    std::size_t done = 0;
    std::optional<WordUnits> words;
    for (std::size_t at = source.find(u'['); at != std::u16string_view::npos;
         at = source.find(u'[', at + 1)) {
        if (!words) words.emplace();
        const std::optional<BracketedName> name = nameAt(source, at, *words);
        if (!name) continue;
        if (trace) {
            trace(CString(source.substr(name->begin, name->end - name->begin)));
            trace(decimal(name->begin));
            trace(decimal(name->begin + 1));
        }
        result += source.substr(done, name->stop - done);
        result += u"].[";
        done = name->stop + 1;
    }
    result += source.substr(done);
    if (trace) trace(u"Output = " + result);
    return result;
}
