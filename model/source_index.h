#pragma once

#include <memory>
#include <unordered_map>
#include <vector>

#include "zrparsersql/database_info.h"

namespace zr {

// A source as a database knows it: null, a table, or a query, which then stands in both members.
struct Source {
    CZRSourceInfo* source = nullptr;
    CZRQueryInfo* query = nullptr;

    explicit operator bool() const { return source != nullptr; }
};

// The sources of a database by name and by ID, as they stood when the index was made. A table goes before a
// query, and the first in list order before the others.
//
// Lists and names are open to everyone, so nobody tells the index of a change. Instead it keeps what it was
// made from; finding it still current costs a walk over the lists that compares pointers. One operation asks
// once.
class SourceIndex {
 public:
    // The index of a database, made anew if it is no longer current. It stays as it is for as long as it is
    // held.
    static std::shared_ptr<const SourceIndex> of(CZRDatabaseInfo& database);

    explicit SourceIndex(const CZRDatabaseInfo& database);

    Source byName(const CString& srcName) const { return find(byName_, srcName); }
    Source byId(const CString& id) const { return find(byId_, id); }

 private:
    // Holding on to the texts keeps their buffers: a text whose buffer is the same is the same.
    struct Seen {
        const CZRSourceInfo* object;
        CString srcName;
        CString id;
    };
    using Sources = std::unordered_map<CString, Source>;

    static Source find(const Sources& sources, const CString& text);
    bool isCurrent(const CZRDatabaseInfo& database) const;
    void add(CZRSourceInfo* source, CZRQueryInfo* query);

    std::vector<Seen> seen_;
    Sources byName_;
    Sources byId_;
};

}  // namespace zr
