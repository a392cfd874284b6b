#include "zrparsersql/sql_tree.h"

CZRSQLTree::CZRSQLTree() = default;
CZRSQLTree::CZRSQLTree(const CZRSQLTree&) = default;
CZRSQLTree& CZRSQLTree::operator=(const CZRSQLTree&) {
    return *this;
}
CZRSQLTree::~CZRSQLTree() = default;
