#pragma once

#include <string>

#include "analyst.h"
#include "host/column_tracer.h"
#include "host/project.h"

namespace zr::tool {

// What zrsql writes of a project, appended as UTF-8.

// Its tables and queries, a line each.
void appendList(std::string& out, const host::Database& database, const std::string& file,
                host::StorageForm form);
// Its options.
void appendProject(std::string& out, const host::Database& database);
void appendTable(std::string& out, const CZRTableInfo& table);
void appendQueryText(std::string& out, const CZRQueryInfo& query);

// An analysed query: its result columns with where each comes from, its sources, and how far its text was
// read.
void appendAnalysis(std::string& out, const CZRQueryInfo& query, host::ColumnTracer& tracer,
                    const ReadPlace& read);
// The same as a JSON object.
void appendAnalysisJson(std::string& out, const CZRQueryInfo& query, host::ColumnTracer& tracer,
                        const ReadPlace& read);

}  // namespace zr::tool
