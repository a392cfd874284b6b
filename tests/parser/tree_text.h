#pragma once

#include <string>

#include "zrparsersql/sql_tree.h"

// A tree as text: (TYPE "TEXT" child ...), ASCII as it is and every other unit as \uXXXX.
std::string treeText(CZRSQLTree& tree);

// The first node of a type, parents ahead of children; null when there is none.
CZRSQLTree* findNode(CZRSQLTree& tree, unsigned int type);
