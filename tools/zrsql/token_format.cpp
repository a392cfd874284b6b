#include "token_format.h"

#include "json_text.h"

namespace zr::tool {

void appendTokenLines(std::string& out, const Grammar& grammar, std::u16string_view text) {
    Recogniser recogniser(grammar, text);
    for (const pANTLR3_COMMON_TOKEN token : recogniser.tokens()) {
        appendNumber(out, tokenNumber(token->type));
        out += '\t';
        out += grammar.tokenName(tokenNumber(token->type));
        out += '\t';
        appendJsonString(out, runtimeText(token->getText(token)));
        out += '\n';
    }
}

void appendTokenJson(std::string& out, const Grammar& grammar, std::u16string_view text) {
    Recogniser recogniser(grammar, text);
    char before = '[';
    for (const pANTLR3_COMMON_TOKEN token : recogniser.tokens()) {
        out += before;
        before = ',';
        out += '[';
        appendNumber(out, tokenNumber(token->type));
        out += ',';
        appendJsonString(out, std::string_view(grammar.tokenName(tokenNumber(token->type))));
        out += ',';
        appendJsonString(out, runtimeText(token->getText(token)));
        out += ']';
    }
    if (before == '[') out += '[';
    out += ']';
}

}  // namespace zr::tool
