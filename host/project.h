#pragma once

#include <memory>
#include <optional>
#include <string>
#include <string_view>

#include "host/database.h"

// A project: the model of one source database in a file, as JSON or as an SQLite database. docs/projects.md
// tells the stored form.
namespace zr::host {

enum class StorageForm { Json, Sqlite };

// The form that a file name asks for by its ending: .json, or .db, .sqlite, .sqlite3; nothing for any other.
std::optional<StorageForm> formByName(std::string_view path);

// A project that can't be opened or saved. The message begins with the file's name and tells where in it and
// what is wrong.
class ProjectError : public std::runtime_error {
 public:
    using std::runtime_error::runtime_error;
};

// Opens a project of either form; what the file holds decides, not its name. References between its tables
// are resolved. Raises ProjectError: a project comes whole or not at all.
std::unique_ptr<Database> loadProject(const std::string& path);

// Saves in one step: whatever interrupts it, the file holds the project from before or this one. Raises
// ProjectError.
void saveProject(Database& database, const std::string& path, StorageForm form);

// Writes a project, which has to be a whole one, into another file, every stored name and value as it stands.
// Raises ProjectError.
void convertProject(const std::string& from, const std::string& to, StorageForm form);

// The form of a project's file.
StorageForm formOfFile(const std::string& path);

}  // namespace zr::host
