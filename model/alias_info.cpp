#include "zrparsersql/alias_info.h"

#include "zrparsersql/select_item.h"

CZRAliasInfo::CZRAliasInfo() {
    Computed = 1;
}

CZRAliasInfo::CZRAliasInfo(const CZRAliasInfo& other, const zr::ShallowCopy&)
    : CZRSourceFildInfo(other), AliasTable(other.AliasTable), AliasField(other.AliasField) {}

CZRAliasInfo::CZRAliasInfo(const CZRAliasInfo& other) : CZRAliasInfo(other, zr::ShallowCopy{}) {
    if (other.Expression) Expression = other.Expression->Clone();
}

CZRAliasInfo::~CZRAliasInfo() {
    delete Expression;
}

CZRAliasInfo* CZRAliasInfo::Clone(int /*selectedOnly*/) const {
    return new CZRAliasInfo(*this);
}

bool CZRAliasInfo::IsDerivedSource() const {
    return true;
}

bool CZRAliasInfo::IsBaseTable() const {
    return !IsDerivedSource();
}

CZRSourceFildInfo* CZRAliasInfo::FindFieldByID(CString /*id*/) {
    return nullptr;
}
