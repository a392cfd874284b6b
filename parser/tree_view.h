#pragma once

#include <antlr3.h>

#include <cstddef>
#include <cstdint>
#include <memory>
#include <new>
#include <unordered_map>
#include <vector>

#include "zrparsersql/sql_tree.h"

namespace zr {

class TreeView;

// What all views of one tree share: the memory they live in, freed at one stroke with the root view, and the
// tokens the tree was built from.
class ViewStore {
 public:
    explicit ViewStore(pANTLR3_COMMON_TOKEN_STREAM tokens) : tokens_(tokens) {}

    // Aligned for pointers; holds as long as the store.
    void* allocate(std::size_t bytes);
    // Place for the view of a child that is not there.
    TreeView*& beyond(const TreeView& parent, unsigned int index) { return beyond_[{&parent, index}]; }
    pANTLR3_COMMON_TOKEN_STREAM tokens() const { return tokens_; }

 private:
    struct Place {
        const TreeView* parent;
        unsigned int index;
        bool operator==(const Place&) const = default;
    };
    struct PlaceHash {
        std::size_t operator()(const Place& place) const {
            return reinterpret_cast<std::uintptr_t>(place.parent) / alignof(void*) * 31 + place.index;
        }
    };

    pANTLR3_COMMON_TOKEN_STREAM tokens_;  // not owned; null where there is no tree
    std::vector<std::unique_ptr<std::byte[]>> blocks_;
    std::byte* free_ = nullptr;
    std::size_t left_ = 0;
    std::unordered_map<Place, TreeView*, PlaceHash> beyond_;
};

// The one implementation of the dialects' views. A view over no node answers like a leaf.
class TreeView : public CZRSQLTree {
 public:
    // A root view; a null tree gives a view over no node.
    TreeView(pANTLR3_BASE_TREE tree, pANTLR3_COMMON_TOKEN_STREAM tokens)
        : m_tree(tree), store_(new ViewStore(tokens)), isRoot_(true) {}
    // A view below a root.
    TreeView(pANTLR3_BASE_TREE tree, ViewStore& store) : m_tree(tree), store_(&store), isRoot_(false) {}
    TreeView(const TreeView&) = delete;
    TreeView& operator=(const TreeView&) = delete;
    // Frees the views below a root; the runtime's nodes are the parser's. Views below a root own nothing by
    // themselves and end with their memory, so that depth costs nothing here.
    ~TreeView() override {
        if (isRoot_) delete store_;
    }

    CZRSQLTree* GetChild(unsigned int index) override;
    unsigned int GetChildCount() override;
    CString GetText() override;
    unsigned int GetType() override;

    pANTLR3_BASE_TREE tree() const { return m_tree; }
    pANTLR3_COMMON_TOKEN_STREAM tokens() const { return store_->tokens(); }

 protected:
    ViewStore& store() { return *store_; }

 private:
    // A view of the object's own class, in the store.
    virtual TreeView* makeView(pANTLR3_BASE_TREE tree) = 0;

    pANTLR3_BASE_TREE m_tree;
    ViewStore* store_;
    TreeView** m_children = nullptr;  // one a child, null until it is asked for
    unsigned int childCount_ = 0;
    bool isRoot_;
};

template <class Self>
class ViewOf : public TreeView {
 public:
    using TreeView::TreeView;

 private:
    TreeView* makeView(pANTLR3_BASE_TREE tree) override {
        static_assert(alignof(Self) <= alignof(void*));
        return new (store().allocate(sizeof(Self))) Self(tree, store());
    }
};

}  // namespace zr

// One class a dialect: they differ in identity only.
class CZROracleTree final : public zr::ViewOf<CZROracleTree> {
    using ViewOf::ViewOf;
};
class CZRMSSQLTree final : public zr::ViewOf<CZRMSSQLTree> {
    using ViewOf::ViewOf;
};
class CZRMySQLTree final : public zr::ViewOf<CZRMySQLTree> {
    using ViewOf::ViewOf;
};
class CZRPostgreTree final : public zr::ViewOf<CZRPostgreTree> {
    using ViewOf::ViewOf;
};
class CZRMSAccessSQL_v3Tree final : public zr::ViewOf<CZRMSAccessSQL_v3Tree> {
    using ViewOf::ViewOf;
};
