#pragma once

#include <memory>
#include <string>
#include <unordered_map>

#include "analyst.h"
#include "host/lineage.h"
#include "long_work.h"

namespace zr::tool {

// A project that was opened, analysed and followed column by column.
class TracedProject {
 public:
    // Raises ProjectFailure (project_commands.h) or an error of the host's project (host/project.h).
    explicit TracedProject(const std::string& file, LongWork* work = nullptr);

    host::Database& database() { return *database_; }
    const Dialect& dialect() const { return dialect_; }
    host::Lineage& lineage() { return *lineage_; }
    // Before each query of the project that is told about; raises Interrupted (long_work.h).
    void step(std::size_t done) {
        if (work_) work_->step("written", done, static_cast<std::size_t>(database_->Queries.GetCount()));
    }
    // How far the text of a query of the project was read.
    const ReadPlace& readPlaceOf(const CZRQueryInfo& query);

 private:
    LongWork* const work_;
    std::unique_ptr<host::Database> database_;
    const Dialect& dialect_;
    std::unordered_map<const CZRQueryInfo*, ReadPlace> read_;
    std::unique_ptr<host::Lineage> lineage_;
};

}  // namespace zr::tool
