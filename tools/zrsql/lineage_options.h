#pragma once

#include <optional>
#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace zr::tool {

enum class LineageCommand { Lineage, Impact, Report };
enum class LineageFormat { Pretty, Json, Dot, Csv };

struct LineageOptions {
    LineageCommand command = LineageCommand::Lineage;
    std::string file;
    LineageFormat format = LineageFormat::Pretty;
    std::vector<std::string> queries;  // lineage: empty for all
    std::string target;                // impact
    std::string output = "-";          // report: - is standard output
    bool showsProgress = false;
};

// The words of the command line behind "lineage", "impact" and "report". They are stored where the object is,
// which is to stay there until the line was parsed.
class LineageWords {
 public:
    void addTo(CLI::App& app);
    // What the line says, or nothing when none of the commands stands on it.
    std::optional<LineageOptions> read() const;

 private:
    CLI::App* add(CLI::App& app, const std::string& name, const std::string& help,
                  const std::vector<std::string>& formats);

    std::vector<CLI::App*> commands_;  // in the order of LineageCommand
    LineageOptions options_;
    std::string format_;
};

}  // namespace zr::tool
