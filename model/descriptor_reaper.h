#pragma once

#include <vector>

#include "zrparsersql/containers.h"

class CFieldObject;
class CZRAliasInfo;
class CZRQueryInfo;
class SelectItem;
struct CZRQueryUnionInfo;

namespace zr {

class RetiredObjects;

// Deletes select items and query descriptors with everything below them. Before an object is deleted its
// children are taken out of it, so that no destructor finds anything left to descend into: trees of any depth
// go without machine stack.
class DescriptorReaper {
 public:
    ~DescriptorReaper() { drain(); }

    // Take over objects, to be deleted by drain. Null entries are allowed; lists are emptied.
    void take(CList<SelectItem*>& items);
    void take(SelectItem* item) {
        if (item) items_.push_back(item);
    }
    void take(CList<CZRQueryInfo*>& queries);
    void take(CZRQueryInfo* query) {
        if (query) queries_.push_back(query);
    }
    // These have at most a tree below them, which is taken; they themselves are deleted at once.
    void take(CZRAliasInfo* alias);
    void take(CFieldObject* field);
    void take(CZRQueryUnionInfo* record);

    // Takes what a descriptor holds, but not the descriptor.
    void takeContents(CZRQueryInfo& query);

    void drain();

 private:
    void takeBelow(SelectItem& item);

    std::vector<SelectItem*> items_;
    std::vector<CZRQueryInfo*> queries_;
};

}  // namespace zr
