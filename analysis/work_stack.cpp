#include "analysis/work_stack.h"

#include <utility>

#include "analysis/select_state.h"

namespace zr {

WorkStack::WorkStack() {
    frames_.reserve(16);  // deeper than most queries
}
WorkStack::~WorkStack() {
    while (!frames_.empty()) pop();
}

void WorkStack::pop() noexcept {
    const Frame top = frames_.back();
    frames_.pop_back();
    if (top.kind == Kind::Nested) delete top.state;
}

void WorkStack::once(SelectState& state, Step step, CZRSQLTree* node, ItemList* list, CZRSQLTree* parent) {
    frames_.push_back({&state, step, node, list, parent, 0, 0, Kind::Once});
}

void WorkStack::forEachChild(SelectState& state, Step step, CZRSQLTree* node, ItemList* list,
                             CZRSQLTree* parent, unsigned int first) {
    frames_.push_back({&state, step, node, list, parent, first, node->GetChildCount(), Kind::Children});
}

void WorkStack::forEachParameter(SelectState& state, Step step, CZRSQLTree* node, ItemList* list,
                                 CZRSQLTree* parent) {
    frames_.push_back({&state, step, node, list, parent, 0, node->GetChildCount(), Kind::Parameters});
}

void WorkStack::openNested(std::unique_ptr<SelectState> nested) {
    frames_.push_back({nested.get(), nullptr, nullptr, nullptr, nullptr, 0, 0, Kind::Nested});
    static_cast<void>(nested.release());
}

void WorkStack::run() {
    while (!frames_.empty()) {
        try {
            workOff();
        } catch (...) {
            if (!unwindToNested()) throw;
        }
    }
}

void WorkStack::workOff() {
    while (!frames_.empty()) {
        Frame& top = frames_.back();
        if (top.kind == Kind::Nested) {
            pop();
            continue;
        }
        CZRSQLTree* node = top.node;
        if (top.kind != Kind::Once) {
            if (top.next >= top.count) {
                pop();
                continue;
            }
            node = top.node->GetChild(top.next++);
            if (top.kind == Kind::Parameters && top.state->roleOf(node) == Role::RightParen) {
                pop();
                continue;
            }
        }
        // The step may put work on: nothing of the frame is read behind it.
        const Frame frame = top;
        if (frame.kind == Kind::Once) pop();
        (frame.state->*frame.step)(node, frame.list, frame.parent);
    }
}

bool WorkStack::unwindToNested() noexcept {
    while (!frames_.empty() && frames_.back().kind != Kind::Nested) pop();
    return !frames_.empty();
}

}  // namespace zr
