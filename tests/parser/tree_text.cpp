#include "tests/parser/tree_text.h"

#include <cstdio>
#include <vector>

namespace {

void appendQuoted(std::string& out, const CString& text) {
    out += '"';
    for (const char16_t unit : text.View()) {
        char escaped[8];
        if (unit == u'"' || unit == u'\\') {
            out += '\\';
            out += static_cast<char>(unit);
        } else if (unit >= 0x20 && unit < 0x7f) {
            out += static_cast<char>(unit);
        } else {
            std::snprintf(escaped, sizeof escaped, "\\u%04x", unit);
            out += escaped;
        }
    }
    out += '"';
}

}  // namespace

std::string treeText(CZRSQLTree& tree) {
    struct Place {
        CZRSQLTree* node;
        unsigned int next = 0;
    };
    std::string out;
    std::vector<Place> path;
    const auto enter = [&](CZRSQLTree* node) {
        out += '(';
        out += std::to_string(static_cast<int>(node->GetType())) + ' ';
        appendQuoted(out, node->GetText());
        path.push_back({node});
    };
    enter(&tree);
    while (!path.empty()) {
        Place& place = path.back();
        if (place.next == place.node->GetChildCount()) {
            out += ')';
            path.pop_back();
            continue;
        }
        out += ' ';
        enter(place.node->GetChild(place.next++));
    }
    return out;
}

CZRSQLTree* findNode(CZRSQLTree& tree, unsigned int type) {
    std::vector<CZRSQLTree*> open{&tree};
    while (!open.empty()) {
        CZRSQLTree* const node = open.back();
        open.pop_back();
        if (node->GetType() == type) return node;
        for (unsigned int index = node->GetChildCount(); index-- > 0;) open.push_back(node->GetChild(index));
    }
    return nullptr;
}
