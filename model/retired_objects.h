#pragma once

#include <vector>

#include "zrparsersql/containers.h"

class CFieldObject;
class CZRAliasInfo;
class CZRQueryInfo;
class SelectItem;
struct CZRQueryUnionInfo;

namespace zr {

class DescriptorReaper;

// What left a descriptor but may still be held by a host: emptied clause lists, replaced map entries, records
// of unions. Shared between the descriptor and whoever asked to hold on to it; the last one frees the
// objects.
class RetiredObjects {
 public:
    RetiredObjects() = default;
    RetiredObjects(const RetiredObjects&) = delete;
    RetiredObjects& operator=(const RetiredObjects&) = delete;
    ~RetiredObjects();

    // The end of a descriptor: its records of unions are retired, and unless somebody else holds on to the
    // retired objects they are handed to the reaper.
    static void releaseFrom(CZRQueryInfo& query, DescriptorReaper& reaper);

    std::vector<SelectItem*> items;
    std::vector<CFieldObject*> fields;
    std::vector<CZRAliasInfo*> aliases;
    std::vector<CZRQueryInfo*> queries;
    std::vector<CZRQueryUnionInfo*> unions;

 private:
    void handTo(DescriptorReaper& reaper);
};

}  // namespace zr
