// Joining the document and leaving it: the walks that tell every node of a subtree.
//
// Page code runs inside these walks (scripts run when they arrive), so each step looks at the tree as it
// stands. When a child is not where the walk met it any more, its siblings are looked at again from the
// first: what has been told already is passed over, and nobody who moved up is missed.

#include "core/logging/log.h"
#include "dom/document.h"
#include "dom/node.h"

namespace qorvex::dom {

using qsl::RefPtr;

namespace {
struct WalkFrame {
    RefPtr<Node> node;
    size_t next_child;

    void Leave(const Node& child) {
        const auto siblings = node->GetChildren();
        const bool in_place = next_child < siblings.size() && siblings[next_child] == &child;
        next_child = in_place ? next_child + 1 : 0;
    }
};
using WalkStack = SmallVector<WalkFrame, 8, MemoryTag::DOM>;
}  // namespace

void Node::ConnectSubtree() {
    if (IsInDocument()) {
        LogWarning("Adding an Element twice in the DOM tree!");
        return;
    }
    OnInsertedIntoDocument();
    if (children_.empty()) return OnSubtreeInserted();
    WalkStack stack;
    stack.push_back({RefPtr<Node>(this), 0});
    while (!stack.empty()) {
        WalkFrame& top = stack.back();
        Node& node = *top.node;
        if (node.IsInDocument() && top.next_child < node.children_.size()) {
            RefPtr<Node> child = node.children_[top.next_child];
            if (child->IsInDocument()) {  // page code brought it in already
                ++top.next_child;
                continue;
            }
            child->OnInsertedIntoDocument();
            stack.push_back({std::move(child), 0});
            continue;
        }
        const RefPtr<Node> done = std::move(top.node);
        stack.pop_back();
        if (done->IsInDocument()) done->OnSubtreeInserted();
        if (!stack.empty()) stack.back().Leave(*done);
    }
}

void Node::DisconnectSubtree() {
    if (!IsInDocument()) {
        LogWarning("Removing an Element from the DOM tree, but it's not in!");
        return;
    }
    OnRemovedFromDocument();
    WalkStack stack;
    stack.push_back({RefPtr<Node>(this), 0});
    while (!stack.empty()) {
        WalkFrame& top = stack.back();
        Node& node = *top.node;
        if (top.next_child < node.children_.size()) {
            const RefPtr<Node> child = node.children_[top.next_child];
            if (!child->IsInDocument() || child->Is(kBeingRemoved)) {
                ++top.next_child;
                continue;
            }
            child->SetFlag(kBeingRemoved, true);
            document_->NodeRemoved(*child);
            child->OnRemovedFromDocument();
            stack.push_back({child, 0});
            continue;
        }
        const RefPtr<Node> done = std::move(top.node);
        stack.pop_back();
        done->OnSubtreeRemoved();
        if (stack.empty()) break;
        done->SetFlag(kBeingRemoved, false);
        stack.back().Leave(*done);
    }
}

void Node::OnInsertedIntoDocument() {
    SetFlag(kInDocument, true);
    if (parent_) depth_ = parent_->depth_ + 1;
    // What was solved in another place says nothing here.
    ResetStyle();
}

void Node::OnSubtreeRemoved() {
    // Images belong to boxes on the page: all background slots, then border image and mask.
    ReleaseImages(0, -1);
    ReleaseImages(1, -1);
    ReleaseImages(2, -1);
    SetFlag(kInDocument, false);
    depth_ = -1;
}

}  // namespace qorvex::dom
