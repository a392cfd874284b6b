#include "parser/token_text.h"

namespace zr {

namespace {

// All strings come from factories over the UTF-16 input, whatever their encoding member says.
CString fromRuntime(const ANTLR3_STRING* text) {
    return text && text->chars ? CString(reinterpret_cast<const char16_t*>(text->chars), text->len)
                               : CString();
}

}  // namespace

std::u16string_view tokenUnits(const ANTLR3_COMMON_TOKEN& token) {
    // A token's stop is its last unit; that of an empty token stands ahead of its start.
    if (token.start == 0 || token.stop < token.start || !token.input) return {};
    const auto* first = reinterpret_cast<const char16_t*>(token.start);
    const auto* last = reinterpret_cast<const char16_t*>(token.stop);
    return {first, static_cast<std::size_t>(last - first) + 1};
}

CString tokenText(ANTLR3_COMMON_TOKEN& token) {
    switch (token.textState) {
        case ANTLR3_TEXT_STRING:
            return fromRuntime(token.tokText.text);
        case ANTLR3_TEXT_CHARP:
            return CString(reinterpret_cast<const char*>(token.tokText.chars));
        default:
            if (token.input && token.type != ANTLR3_TOKEN_EOF) return CString(tokenUnits(token));
            return fromRuntime(token.getText(&token));
    }
}

CString nodeText(ANTLR3_BASE_TREE& node) {
    if (node.isNilNode(&node)) return CString(u"nil");
    pANTLR3_COMMON_TOKEN token = node.getToken(&node);
    return token ? tokenText(*token) : fromRuntime(node.getText(&node));
}

}  // namespace zr
