#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <new>
#include <string_view>
#include <unordered_map>

#include "grammar/engine/syntax_tree.h"
#include "zrparsersql/sql_tree.h"

namespace zr {

class TreeView;

// What all views of one tree share: the memory they live in, freed at one stroke with the root view.
class ViewStore {
 public:
    explicit ViewStore(const engine::SyntaxTree* tree) : tree_(tree) {}

    // Null where there is no tree.
    const engine::SyntaxTree* tree() const { return tree_; }
    // Makes places for the views of all nodes, unless they are there.
    void makePlaces();
    // Where the view of a node has its place, as long as the store. Nodes in a row have theirs in a row.
    std::byte* placeOf(engine::SyntaxNode node) const;
    // Place for the view of a child that is not there.
    std::unique_ptr<CZRSQLTree>& beyond(const TreeView& parent, unsigned int index) {
        return beyond_[{&parent, index}];
    }
    // The text of a token's node. Texts that come again share their buffers.
    CString textOf(engine::SyntaxNode node);

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

    const engine::SyntaxTree* tree_;  // not owned
    std::unique_ptr<std::byte[]> views_;
    std::unique_ptr<std::array<CString, 64>> texts_;  // those asked for last, by hash; made with the first
    std::unordered_map<Place, std::unique_ptr<CZRSQLTree>, PlaceHash> beyond_;
};

// The one implementation of the dialects' views. A view over no node answers like a leaf.
class TreeView : public CZRSQLTree {
 public:
    // A root view; a null tree gives a view over no node.
    explicit TreeView(const engine::SyntaxTree* tree)
        : store_(new ViewStore(tree)), node_(tree ? engine::SyntaxTree::root() : kNoNode), isRoot_(true) {}
    // A view below a root.
    TreeView(engine::SyntaxNode node, ViewStore& store) : store_(&store), node_(node), isRoot_(false) {}
    TreeView(const TreeView&) = delete;
    TreeView& operator=(const TreeView&) = delete;
    // Frees the views below a root; the nodes are the parser's. Views below a root own nothing by themselves
    // and end with their memory, so that depth costs nothing here.
    ~TreeView() override {
        if (isRoot_) delete store_;
    }

    CZRSQLTree* GetChild(unsigned int index) override;
    unsigned int GetChildCount() override;
    CString GetText() override;
    unsigned int GetType() override;

    // The view as one of these, or null where it is none.
    static const TreeView* of(const CZRSQLTree& view);

    static constexpr engine::SyntaxNode kNoNode = 0xFFFFFFFF;

    engine::SyntaxNode node() const { return node_; }
    ViewStore& store() const { return *store_; }

 private:
    const engine::SyntaxTree& tree() const { return *store_->tree(); }
    // Views of the object's own class, for nodes in a row at their places.
    virtual void makeViews(engine::SyntaxNode first, unsigned int count) = 0;
    virtual std::unique_ptr<CZRSQLTree> viewOverNoNode() = 0;

    ViewStore* store_;
    engine::SyntaxNode node_;
    bool hasChildren_ = false;  // their views are made
    bool isRoot_;
};

template <class Self>
class ViewOf : public TreeView {
 public:
    using TreeView::TreeView;

 private:
    void makeViews(engine::SyntaxNode first, unsigned int count) override {
        static_assert(sizeof(Self) == sizeof(TreeView) && alignof(Self) <= alignof(std::max_align_t));
        store().makePlaces();
        std::byte* place = store().placeOf(first);
        for (unsigned int i = 0; i < count; ++i, place += sizeof(Self)) new (place) Self(first + i, store());
    }
    std::unique_ptr<CZRSQLTree> viewOverNoNode() override {
        return std::unique_ptr<CZRSQLTree>(new Self(kNoNode, store()));
    }
};

inline std::byte* ViewStore::placeOf(engine::SyntaxNode node) const {
    return views_.get() + node * sizeof(TreeView);
}

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
