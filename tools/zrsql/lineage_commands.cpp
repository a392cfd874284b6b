#include "lineage_commands.h"

#include <filesystem>

#include "host/file_replacement.h"
#include "lineage_format.h"
#include "long_work.h"
#include "project_commands.h"
#include "query_summary.h"
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

Told runLineage(const LineageOptions& options) {
    LongWork work("following " + options.file, options.showsProgress);
    TracedProject project(options.file, &work);
    host::Lineage& lineage = project.lineage();
    const auto queries = queriesOf(options, project.database());
    QuerySummary summary;
    std::size_t done = 0;
    for (const CZRQueryInfo* query : queries) {
        work.step("followed", done++, queries.size());
        const auto& columns = lineage.tracer().columnsOf(*query);  // what it finds is kept
        summary.add(
            {lineage.isInRing(*query), lineage.tracer().missingOf(*query), hasUnknownSource(columns)});
    }
    Told told;
    if (options.command == LineageCommand::Lineage) appendLineage(told.out, options.format, project, queries);
    if (options.command == LineageCommand::Report) writeReport(options, project, told.out);
    if (options.command == LineageCommand::Impact) {
        const auto target = lineage.find(CString::fromUtf8(options.target));
        if (!target)
            throw ProjectFailure(options.file + ": there is no table, query or column " + options.target);
        appendImpact(told.out, options.format, project, *target);
    }
    told.summary = summary.summary(work.elapsed());
    return told;
}

}  // namespace zr::tool
