#include "lineage_options.h"

#include <CLI/CLI.hpp>

#include "progress_option.h"

namespace zr::tool {

CLI::App* LineageWords::add(CLI::App& app, const std::string& name, const std::string& help,
                            const std::vector<std::string>& formats) {
    CLI::App* added = app.add_subcommand(name, help);
    added->add_option("PROJECT", options_.file, "The project, a JSON or SQLite file")->required();
    if (!formats.empty())
        added->add_option("--format", format_, "Form of the output: " + CLI::detail::join(formats, ", "))
            ->check(CLI::IsMember(formats))
            ->type_name("FORMAT");
    addProgressTo(*added, options_.showsProgress);
    commands_.push_back(added);
    return added;
}

void LineageWords::addTo(CLI::App& app) {
    CLI::App* lineage =
        add(app, "lineage", "Follow every result column of a project's queries to its sources",
            {"pretty", "json", "dot", "csv"});
    lineage->add_option("--query", options_.queries, "Show this query only; may stand many times")
        ->type_name("NAME")
        ->allow_extra_args(false);
    lineage->footer(
        "Example:\n  zrsql lineage shop.json --query large\n\n"
        "Columns are followed through queries on queries, aliases, expressions, stars, nested queries and\n"
        "union branches. What can't be told is marked as unknown, and why. Queries that read from each "
        "other\n"
        "in a ring are told.");

    CLI::App* impact = add(app, "impact", "Show all that depends on a table, a query or a column of one",
                           {"pretty", "json"});
    impact->add_option("TARGET", options_.target, "TABLE, QUERY, TABLE.COLUMN or QUERY.COLUMN")->required();
    impact->footer(
        "Example:\n  zrsql impact shop.json orders.total\n\n"
        "Told are result columns that are made of it, columns that are read in other clauses, queries that\n"
        "read from a query told, keys, and queries that may depend on it because not all of them is known.");

    CLI::App* report =
        add(app, "report", "Write a page about a project for a browser: one HTML file, no network", {});
    report->add_option("-o,--output", options_.output, "The file to write; - is standard output")
        ->type_name("FILE");
    report->footer("Example:\n  zrsql report shop.json -o report.html\n\nA file that is there is replaced.");
}

std::optional<LineageOptions> LineageWords::read() const {
    LineageOptions options = options_;
    bool isUsed = false;
    for (std::size_t at = 0; at < commands_.size(); ++at) {
        if (!commands_[at]->parsed()) continue;
        isUsed = true;
        options.command = static_cast<LineageCommand>(at);
    }
    if (!isUsed) return std::nullopt;
    if (format_ == "json") options.format = LineageFormat::Json;
    if (format_ == "dot") options.format = LineageFormat::Dot;
    if (format_ == "csv") options.format = LineageFormat::Csv;
    return options;
}

}  // namespace zr::tool
