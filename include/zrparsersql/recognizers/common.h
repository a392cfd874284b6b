#ifndef ZRPARSERSQL_RECOGNIZERS_COMMON_H
#define ZRPARSERSQL_RECOGNIZERS_COMMON_H

/* What the context headers of all grammars share. The contexts are the parsing runtime's (ANTLR 3 C) and are
   used through it: a lexer context feeds a token stream, a parser context reads from it. Wrong text is no
   failure: the runtime's error counts grow, and the tree has error nodes or is one. What was made of one text
   belongs to one thread at a time. */

#include <antlr3.h>
#include <zrparsersql/export.h>

/* What every parser entry returns: first and last token that were taken (null when none was) and the tree,
   which belongs to the context's adaptor and lives as long as it. A tree without a single root is a nil node.
 */
typedef struct ZRRuleReturn {
    pANTLR3_COMMON_TOKEN start;
    pANTLR3_COMMON_TOKEN stop;
    pANTLR3_BASE_TREE tree;
} ZRRuleReturn;

#endif
