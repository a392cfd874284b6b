#include "traced_project.h"

#include "project_commands.h"

namespace zr::tool {

TracedProject::TracedProject(const std::string& file, LongWork* work)
    : work_(work),
      database_(host::loadProject(file)),
      dialect_(dialectOf(*database_, file)),
      lineage_(std::make_unique<host::Lineage>(
          *database_, [this](const CZRQueryInfo& query) { return !readPlaceOf(query).stop; },
          [this](std::size_t done, std::size_t all) {
              if (work_) work_->step("analysed", done, all);
          })) {}

const ReadPlace& TracedProject::readPlaceOf(const CZRQueryInfo& query) {
    const auto [place, isNew] = read_.try_emplace(&query);
    if (isNew) place->second = readPlace(dialect_, query.m_sql);
    return place->second;
}

}  // namespace zr::tool
