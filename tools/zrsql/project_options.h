#pragma once

#include <optional>
#include <string>
#include <vector>

#include "dialects.h"
#include "host/project.h"

namespace CLI {
class App;
class Option;
}  // namespace CLI

namespace zr::tool {

// Something on the command line that can't be meant. The program ends with status 2.
class WrongUse : public std::runtime_error {
 public:
    using std::runtime_error::runtime_error;
};

enum class ProjectCommand { New, AddTable, AddQuery, List, Show, Convert, Analyze, Import };

struct ProjectOptions {
    ProjectCommand command = ProjectCommand::List;
    std::string file;
    std::string target;                   // convert
    std::vector<std::string> catalogues;  // import: files to read
    host::StorageForm form{};             // new, convert
    bool force = false;                   // new, convert, import: replace a file that is there
    bool goesOn = false;                  // import: add to a project that is there what it lacks
    bool showsProgress = false;           // import, analyze
    const Dialect* dialect{};             // new, import
    std::string schema;                   // new
    std::string catalog;                  // new: tables to begin with
    std::string name;                     // add-table, add-query, show
    std::vector<std::string> columns;     // add-table: NAME or NAME:TYPE
    std::string key;                      // add-table: columns of the primary key
    std::vector<std::string> uniques;     // add-table: columns of unique indexes
    std::vector<std::string> references;  // add-table: COLUMNS=TABLE(COLUMNS)
    std::optional<std::string> text;      // add-query, UTF-8
    std::string textFile = "-";           // add-query: where the text is read from otherwise
    std::vector<std::string> names;       // analyze: empty for all
    bool asJson = false;                  // analyze
};

// The words of the command line behind "project". They are stored where the object is, which is to stay there
// until the line was parsed.
class ProjectWords {
 public:
    void addTo(CLI::App& app);
    // What the line says, or nothing when "project" does not stand on it. Throws WrongUse.
    std::optional<ProjectOptions> read() const;

 private:
    CLI::App* add(const std::string& name, const std::string& help, ProjectCommand command);
    CLI::Option* addForm(CLI::App& app);

    CLI::App* project_ = nullptr;
    std::vector<std::pair<CLI::App*, ProjectCommand>> commands_;
    ProjectOptions options_;
    std::string dialect_;
    std::string catalogue_;
    std::string form_;
    std::string text_;
    std::string format_;
};

}  // namespace zr::tool
