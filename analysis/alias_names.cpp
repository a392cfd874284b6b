#include "analysis/alias_names.h"

#include <algorithm>

namespace zr {

namespace {

// Plain text in lower case, as most names are: nothing to map.
bool isLowered(std::u16string_view text) {
    return std::all_of(text.begin(), text.end(),
                       [](char16_t unit) { return unit < 0x80 && (unit < u'A' || unit > u'Z'); });
}

CString lowered(const CString& text) {
    CString result = text;
    if (!isLowered(text)) result.MakeLower();
    return result;
}

}  // namespace

void AliasNames::addKeys(const CMapStringToOb<CZRAliasInfo>& aliases) {
    for (const auto& entry : aliases) add(entry.key);
}

void AliasNames::add(const CString& name) {
    lowered_.emplace(lowered(name).View());
}

bool AliasNames::contains(const CString& name) const {
    return !lowered_.empty() && lowered_.contains(lowered(name).View());
}

}  // namespace zr
