#pragma once

#include <string>

#include "host/stored_tree.h"

// Sections as one SQLite file. The table "section" has a row a section: its number (from 1 on, in the order
// of the tree, a section before those inside of it), the number of the section around it (null for the root),
// its name, and its values as a JSON object (json_form.h). The file's application_id says that it is a
// project.
namespace zr::host {

// True for a file that begins as every SQLite database does.
bool isSqliteFile(const std::string& path);

// Raises StorageError for a file that is no project of this form, or no whole one; FileError
// (file_replacement.h) for a file that can't be opened. Places are numbers of rows.
StoredTree readSqlite(const std::string& path);

// Replaces all that the file holds, or makes it, in one transaction: whatever interrupts it, the next reader
// finds the old content or the new one, whole. A file that is no database is replaced as replaceFile does.
// Raises FileError when it can't be done, and for a database that is there and is no project: that one stays
// as it is.
void writeSqlite(const std::string& path, const StoredSection& root);

}  // namespace zr::host
