#pragma once

#include <algorithm>
#include <string>
#include <vector>

#include "zrparsersql/query_info.h"

// An item as text, with what is not empty or zero only:
//     (5 table=t field=x)                                 a column
//     (4 name== op type=254 (5 field=a) (1 text=1))       an operator with its operands
// The number is m_kind. An item that has a query of its own shows `query` behind the rest.
std::string itemText(const SelectItem& item);
// Those of a list, with one blank between them.
std::string listText(const CList<SelectItem*>& items);

// The keys of a map in the order of their units, with one "|" between them.
template <class Map>
std::string keysOf(const Map& map) {
    std::vector<std::string> keys;
    for (const auto& entry : map) keys.push_back(entry.key.toUtf8());
    std::sort(keys.begin(), keys.end());
    std::string text;
    for (const std::string& key : keys) text += (text.empty() ? "" : "|") + key;
    return text;
}
