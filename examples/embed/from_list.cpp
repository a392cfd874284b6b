// Reads a FROM list by itself, over several lines, with the recogniser that is made for it.
#include <zrparsersql/input_stream.h>
#include <zrparsersql/recognizers/MSSQLfrom.h>

#include <cstdio>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace {

std::string textOf(pANTLR3_BASE_TREE node) {
    pANTLR3_COMMON_TOKEN token = node->getToken(node);
    std::string text;
    // Names in this example are ASCII: one byte stands for one unit.
    if (token && token->start)
        for (auto at = reinterpret_cast<const char16_t*>(token->start);
             at <= reinterpret_cast<const char16_t*>(token->stop); ++at)
            text += static_cast<char>(*at);
    return text;
}

// The names of all tables of the list, in written order.
std::vector<std::string> tablesOf(pANTLR3_BASE_TREE root) {
    std::vector<std::string> names;
    std::vector<std::pair<pANTLR3_BASE_TREE, bool>> open = {{root, false}};
    while (!open.empty()) {
        const auto [node, inTable] = open.back();
        open.pop_back();
        const int type = static_cast<int>(node->getType(node));
        if (inTable && type == MSSQLfrom_ID_) names.push_back(textOf(node));
        // In a condition TABLE_NAME_ stands for the qualifier of a column.
        if (type == MSSQLfrom_SEARCH_CONDITION_) continue;
        for (ANTLR3_UINT32 i = node->getChildCount(node); i > 0; --i)
            open.emplace_back(static_cast<pANTLR3_BASE_TREE>(node->getChild(node, i - 1)),
                              type == MSSQLfrom_TABLE_NAME_);
    }
    return names;
}

}  // namespace

int main() {
    constexpr std::u16string_view text =
        u"orders o INNER JOIN customers c ON o.customer = c.id\r\nLEFT JOIN cities ON c.city = cities.id";
    pANTLR3_INPUT_STREAM input =
        zrNewUtf16InPlaceStream(text.data(), static_cast<std::uint32_t>(text.size()));
    pMSSQLfromLexer lexer = MSSQLfromLexerNew(input);
    pANTLR3_COMMON_TOKEN_STREAM tokens =
        antlr3CommonTokenStreamSourceNew(ANTLR3_SIZE_HINT, lexer->pLexer->rec->state->tokSource);
    pMSSQLfromParser parser = MSSQLfromParserNew(tokens);

    const ZRRuleReturn list = parser->start_rule(parser);
    for (const std::string& name : tablesOf(list.tree)) std::printf("table %s\n", name.c_str());

    parser->free(parser);
    tokens->free(tokens);
    lexer->free(lexer);
    input->close(input);
}
