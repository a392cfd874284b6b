#pragma once

#include "zrparsersql/source_info.h"

class SelectItem;

namespace zr {
struct ShallowCopy;
class DescriptorCopier;
}  // namespace zr

// An alias of a select list: a column that carries the expression it stands for.
class ZR_SHARED_DECLARATION CZRAliasInfo : public CZRSourceFildInfo {
 public:
    CString AliasText;                 // no operation writes it, and copies leave it empty
    CString AliasTable;                // name of the table that the alias stands for
    CString AliasField;                // name of the column that the alias stands for
    SelectItem* Expression = nullptr;  // owned

    CZRAliasInfo();
    // The copy has its own copy of the expression.
    CZRAliasInfo(const CZRAliasInfo& other);
    ~CZRAliasInfo() override;

    CZRAliasInfo* Clone(int selectedOnly = 0) const override;
    // Derived, and no base table.
    bool IsDerivedSource() const override;
    bool IsBaseTable() const override;

    // Always null: lets an alias stand where a source is expected.
    virtual CZRSourceFildInfo* FindFieldByID(CString id);

    CString GetAliasTable() const { return AliasTable; }
    void SetAliasTable(CString value) { AliasTable = std::move(value); }
    CString GetAliasField() const { return AliasField; }
    void SetAliasField(CString value) { AliasField = std::move(value); }

 private:
    friend class zr::DescriptorCopier;
    // Leaves the expression out.
    CZRAliasInfo(const CZRAliasInfo& other, const zr::ShallowCopy&);
};
