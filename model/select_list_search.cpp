#include "model/select_list_search.h"

namespace zr {
namespace {

bool hidesItsColumns(const SelectItem& item) {
    return (item.m_kind == SIK_FUNCTION || item.m_kind == SIK_SUB_QUERY) && item.m_name != u"ALIAS";
}

}  // namespace

void SelectListSearch::wait(const CList<SelectItem*>& items, const CZRQueryInfo& query, bool byColumnAlone) {
    for (auto item = items.end(); item != items.begin();)
        if (*--item) waiting_.push_back({*item, &query, byColumnAlone});
}

// The names that qualify a column inside a source are not those that qualify it outside, so that behind a "*"
// only the column counts; the table that is wanted says which source.
void SelectListSearch::waitBehindStar(const Waiting& star, const CString& table) {
    std::vector<const CZRQueryInfo*> behind;
    for (const auto& entry : star.query->m_sourceTables) {
        if (!table.IsEmpty() && !entry.key.EqualsNoCase(table)) continue;
        if (!star.byColumnAlone && !wanted_.m_sourceTable.IsEmpty() &&
            !entry.key.EqualsNoCase(wanted_.m_sourceTable))
            continue;
        const CZRQueryInfo* source = sources_.byId(*star.query, entry.value).query;
        if (source && expanded_.insert(source).second) behind.push_back(source);
    }
    for (auto source = behind.rbegin(); source != behind.rend(); ++source)
        wait((*source)->m_selectItems, **source, true);
}

SelectItemField* SelectListSearch::find(const CZRQueryInfo& query, const CList<SelectItem*>& items) {
    if (wanted_.m_sourceField.IsEmpty()) return nullptr;
    wait(items, query, byColumnAlone_);
    while (!waiting_.empty()) {
        const Waiting next = waiting_.back();
        waiting_.pop_back();
        if (auto* field = dynamic_cast<SelectItemField*>(next.item)) {
            if (field->m_sourceField == u"*") {
                waitBehindStar(next, field->m_sourceTable);
                continue;
            }
            const bool tableFits = next.byColumnAlone || wanted_.m_sourceTable.IsEmpty() ||
                                   field->m_sourceTable.EqualsNoCase(wanted_.m_sourceTable);
            if (tableFits && field->m_sourceField.EqualsNoCase(wanted_.m_sourceField)) return field;
        } else if (next.item->m_text == u"*" && next.item->m_items.IsEmpty()) {
            waitBehindStar(next, CString());
        } else if (throughFunctions_ || !hidesItsColumns(*next.item)) {
            wait(next.item->m_items, *next.query, next.byColumnAlone);
        }
    }
    return nullptr;
}

}  // namespace zr
