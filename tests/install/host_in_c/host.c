/* Reads a FROM list with the recognisers alone, in C11, and writes the token number of each node of the tree. */
#include <stdio.h>
#include <zrparsersql/diagnostics.h>
#include <zrparsersql/input_stream.h>
#include <zrparsersql/recognizers/MSSQLfrom.h>

static void show(pANTLR3_BASE_TREE node, int depth) {
    ANTLR3_UINT32 i;
    printf("%*s%u\n", 2 * depth, "", (unsigned)node->getType(node));
    for (i = 0; i < node->getChildCount(node); ++i) show((pANTLR3_BASE_TREE)node->getChild(node, i), depth + 1);
}

static void count(void* user, const char16_t* text, uint32_t length) {
    (void)text;
    (void)length;
    ++*(int*)user;
}

int main(void) {
    int reports = 0;
    static const char16_t text[] = u"a JOIN b ON x = 1";
    pANTLR3_INPUT_STREAM input = zrNewUtf16InPlaceStream(text, (uint32_t)(sizeof text / sizeof *text - 1));
    pMSSQLfromLexer lexer = MSSQLfromLexerNew(input);
    pANTLR3_COMMON_TOKEN_STREAM tokens =
        antlr3CommonTokenStreamSourceNew(ANTLR3_SIZE_HINT, lexer->pLexer->rec->state->tokSource);
    pMSSQLfromParser parser = MSSQLfromParserNew(tokens);
    ZRRuleReturn list;

    zrSetDiagnosticFunction(count, &reports);
    list = parser->start_rule(parser);
    zrSetDiagnosticFunction(NULL, NULL);
    if (list.tree->getType(list.tree) != MSSQLfrom_FROM_DEF_) return 1;
    show(list.tree, 0);
    printf("%d blanks reported\n", reports);

    parser->free(parser);
    tokens->free(tokens);
    lexer->free(lexer);
    input->close(input);
    return 0;
}
