#include "from_sources.h"

#include <unordered_map>

#include "descriptor_access.h"
#include "expression_text.h"

namespace zr::tool {

std::vector<FromSource> fromSources(const CZRQueryInfo& query) {
    std::vector<FromSource> sources;
    std::unordered_map<const SelectItem*, CString> aliases;
    const auto add = [&](const SelectItem& item) {
        if (isAlias(item)) {
            aliases[item.m_items.GetHead()] = item.m_items.GetTail()->m_text;
            return;
        }
        const ItemClass itemClass = classOf(item);
        FromSource source;
        if (itemClass.query)
            source.query = itemClass.query;
        else if (itemClass.field && itemClass.field->m_sourceField.IsEmpty())
            source.table = itemClass.field;
        else
            return;  // such as a column of a join's condition
        if (const auto alias = aliases.find(&item); alias != aliases.end()) source.alias = alias->second;
        sources.push_back(source);
    };
    for (const SelectItem* item : query.m_fromItems) forEachItem(*item, add);
    return sources;
}

}  // namespace zr::tool
