#pragma once

#include "zrparsersql/filter_info.h"

// Row filters of a table, with what this host means by the numbers of a condition.
namespace zr::host {

// Values of CZRFilterItemInfo::Condition.
enum FilterCondition : int {
    FC_EQUAL = 0,
    FC_NOT_EQUAL,
    FC_LESS,
    FC_LESS_OR_EQUAL,
    FC_GREATER,
    FC_GREATER_OR_EQUAL,
    FC_LIKE,
    FC_NOT_LIKE,
};

// Values of CZRFilterItemInfo::ConditionAdd.
enum FilterJoin : int { FJ_AND = 0, FJ_OR = 1 };

// Values of CZRFilterValue::ValueType. Numbers are written bare.
enum FilterValueType : int {
    FV_INTEGER = 1,
    FV_DECIMAL = 2,
    FV_FLOATING = 3,
    FV_TEXT = 4,
    FV_LONG_TEXT = 5,
    FV_DATE = 6,
};

class FilterItem : public CZRFilterItemInfo {
 public:
    explicit FilterItem(DBTypes kind) : kind_(kind) {}

    // Such as [city] <> 'Gent'. A null value is compared by IS NULL or IS NOT NULL; a condition without a
    // meaning here gives an empty text.
    CString GetConditionText() override;
    void Load(CZRStorageNode& node, CZRDescriptorFactory& factory) override;
    FilterItem* Clone() const override { return new FilterItem(*this); }

 private:
    DBTypes kind_;
};

class Filter : public CZRFilterInfo {
 public:
    explicit Filter(DBTypes kind) : kind_(kind) {}

    DBTypes GetDBType() const override { return kind_; }
    // The SQL text when that is to be used, else the conditions, each joined to the next as it says.
    CString GetFilterText() override;
    Filter* Clone() const override { return new Filter(*this); }

 private:
    DBTypes kind_;
};

}  // namespace zr::host
