#pragma once

#include <unordered_set>
#include <vector>

#include "model/source_search.h"

namespace zr {

// Looks in select lists for a column, and behind each "*" in the select lists of the queries it stands for.
// Needs no machine stack, whatever the depth of the items or of the queries. An object lives for one search.
class SelectListSearch {
 public:
    // byColumnAlone: the table of an entry does not matter. throughFunctions: look below functions, operators
    // and sub-queries too.
    SelectListSearch(SourceCache& sources, const SelectItemField& wanted, bool byColumnAlone,
                     bool throughFunctions)
        : sources_(sources),
          wanted_(wanted),
          byColumnAlone_(byColumnAlone),
          throughFunctions_(throughFunctions) {}

    // The first entry that matches, in order, or null. A "*" of the list stands for the sources of the query.
    SelectItemField* find(const CZRQueryInfo& query, const CList<SelectItem*>& items);

 private:
    struct Waiting {
        SelectItem* item;
        const CZRQueryInfo* query;
        bool byColumnAlone;
    };
    void wait(const CList<SelectItem*>& items, const CZRQueryInfo& query, bool byColumnAlone);
    void waitBehindStar(const Waiting& star, const CString& table);

    SourceCache& sources_;
    const SelectItemField& wanted_;
    bool byColumnAlone_;
    bool throughFunctions_;
    std::vector<Waiting> waiting_;  // what comes next stands last
    std::unordered_set<const CZRQueryInfo*> expanded_;
};

}  // namespace zr
