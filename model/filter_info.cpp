#include "zrparsersql/filter_info.h"

#include <new>

#include "model/owned_append.h"

namespace {

// As the class promises its subclasses: this class's destructor, then the memory.
template <class T>
void endAs(T* object) {
    if (!object) return;
    object->T::~T();
    ::operator delete(static_cast<void*>(object));
}

}  // namespace

CZRFilterItemInfo::~CZRFilterItemInfo() = default;

void CZRFilterItemInfo::destroy(CZRFilterItemInfo* item) {
    endAs(item);
}

void CZRFilterItemInfo::SetAll(CString fieldID, int condition, const CZRFilterValue& value,
                               int conditionAdd) {
    Value = value;  // first, since it can throw
    FieldID = std::move(fieldID);
    Condition = condition;
    ConditionAdd = conditionAdd;
}

// Delegates, so that a copy that runs out of memory half-way ends like any other filter.
CZRFilterInfo::CZRFilterInfo(const CZRFilterInfo& other) : CZRFilterInfo() {
    SQLQuery = other.SQLQuery;
    UseSQLQuery = other.UseSQLQuery;
    for (const CZRFilterItemInfo* item : other.Items)
        if (item) zr::appendOwned(Items, item->Clone(), &CZRFilterItemInfo::destroy);
}

CZRFilterInfo::~CZRFilterInfo() {
    for (CZRFilterItemInfo* item : Items) CZRFilterItemInfo::destroy(item);
}

void CZRFilterInfo::destroy(CZRFilterInfo* filter) {
    endAs(filter);
}
