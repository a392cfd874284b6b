#pragma once

#include <vector>

#include "zrparsersql/sql_tree.h"

namespace zr {

// Calls visit(node) for the nodes below a node, parents first, children in order. visit gives the node whose
// children come next, which is the visited node itself as a rule, or null to pass over what is below it. The
// depth of the tree costs heap only.
template <class Visit>
void visitBelow(CZRSQLTree* root, Visit visit) {
    struct Place {
        CZRSQLTree* node;
        unsigned int next;
        unsigned int count;
    };
    std::vector<Place> path;
    path.reserve(32);  // deeper than most trees
    path.push_back({root, 0, root->GetChildCount()});
    while (!path.empty()) {
        Place& place = path.back();
        if (place.next == place.count) {
            path.pop_back();
            continue;
        }
        CZRSQLTree* const goOn = visit(place.node->GetChild(place.next++));
        if (!goOn) continue;
        if (const unsigned int count = goOn->GetChildCount()) path.push_back({goOn, 0, count});
    }
}

// The same with the node itself first.
template <class Visit>
void visitAll(CZRSQLTree* root, Visit visit) {
    if (CZRSQLTree* const goOn = visit(root)) visitBelow(goOn, visit);
}

}  // namespace zr
