#include "host/from_sources.h"

#include <algorithm>
#include <unordered_map>
#include <unordered_set>

#include "host/descriptor_access.h"

namespace zr::host {

namespace {

// The item of an alias that stands for a table; null for any other.
const SelectItem* aliasedTable(const CZRAliasInfo& alias) {
    if (!alias.Expression || alias.Expression->m_items.IsEmpty()) return nullptr;
    const SelectItem* const item = alias.Expression->m_items.GetHead();
    if (!isAlias(*item)) return nullptr;
    const SelectItemField* const named = classOf(*item->m_items.GetHead()).field;
    return named && named->m_sourceField.IsEmpty() && !named->m_sourceTable.IsEmpty() ? item : nullptr;
}

}  // namespace

std::vector<FromSource> fromSources(const CZRQueryInfo& query) {
    std::vector<FromSource> sources;
    std::unordered_map<const SelectItem*, CString> aliases;
    std::unordered_set<const SelectItem*> behindJoins;
    const auto add = [&](const SelectItem& item) {
        if (isAlias(item)) {
            aliases[item.m_items.GetHead()] = item.m_items.GetTail()->m_text;
            return;
        }
        if (item.m_isOperator && item.m_name.EqualsNoCase(u"JOIN"))
            behindJoins.insert(item.m_items.begin(), item.m_items.end());
        const ItemClass itemClass = classOf(item);
        FromSource source;
        if (itemClass.query)
            source.query = itemClass.query;
        else if (itemClass.field && itemClass.field->m_sourceField.IsEmpty())
            source.table = itemClass.field;
        else
            return;  // such as a column of a join's condition
        if (const auto alias = aliases.find(&item); alias != aliases.end()) source.alias = alias->second;
        source.isBehindJoin = behindJoins.contains(&item);
        sources.push_back(source);
    };
    for (const SelectItem* item : query.m_fromItems) forEachItem(*item, add);
    // Some dialects keep no items of a join in parentheses, but know what its aliases stand for.
    for (const auto* entry : sortedEntries(query.m_aliases)) {
        const SelectItem* const item = entry->value ? aliasedTable(*entry->value) : nullptr;
        const bool isNew = std::none_of(sources.begin(), sources.end(), [&](const FromSource& source) {
            return source.alias.EqualsNoCase(entry->key);
        });
        if (item && isNew) forEachItem(*item, add);
    }
    return sources;
}

}  // namespace zr::host
