#pragma once

#include "zrparsersql/export.h"
#include "zrparsersql/wide_string.h"

// View of one node of a syntax tree.
//
// The root view comes from a parser facade and belongs to the caller, who deletes it before the facade. Every
// other view comes from GetChild and belongs to the root view it was reached from; nobody else deletes it. A
// child that is asked for twice is the same object.
//
// A view may stand over no node: behind the last child, or where a facade has no tree. Such a view has no
// children, the text " " and the type 0.
//
// Threads: asking a view may change it, so all views of one tree belong to one thread at a time.
// Failure: only an exhausted heap, as std::bad_alloc.
class ZR_API CZRSQLTree {
 public:
    CZRSQLTree();
    CZRSQLTree(const CZRSQLTree& other);
    // Copies nothing: a view stays where it is.
    CZRSQLTree& operator=(const CZRSQLTree& other);
    virtual ~CZRSQLTree();

    // The view of a child, counted from 0. Never null: an index behind the last child gives a view over no
    // node.
    virtual CZRSQLTree* GetChild(unsigned int index) = 0;
    virtual unsigned int GetChildCount() = 0;
    // The token's text, or for a node that stands for no token the name the grammar gives it.
    virtual CString GetText() = 0;
    // The token number in the vocabulary of the grammar that made the tree; 0 for an error node.
    virtual unsigned int GetType() = 0;
};
