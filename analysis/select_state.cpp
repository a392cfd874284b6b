#include "analysis/select_state.h"

#include <stdexcept>

#include "parser/node_text.h"

namespace zr {

namespace {
// Far above what a query that a person wrote comes to; setItemLimit knows the query better.
constexpr std::size_t kDefaultItemLimit = 1'000'000;
}  // namespace

SelectState::SelectState(CZRSQLTree* selectNode, const Dialect& dialect, SelectState* outer)
    : m_selectNode(selectNode),
      dialect_(dialect),
      ownWalk_(outer ? nullptr : new Walk{{}, kDefaultItemLimit}),
      walk_(outer ? outer->walk_ : ownWalk_.get()) {}

SelectState::~SelectState() {
    for (SelectState* state : m_states) delete state;
}

void SelectState::setItemLimit(std::size_t items) {
    walk_->itemsLeft = items;
}

void SelectState::finish() {
    work().run();
}

void SelectState::ProcessTail(CZRSQLTree*) {}

void SelectState::countItem() {
    if (walk_->itemsLeft == 0) throw std::length_error("the analysis of a query makes too many items");
    --walk_->itemsLeft;
}

SelectItem& SelectState::appendText(ItemList* list, const CString& text, int kind) {
    SelectItem& item = append(list, newItem<SelectItem>());
    item.m_text = text;
    item.m_kind = kind;
    return item;
}

SelectItem& SelectState::appendJoinPart(ItemList* list) {
    SelectItem& item = append(list, newItem<SelectItem>());
    item.m_name = u" ";
    item.m_isOperator = 1;
    return item;
}

CString SelectState::GetNodeText(CZRSQLTree* node) {
    return unquoted(joinedText(*node)).Trim();
}

CString SelectState::unquoted(CString name) const {
    // A name that is quoted at one end only is trimmed all the same, which is intended.
    if (name.GetAt(0) == dialect_.quoteOpen)
        name.Trim({&dialect_.quoteOpen, 1}).Trim({&dialect_.quoteClose, 1});
    return name;
}

AliasNames& SelectState::aliasNames() {
    if (!aliasNames_) {
        ownAliasNames_ = std::make_unique<AliasNames>();
        ownAliasNames_->addKeys(m_query->m_aliases);
        aliasNames_ = ownAliasNames_.get();
    }
    return *aliasNames_;
}

bool SelectState::IsKnownAlias(const CString& name) {
    return aliasNames().contains(name);
}

}  // namespace zr
