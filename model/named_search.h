#pragma once

#include "zrparsersql/containers.h"
#include "zrparsersql/object_info.h"

namespace zr {

// The first object of a list that a getter gives the wanted text for, without regard to case, or null.
template <class T>
T* findFirst(const CList<T*>& list, const CString& wanted, CString (CZRObjectInfo::*getter)() const) {
    for (T* object : list)
        if (object && (object->*getter)().EqualsNoCase(wanted)) return object;
    return nullptr;
}

// Texts that differ in case alone have equal keys.
CString foldedKey(const CString& text);

}  // namespace zr
