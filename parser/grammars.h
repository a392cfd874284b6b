#pragma once

#include "grammar/engine/tables.h"

// The grammar of each facade, as the grammar compiler left it.
namespace zr::grammars {

extern const engine::GrammarTable MSAccessSQL_v3;
extern const engine::GrammarTable MSSQL;
extern const engine::GrammarTable MySQLSelect;
extern const engine::GrammarTable Oracle;
extern const engine::GrammarTable PostgreSQL;

}  // namespace zr::grammars
