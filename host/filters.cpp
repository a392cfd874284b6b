#include "host/filters.h"

#include "host/kinds.h"
#include "host/section.h"

namespace zr::host {

namespace {

// By FilterCondition.
constexpr const char16_t* kOperators[] = {u" = ", u" <> ", u" < ",    u" <= ",
                                          u" > ", u" >= ", u" LIKE ", u" NOT LIKE "};

bool isNumber(int valueType) {
    return valueType >= FV_INTEGER && valueType <= FV_FLOATING;
}

}  // namespace

CString FilterItem::GetConditionText() {
    if (Condition < 0 || Condition >= static_cast<int>(std::size(kOperators))) return CString();
    const CString column = quoteName(FieldID, kind_);
    if (Value.IsNull()) {
        const bool isNegated = Condition == FC_NOT_EQUAL || Condition == FC_NOT_LIKE;
        return column + (isNegated ? u" IS NOT NULL" : u" IS NULL");
    }
    const CString value(Value.GetWide());
    return column + kOperators[Condition] + (isNumber(Value.ValueType) ? value : quoteText(value));
}

void FilterItem::Load(CZRStorageNode& node, CZRDescriptorFactory& factory) {
    CZRFilterItemInfo::Load(node, factory);
    // A value of type 0 is stored with a text that loading passes over; read here, it counts as known.
    const Section section(node, u"Value", false);
    node.ReadString(u"Value", CString(), 0);
}

CString Filter::GetFilterText() {
    if (UseSQLQuery) return SQLQuery;
    CString text;
    const char16_t* join = nullptr;
    for (CZRFilterItemInfo* item : Items) {
        const CString condition = item ? item->GetConditionText() : CString();
        if (condition.IsEmpty()) continue;
        if (join) text += join;
        text += condition;
        join = item->ConditionAdd == FJ_OR ? u" OR " : u" AND ";
    }
    return text;
}

}  // namespace zr::host
