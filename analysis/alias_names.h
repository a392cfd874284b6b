#pragma once

#include <string>
#include <string_view>
#include <unordered_set>

#include "zrparsersql/alias_info.h"
#include "zrparsersql/containers.h"

namespace zr {

// The names of a descriptor's aliases, for look-ups without regard to case.
class AliasNames {
 public:
    // Adds all keys of a map.
    void addKeys(const CMapStringToOb<CZRAliasInfo>& aliases);
    void add(const CString& name);
    bool contains(const CString& name) const;

 private:
    struct Hash {
        using is_transparent = void;
        std::size_t operator()(std::u16string_view text) const { return CString::hash(text); }
    };

    std::unordered_set<std::u16string, Hash, std::equal_to<>> lowered_;
};

}  // namespace zr
