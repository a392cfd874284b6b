#include "zrparsersql/table_info.h"

namespace {

// The selected column of the table that an index column names, or null. It is named by its SrcName.
CZRSourceFildInfo* selectedColumn(CZRTableInfo& table, const CZRIndexColumn* column) {
    CZRSourceFildInfo* field = column ? table.FindFieldBySrcName(column->GetColumnID()) : nullptr;
    return field && field->GetSelected() ? field : nullptr;
}

bool isExcludedFromKey(const CZRSourceFildInfo& column) {
    const auto* field = dynamic_cast<const CZRFieldInfo*>(&column);
    return field && field->IsExcludedFromKey();
}

// The columns of an index that can serve to address rows.
std::vector<CString> usableColumns(CZRTableInfo& table, const CZRIndexInfo& index, bool withExcluded) {
    std::vector<CString> names;
    for (const CZRIndexColumn* column : index.Columns) {
        const CZRSourceFildInfo* field = selectedColumn(table, column);
        if (field && (withExcluded || !isExcludedFromKey(*field))) names.push_back(column->GetColumnID());
    }
    return names;
}

struct UsableKey {
    CZRIndexInfo* index = nullptr;
    std::vector<CString> columns;
};

// The primary key, else a unique index by columns that are not excluded, else a unique index by any columns.
UsableKey findUsableKey(CZRTableInfo& table) {
    if (CZRIndexInfo* primaryKey = table.GetPrimaryKey()) {
        std::vector<CString> columns = usableColumns(table, *primaryKey, true);
        if (!columns.empty()) return {primaryKey, std::move(columns)};
    }
    for (bool withExcluded : {false, true}) {
        for (CZRIndexInfo* index : table.Indexes) {
            if (!index || !index->IsUnique()) continue;
            std::vector<CString> columns = usableColumns(table, *index, withExcluded);
            if (!columns.empty()) return {index, std::move(columns)};
        }
    }
    return {};
}

}  // namespace

CZRIndexInfo* CZRTableInfo::GetPrimaryKey() {
    for (CZRIndexInfo* index : Indexes)
        if (index && index->IsPrimaryKey()) return index;
    return nullptr;
}

CZRIndexInfo* CZRTableInfo::GetUniqueIndex() {
    if (UniqueIndexDirty) {
        for (CZRIndexInfo* index : Indexes) {
            if (index && index->IsUnique()) {
                UniqueIndex = index;
                break;
            }
        }
        UniqueIndexDirty = 0;
    }
    return UniqueIndex;
}

CZRIndexInfo* CZRTableInfo::GetBestKey() {
    if (CZRIndexInfo* primaryKey = GetPrimaryKey()) return primaryKey;
    CZRIndexInfo* best = nullptr;
    for (CZRIndexInfo* index : Indexes) {
        if (!index || !index->IsUnique()) continue;
        if (!best || index->ColumnCount < best->ColumnCount) best = index;
        if (best->ColumnCount == 1) break;
    }
    return best;
}

CZRIndexInfo* CZRTableInfo::FindKeyForSelection() {
    return findUsableKey(*this).index;
}

void CZRTableInfo::CollectKeyColumns(CMapStringToPtr& columns) {
    for (const CString& name : findUsableKey(*this).columns) columns.SetAt(name, nullptr);
}
