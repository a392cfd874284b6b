#pragma once

#include <memory>

#include "zrparsersql/containers.h"

namespace zr {

// Appends an object that has no owner yet to the list that will be it. Where the list has no room the object
// ends here.
template <class T, class Made, class End>
void appendOwned(CList<T*>& list, Made* made, End end) {
    std::unique_ptr<Made, End> owner(made, end);
    list.AddTail(made);
    static_cast<void>(owner.release());
}
template <class T, class Made>
void appendOwned(CList<T*>& list, Made* made) {
    appendOwned(list, made, std::default_delete<Made>());
}

}  // namespace zr
