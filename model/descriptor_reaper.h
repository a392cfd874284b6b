#pragma once

#include "zrparsersql/containers.h"

class CFieldObject;
class CZRAliasInfo;
class CZRQueryInfo;
class SelectItem;
struct CZRQueryUnionInfo;

namespace zr {

class RetiredObjects;

// Deletes select items and query descriptors with everything below them, children ahead of what holds them,
// so that no destructor finds anything left to descend into: trees of any depth go without machine stack.
// They go without memory as well, since destructors run where there is none left: the way back up a tree is
// kept in the lists that are about to go, and queries that wait for their end are linked with each other.
class DescriptorReaper {
 public:
    DescriptorReaper() = default;
    DescriptorReaper(const DescriptorReaper&) = delete;
    DescriptorReaper& operator=(const DescriptorReaper&) = delete;
    // Nothing that it does takes memory, which is all that could throw.
    ~DescriptorReaper() { drain(); }  // NOLINT(bugprone-exception-escape)

    // Take over objects. Items go at once, queries wait for drain. Null entries are allowed; lists are
    // emptied.
    void take(CList<SelectItem*>& items);
    void take(SelectItem* item);
    void take(CList<CZRQueryInfo*>& queries);
    void take(CZRQueryInfo* query);
    void take(CZRAliasInfo* alias);
    void take(CFieldObject* field);
    void take(CZRQueryUnionInfo* record);

    // Takes what a descriptor holds, but not the descriptor.
    void takeContents(CZRQueryInfo& query);

    // Deletes the queries, those first that were taken last.
    void drain();

 private:
    CZRQueryInfo* waiting_ = nullptr;
};

}  // namespace zr
