#include "zrparsersql/source_info.h"

void CZRFieldInfo::BuildTypeMappedString() {
    TypeMappedString = GetTypeDefinition();
    const CString collation = GetCollation();
    if (collation.IsEmpty()) return;
    CString clause;
    clause.Format(u", COLLATE %s", collation);
    TypeMappedString += clause;
}

CZRIndexColumn::~CZRIndexColumn() = default;
