#include "analysis/alias_names.h"

#include <algorithm>
#include <array>
#include <string_view>

#include "platform/case_mapping.h"

namespace zr {

namespace {

// A name in lower case, without an allocation as a rule.
class LoweredName {
 public:
    explicit LoweredName(const CString& name) : view_(name.View()) {
        if (isLowerAscii(view_)) return;
        if (view_.size() > buffer_.size()) {
            longer_ = name;
            view_ = longer_.MakeLower().View();
            return;
        }
        std::copy(view_.begin(), view_.end(), buffer_.begin());
        makeLower(buffer_.data(), view_.size());
        view_ = {buffer_.data(), view_.size()};
    }
    LoweredName(const LoweredName&) = delete;
    LoweredName& operator=(const LoweredName&) = delete;

    // As long as both this object and the name.
    std::u16string_view view() const { return view_; }

 private:
    std::u16string_view view_;
    std::array<char16_t, 64> buffer_;
    CString longer_;
};

}  // namespace

void AliasNames::addKeys(const CMapStringToOb<CZRAliasInfo>& aliases) {
    for (const auto& entry : aliases) add(entry.key);
}

void AliasNames::add(const CString& name) {
    lowered_.emplace(LoweredName(name).view());
}

bool AliasNames::contains(const CString& name) const {
    return !lowered_.empty() && lowered_.contains(LoweredName(name).view());
}

}  // namespace zr
