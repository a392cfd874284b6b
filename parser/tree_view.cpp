#include "parser/tree_view.h"

#include <algorithm>
#include <utility>

#include "parser/token_text.h"

namespace zr {

namespace {
constexpr std::size_t kFirstBlock = 4 * 1024;
constexpr std::size_t kLargestBlock = 256 * 1024;
}  // namespace

void* ViewStore::allocate(std::size_t bytes) {
    bytes = (bytes + alignof(void*) - 1) / alignof(void*) * alignof(void*);
    if (bytes > left_) {
        const std::size_t usual =
            std::min(kFirstBlock << std::min<std::size_t>(blocks_.size(), 6), kLargestBlock);
        const std::size_t size = std::max(usual, bytes);
        std::unique_ptr<std::byte[]> block(new std::byte[size]);
        blocks_.push_back(std::move(block));
        free_ = blocks_.back().get();
        left_ = size;
    }
    void* place = free_;
    free_ += bytes;
    left_ -= bytes;
    return place;
}

CZRSQLTree* TreeView::GetChild(unsigned int index) {
    if (!m_children) {
        childCount_ = GetChildCount();
        if (childCount_)
            m_children = new (store_->allocate(childCount_ * sizeof(TreeView*))) TreeView*[childCount_]();
    }
    const bool isThere = index < childCount_;
    TreeView*& view = isThere ? m_children[index] : store_->beyond(*this, index);
    if (!view)
        view = makeView(isThere ? static_cast<pANTLR3_BASE_TREE>(m_tree->getChild(m_tree, index)) : nullptr);
    return view;
}

unsigned int TreeView::GetChildCount() {
    return m_tree ? m_tree->getChildCount(m_tree) : 0;
}

CString TreeView::GetText() {
    return m_tree ? nodeText(*m_tree) : CString(u" ");
}

unsigned int TreeView::GetType() {
    return m_tree ? m_tree->getType(m_tree) : 0;
}

}  // namespace zr
