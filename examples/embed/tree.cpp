// Parses a query and walks its tree without recursion, so that a query of any depth is fine.
#include <zrparsersql/sql_parsers.h>

#include <cstdio>
#include <memory>
#include <vector>

namespace {

struct Visit {
    CZRSQLTree* node;
    int depth;
};

void print(CZRSQLTree& root) {
    std::vector<Visit> open = {{&root, 0}};
    while (!open.empty()) {
        const auto [node, depth] = open.back();
        open.pop_back();
        std::printf("%*s%u %s\n", 2 * depth, "", node->GetType(), node->GetText().toUtf8().c_str());
        for (unsigned int i = node->GetChildCount(); i > 0; --i)
            open.push_back({node->GetChild(i - 1), depth + 1});
    }
}

}  // namespace

int main() {
    CString text = u"SELECT o.id FROM orders o WHERE price > 10";  // read in place: outlives parser and tree
    CZRMSSQLParser parser;
    parser.SetSQL(text);
    parser.ParseSQL();

    CZRSQLTree* view = nullptr;
    parser.GetSQLTree(&view);
    const std::unique_ptr<CZRSQLTree> root(view);  // goes ahead of the parser
    print(*root);
}
