#include "parser/tree_view.h"

#include <typeinfo>

namespace zr {

void ViewStore::makePlaces() {
    // Memory that no view comes to stays untouched.
    if (!views_) views_.reset(new std::byte[tree_->nodeCount() * sizeof(TreeView)]);
}

CString ViewStore::textOf(engine::SyntaxNode node) {
    // Longer texts are mostly strings, which come once.
    constexpr std::size_t kLongestShared = 24;
    const std::u16string_view text = tree_->tokenText(node);
    if (text.size() > kLongestShared) return CString(text);
    if (!texts_) texts_ = std::make_unique<std::array<CString, 64>>();
    CString& known = (*texts_)[CString::hash(text) % texts_->size()];
    if (known.View() != text) known = text;
    return known;
}

CZRSQLTree* TreeView::GetChild(unsigned int index) {
    const unsigned int count = TreeView::GetChildCount();
    if (index >= count) {
        std::unique_ptr<CZRSQLTree>& view = store_->beyond(*this, index);
        if (!view) view = viewOverNoNode();
        return view.get();
    }
    const engine::SyntaxNode first = tree().firstChild(node_);
    if (!hasChildren_) {
        makeViews(first, count);
        hasChildren_ = true;
    }
    return reinterpret_cast<TreeView*>(store_->placeOf(first + index));
}

const TreeView* TreeView::of(const CZRSQLTree& view) {
    // The walk asks for each name. A look at the class is a tenth of a cast that goes up from it.
    const std::type_info* const kind = &typeid(view);
    for (const std::type_info* known : {&typeid(CZRMSSQLTree), &typeid(CZROracleTree), &typeid(CZRMySQLTree),
                                        &typeid(CZRPostgreTree), &typeid(CZRMSAccessSQL_v3Tree)})
        if (kind == known) return static_cast<const TreeView*>(&view);
    return dynamic_cast<const TreeView*>(&view);
}

unsigned int TreeView::GetChildCount() {
    return node_ == kNoNode ? 0 : tree().childCount(node_);
}

CString TreeView::GetText() {
    if (node_ == kNoNode) return CString(u" ");
    return tree().isToken(node_) ? store_->textOf(node_) : CString(tree().name(node_));
}

unsigned int TreeView::GetType() {
    return node_ == kNoNode ? 0 : tree().type(node_);
}

}  // namespace zr
