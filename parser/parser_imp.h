#pragma once

#include <memory>
#include <new>
#include <optional>
#include <string_view>
#include <utility>
#include <vector>

#include "grammar/engine/syntax_tree.h"
#include "parser/tree_view.h"
#include "zrparsersql/sql_parsers.h"

namespace zr {

// What stands behind each facade: the text and its parses. Grammar has the tables, View is the dialect's tree
// view. Nothing here throws; a parse that can't be made leaves the result of the one before.
template <const engine::GrammarTable& Grammar, class View>
class ParserImp : public CZRSQLParser {
 public:
    virtual void SetSQL(CString& text) { text_ = text.View(); }

    void ParseSQL() override {
        if (!text_) return;
        try {
            parses_.push_back(std::make_unique<engine::SyntaxTree>(Grammar, *text_));
        } catch (...) {
            // As with every other failure, the result stays what it was.
        }
    }

    virtual void GetSQLTree(CZRSQLTree** out) {
        *out = newView(parses_.empty() ? nullptr : parses_.back().get());
    }

 protected:
    static CZRSQLTree* newView(const engine::SyntaxTree* tree) {
        try {
            return new View(tree);
        } catch (const std::bad_alloc&) {
            return nullptr;
        }
    }

 private:
    std::optional<std::u16string_view> text_;  // the caller's
    // The last one counts; trees of earlier ones may be held.
    std::vector<std::unique_ptr<const engine::SyntaxTree>> parses_;
};

}  // namespace zr
