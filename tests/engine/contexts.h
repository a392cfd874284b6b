#pragma once

#include <zrparsersql/recognizers/MSSQL.h>
#include <zrparsersql/recognizers/MSSQL_tokens.h>

#include "tests/grammar/contexts.h"

namespace zr::test {

using Contexts = ContextsOf<MSSQLLexerNew, MSSQLParserNew>;

}  // namespace zr::test
