#pragma once

#include "zrparsersql/sql_tree.h"
#include "zrparsersql/wide_string.h"

// Recognisers drop characters that no token takes: blanks, and in some dialects ';', '$' and all letters
// beyond ASCII. Names and strings are sequences of tokens there, so their text is put together again from
// where the tokens stood in the query. A token that the grammar matched and left out of the tree (a doubled
// quote's first half) took its characters: they stay out.
namespace zr {

// The texts of all children in order, with what stood between them and no token took.
CString joinedText(CZRSQLTree& name);

// The same for a quoted string whose quotes are tokens of their own: with what stood between the quotes and
// the first and the last child as well.
CString quotedText(CZRSQLTree& string);

// The texts of all children in order, with nothing between them.
CString concatenatedText(CZRSQLTree& node);

}  // namespace zr
