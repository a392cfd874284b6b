#pragma once

#include <memory>
#include <string>
#include <vector>

#include "host/database.h"

namespace zr::tool {

// What a table is made of, as a person writes it; all of it UTF-8. Each throws WrongUse (project_options.h)
// for words that can't be meant.

// NAME or NAME:TYPE. A type such as "decimal(10,2)" gives length and scale.
std::unique_ptr<host::Field> readColumn(const std::string& word);

// "a,b": the columns of a key of the table.
std::unique_ptr<host::Index> readIndex(const std::string& word, host::Table& table);

// "a,b=table(c,d)", or "a,b=table" for the same columns there.
std::unique_ptr<host::ForeignKey> readForeignKey(const std::string& word, host::Table& table);

}  // namespace zr::tool
