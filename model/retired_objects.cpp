#include "model/retired_objects.h"

#include <new>

#include "model/descriptor_reaper.h"
#include "zrparsersql/query_info.h"

namespace zr {
namespace {

template <class T>
void handAll(std::vector<T*>& objects, DescriptorReaper& reaper) {
    for (T* object : objects) reaper.take(object);
    objects.clear();
}

}  // namespace

RetiredObjects::~RetiredObjects() {
    DescriptorReaper reaper;
    handTo(reaper);
}

void RetiredObjects::handTo(DescriptorReaper& reaper) {
    handAll(items, reaper);
    handAll(fields, reaper);
    handAll(aliases, reaper);
    handAll(queries, reaper);
    handAll(unions, reaper);
}

void RetiredObjects::releaseFrom(CZRQueryInfo& query, DescriptorReaper& reaper) {
    // A descriptor's end empties the list of unions without ending the records; hosts rely on it.
    if (query.retired_ && query.retired_.use_count() > 1) {
        try {
            query.RetireUnions(query.m_unions);
        } catch (const std::bad_alloc&) {
            // This is a destructor's work. The records stay, for whoever holds on, and nobody ends them.
            query.m_unions.RemoveAll();
        }
    } else {
        for (CZRQueryUnionInfo* record : query.m_unions) reaper.take(record);
        query.m_unions.RemoveAll();
        if (query.retired_) query.retired_->handTo(reaper);
    }
    query.retired_.reset();
}

}  // namespace zr
