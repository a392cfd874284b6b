#pragma once

#include <utility>
#include <vector>

class CZRAliasInfo;
class CZRQueryInfo;
class SelectItem;

namespace zr {

// Copies select items and query descriptors with everything below them, in loops: trees of any depth are
// copied without machine stack. Objects of classes that are not this library's are copied by their own Clone.
//
// Every copy is linked to its owner before the next one is made, so that running out of memory leaks nothing.
class DescriptorCopier {
 public:
    // Fills a copy that was made without what hangs below it.
    void copyBelow(const SelectItem& from, SelectItem& to);
    void copyBelow(const CZRQueryInfo& from, CZRQueryInfo& to);

 private:
    SelectItem* copy(const SelectItem& from);
    CZRQueryInfo* copy(const CZRQueryInfo& from);
    void copyNow(const SelectItem& from, SelectItem& to);
    void copyNow(const CZRQueryInfo& from, CZRQueryInfo& to);
    void copyMaps(const CZRQueryInfo& from, CZRQueryInfo& to);
    void run();

    std::vector<std::pair<const SelectItem*, SelectItem*>> items_;
    std::vector<std::pair<const CZRQueryInfo*, CZRQueryInfo*>> queries_;
};

}  // namespace zr
