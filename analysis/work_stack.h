#pragma once

#include <cstdint>
#include <memory>
#include <vector>

#include "zrparsersql/containers.h"
#include "zrparsersql/sql_tree.h"

class SelectItem;

namespace zr {

class SelectState;

using ItemList = CList<SelectItem*>;

// The work that a walk has still to do. Steps of the walk don't call each other down the tree: they do what
// can be done at once and put the rest here, so that the depth of a query costs heap and not machine stack.
//
// Work is taken from the top: what a step puts on last comes first, and all of it comes ahead of what was
// there.
class WorkStack {
 public:
    using Step = void (SelectState::*)(CZRSQLTree* node, ItemList* list, CZRSQLTree* parent);

    WorkStack();
    WorkStack(const WorkStack&) = delete;
    WorkStack& operator=(const WorkStack&) = delete;
    ~WorkStack();

    void once(SelectState& state, Step step, CZRSQLTree* node, ItemList* list, CZRSQLTree* parent);
    // The step for each child of the node from the first one on, in order.
    void forEachChild(SelectState& state, Step step, CZRSQLTree* node, ItemList* list, CZRSQLTree* parent,
                      unsigned int first = 0);
    // The same for the children ahead of the first RIGHT_PAREN.
    void forEachParameter(SelectState& state, Step step, CZRSQLTree* node, ItemList* list,
                          CZRSQLTree* parent);
    // Keeps a nested state as long as the work put on behind this call lasts. An exception in that work is
    // dropped together with what is left of it, and the walk goes on below.
    void openNested(std::unique_ptr<SelectState> nested);

    // Works until nothing is left. An exception outside of nested states drops all work and goes to the
    // caller.
    void run();

 private:
    enum class Kind : std::uint8_t { Once, Children, Parameters, Nested };
    struct Frame {
        SelectState* state;
        Step step;
        CZRSQLTree* node;
        ItemList* list;
        CZRSQLTree* parent;
        unsigned int next;
        unsigned int count;
        Kind kind;
    };

    void workOff();
    bool unwindToNested() noexcept;
    void pop() noexcept;

    std::vector<Frame> frames_;  // one of a nested state owns it
};

}  // namespace zr
