#include "model/source_index.h"

#include "model/named_search.h"

namespace zr {
namespace {

// Compares the buffers without looking into them, which is what makes the walk over a large model cheap.
bool isSameBuffer(const CString& left, const CString& right) {
    if (left.IsEmpty() || right.IsEmpty()) return left.IsEmpty() == right.IsEmpty();
    return left.GetString() == right.GetString();
}

std::size_t sourceCount(const CZRDatabaseInfo& database) {
    return static_cast<std::size_t>(database.Tables.GetCount()) +
           static_cast<std::size_t>(database.Queries.GetCount());
}

}  // namespace

std::shared_ptr<const SourceIndex> SourceIndex::of(CZRDatabaseInfo& database) {
    // Analyses on several threads may look into one database.
    const CriticalSectionGuard guard(database.sourceIndexLock_);
    if (!database.sourceIndex_ || !database.sourceIndex_->isCurrent(database))
        database.sourceIndex_ = std::make_shared<const SourceIndex>(database);
    return database.sourceIndex_;
}

SourceIndex::SourceIndex(const CZRDatabaseInfo& database) {
    seen_.reserve(sourceCount(database));
    for (CZRTableInfo* table : database.Tables) add(table, nullptr);
    for (CZRQueryInfo* query : database.Queries) add(query, query);
}

void SourceIndex::add(CZRSourceInfo* source, CZRQueryInfo* query) {
    if (!source) {
        seen_.push_back({});
        return;
    }
    seen_.push_back({source, source->SrcName, source->ID});
    byName_.try_emplace(foldedKey(source->GetSrcName()), Source{source, query});
    byId_.try_emplace(foldedKey(source->GetID()), Source{source, query});
}

Source SourceIndex::find(const Sources& sources, const CString& text) {
    const auto found = sources.find(foldedKey(text));
    return found == sources.end() ? Source() : found->second;
}

bool SourceIndex::isCurrent(const CZRDatabaseInfo& database) const {
    if (seen_.size() != sourceCount(database)) return false;
    auto seen = seen_.begin();
    const auto isUnchanged = [&seen](const CZRSourceInfo* source) {
        const Seen& before = *seen++;
        return source == before.object && (!source || (isSameBuffer(source->SrcName, before.srcName) &&
                                                       isSameBuffer(source->ID, before.id)));
    };
    for (const CZRTableInfo* table : database.Tables)
        if (!isUnchanged(table)) return false;
    for (const CZRQueryInfo* query : database.Queries)
        if (!isUnchanged(query)) return false;
    return true;
}

}  // namespace zr
