#include "lineage_commands.h"

#include <filesystem>

#include "host/file_replacement.h"
#include "lineage_format.h"
#include "project_commands.h"
#include "report_page.h"
#include "traced_project.h"

namespace zr::tool {

namespace {

std::vector<const CZRQueryInfo*> queriesOf(const LineageOptions& options, const host::Database& database) {
    std::vector<const CZRQueryInfo*> queries;
    for (const std::string& name : options.queries) {
        queries.push_back(database.FindQueryBySrcName(CString::fromUtf8(name)));
        if (!queries.back()) throw ProjectFailure(options.file + ": there is no query " + name);
    }
    if (options.queries.empty()) queries.assign(database.Queries.begin(), database.Queries.end());
    return queries;
}

void writeReport(const LineageOptions& options, TracedProject& project, std::string& out) {
    const std::string title = std::filesystem::path(options.file).filename().string();
    if (options.output == "-") return appendReport(out, project, title);
    std::string page;
    appendReport(page, project, title);
    host::replaceFile(options.output, page);
}

}  // namespace

void runLineage(const LineageOptions& options, std::string& out) {
    LongWork work("following " + options.file);
    TracedProject project(options.file, &work);
    if (options.command == LineageCommand::Lineage) {
        const auto queries = queriesOf(options, project.database());
        std::size_t done = 0;
        for (const CZRQueryInfo* query : queries) {
            project.step(done++);
            project.lineage().tracer().columnsOf(*query);  // what it finds is kept
        }
        return appendLineage(out, options.format, project, queries);
    }
    if (options.command == LineageCommand::Report) return writeReport(options, project, out);
    const auto target = project.lineage().find(CString::fromUtf8(options.target));
    if (!target)
        throw ProjectFailure(options.file + ": there is no table, query or column " + options.target);
    appendImpact(out, options.format, project, *target);
}

}  // namespace zr::tool
