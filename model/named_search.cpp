#include "model/named_search.h"

#include <string>

#include "platform/case_mapping.h"

namespace zr {

CString foldedKey(const CString& text) {
    if (isLowerAscii(text)) return text;
    std::u16string units(text.View());
    foldCase(units.data(), units.size());
    return CString(units);
}

}  // namespace zr
