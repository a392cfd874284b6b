#pragma once

#include <memory>
#include <string_view>
#include <vector>

#include "zrparsersql/sql_tree.h"

// A tree without a parser, for what no text of a grammar leads to.
class HandMadeTree : public CZRSQLTree {
 public:
    // (TYPE "TEXT" child ...), for example (16 "COLUMN_NAME" (249 "a")).
    static std::unique_ptr<HandMadeTree> read(std::string_view text);
    HandMadeTree(unsigned int type, CString text) : type_(type), text_(std::move(text)) {}
    // Without recursion, so that trees of any depth can be made.
    ~HandMadeTree() override;

    HandMadeTree& add(std::unique_ptr<HandMadeTree> child);

    CZRSQLTree* GetChild(unsigned int index) override;
    unsigned int GetChildCount() override { return static_cast<unsigned int>(children_.size()); }
    CString GetText() override { return text_; }
    unsigned int GetType() override { return type_; }

 private:
    unsigned int type_;
    CString text_;
    std::vector<std::unique_ptr<HandMadeTree>> children_;
    std::unique_ptr<HandMadeTree> beyond_;
};
