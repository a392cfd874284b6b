/* Uses a recogniser from C: the tree of a query, with the runtime's own types. A tree may be as deep as its
   text is long, so the walk keeps what is open in a list of its own instead of calling itself. */
#include <stdio.h>
#include <stdlib.h>
#include <zrparsersql/input_stream.h>
#include <zrparsersql/recognizers/MSSQL.h>

typedef struct Visit {
    pANTLR3_BASE_TREE node;
    int depth;
} Visit;

/* Returns 0 when memory is short. */
static int print(pANTLR3_BASE_TREE root) {
    size_t count = 1, room = 64;
    Visit* open = malloc(room * sizeof *open);
    if (!open) return 0;
    open[0].node = root;
    open[0].depth = 0;
    while (count > 0) {
        const Visit at = open[--count];
        ANTLR3_UINT32 i = at.node->getChildCount(at.node);
        printf("%*s%s\n", 2 * at.depth, "", MSSQL_token_name((int)at.node->getType(at.node)));
        if (count + i > room) {
            Visit* larger = realloc(open, 2 * (count + i) * sizeof *open);
            if (!larger) {
                free(open);
                return 0;
            }
            room = 2 * (count + i);
            open = larger;
        }
        for (; i > 0; --i, ++count) {
            open[count].node = (pANTLR3_BASE_TREE)at.node->getChild(at.node, i - 1);
            open[count].depth = at.depth + 1;
        }
    }
    free(open);
    return 1;
}

int main(void) {
    static const char16_t text[] = u"SELECT id FROM orders WHERE id = 1";
    pANTLR3_INPUT_STREAM input = zrNewUtf16InPlaceStream(text, (uint32_t)(sizeof text / sizeof *text - 1));
    pMSSQLLexer lexer = MSSQLLexerNew(input);
    pANTLR3_COMMON_TOKEN_STREAM tokens =
        antlr3CommonTokenStreamSourceNew(ANTLR3_SIZE_HINT, lexer->pLexer->rec->state->tokSource);
    pMSSQLParser parser = MSSQLParserNew(tokens);

    int printed = print(parser->start_rule(parser).tree);

    parser->free(parser);
    tokens->free(tokens);
    lexer->free(lexer);
    input->close(input);
    return printed ? 0 : 1;
}
