// Insertion and removal: the only ways into and out of a child array.
//
// Mistakes of a page end in a log line and leave the tree as it was; script sees no exception from here
// (https://dom.spec.whatwg.org/#concept-node-ensure-pre-insertion-validity would throw).

#include "core/logging/log.h"
#include "dom/character_data.h"
#include "dom/document.h"
#include "dom/element.h"
#include "dom/node.h"
#include "dom/observer_hooks.h"
#include "script/make_handle.h"

namespace qorvex::dom {

using qsl::RefPtr;

bool Node::MayInsert(const Node& child) const {
    if (!Is(kParentMask)) {
        LogDebug(
            "DOMException: Failed to execute 'appendChild' on 'Node': This node type does not support this "
            "method.");
        return false;
    }
    if (!child.Is(kChildMask)) {
        LogDebug("DOMException: Failed to execute 'appendChild' on 'Node': Not valid node type.");
        return false;
    }
    if (child.Is(kIsDocument)) {
        LogDebug("DOMException: It's forbidden to 'appendChild' the Document.");
        return false;
    }
    if (child.document_ != document_) {
        LogDebug("DOMException: Can't 'appendChild' a node of another document.");
        return false;
    }
    if (child.Is(kBeingRemoved)) {
        // Its removal has not come to an end: it would be told of its arrival before its departure.
        LogDebug("DOMException: Can't 'appendChild' a node that is being removed.");
        return false;
    }
    if (&child == this) {
        LogDebug("DOMException: Can't 'appendChild' to itself.");
        return false;
    }
    // Only a node with children can be an ancestor, which spares the common case the walk.
    if (child.HasChildNodes() && child.Contains(this)) {
        LogDebug("DOMException: Can't 'appendChild' a node that is the ancestor of this one.");
        return false;
    }
    return true;
}

void Node::QueueChildListRecord(const ChildListChange& change) {
    if ((document_->mutationObserverKinds & kMutationChildList) && document_->mutationRegistry)
        document_->mutationRegistry->QueueChildList(*this, change);
}

RefPtr<Node> Node::InsertBefore(RefPtr<Node> child, Node* reference, bool suppress_records) {
    if (!child) {
        LogDebug("Trying to insert null child on Node!");
        return nullptr;
    }
    if (!MayInsert(*child)) return child;
    if (child->Is(kIsFragment)) {
        InsertFragment(*child, reference, suppress_records);
        return child;
    }
    const RefPtr<Node> self(this);  // a removal below runs page code
    // A node that is inserted before itself stays where it is (DOM, "pre-insert" step 3).
    if (reference == child.get() && child->parent_ == this) reference = child->GetNextSibling();
    const RefPtr<Node> reference_held(reference);
    if (child->parent_) child->parent_->RemoveChild(child.get(), suppress_records);

    Node* previous =
        reference ? reference->parent_ == this ? reference->GetPreviousSibling() : nullptr : GetLastChild();
    if (!PlaceChild(child, reference)) {
        LogWarning("Unable to find reference node in child list when trying to insertBefore!");
        return nullptr;
    }
    child->parent_ = this;
    if (!suppress_records) QueueChildListRecord({{&child, 1}, {}, previous, reference});

    if (IsInDocument()) {
        document_->ForgetCollections(*this);
        child->ConnectSubtree();
        // The scripts that just ran may have moved the child on.
        if (child->IsInDocument()) document_->NodeInserted(*child);
        MarkLayoutDirty();
        if (document_->inspector) {
            document_->inspector->OnChildListChanged(*this);
            document_->inspector->OnNodeArrived(*child);
        }
    }
    return child;
}

bool Node::PlaceChild(RefPtr<Node>& child, Node* reference) {
    if (!reference) {
        child->index_hint_ = children_.size();
        children_.push_back(child);
        return true;
    }
    if (reference->parent_ != this) return false;
    const size_t index = reference->GetIndexInParent();
    if (index == kNoIndex) return false;
    child->index_hint_ = static_cast<uint32_t>(index);
    children_.insert(children_.begin() + index, child);
    return true;
}

void Node::InsertFragment(Node& fragment, Node* reference, bool suppress_records) {
    const RefPtr<Node> self(this);
    const RefPtr<Node> reference_held(reference);
    const NodeChildren moved = fragment.children_;
    Node* previous =
        reference ? reference->parent_ == this ? reference->GetPreviousSibling() : nullptr : GetLastChild();
    const RefPtr<Node> previous_held(previous);
    for (const RefPtr<Node>& child : moved)
        InsertBefore(child, reference, true);
    const std::span<const RefPtr<Node>> nodes(moved.data(), moved.size());
    fragment.QueueChildListRecord({{}, nodes, nullptr, nullptr});
    if (!suppress_records) QueueChildListRecord({nodes, {}, previous, reference});
}

RefPtr<Node> Node::RemoveChild(Node* child, bool suppress_records) {
    if (!child) return nullptr;
    const RefPtr<Node> held(child);
    const size_t index = child->parent_ == this ? child->GetIndexInParent() : kNoIndex;
    if (index == kNoIndex) {
        LogError("Failed to execute removeChild: The node to be removed is not a child of this node.");
        return held;
    }
    const RefPtr<Node> self(this);
    if (!suppress_records && document_->mutationObserverKinds && document_->mutationRegistry) {
        document_->mutationRegistry->AddTransientObservers(*child, *this);
        QueueChildListRecord({{}, {&held, 1}, child->GetPreviousSibling(), child->GetNextSibling()});
    }
    children_.erase(children_.begin() + index);
    if (document_->inspector && IsInDocument()) document_->inspector->OnNodeLeft(*this, *child);
    LeaveDocument(*child);
    if (child->parent_ == this) child->parent_ = nullptr;
    AfterRemoval();
    return held;
}

void Node::LeaveDocument(Node& child) {
    if (!child.IsInDocument() || child.Is(kBeingRemoved)) return;
    child.SetFlag(kBeingRemoved, true);
    document_->NodeRemoved(child);
    child.DisconnectSubtree();
    child.SetFlag(kBeingRemoved, false);
}

void Node::AfterRemoval() {
    if (!IsInDocument()) return;
    MarkStyleDirty();
    MarkLayoutDirty();
}

RefPtr<Node> Node::ReplaceChild(RefPtr<Node> new_child, Node* old_child) {
    if (!old_child || old_child->parent_ != this) return nullptr;
    const RefPtr<Node> old_held(old_child);
    if (!new_child || !MayInsert(*new_child)) return old_held;
    if (new_child == old_child) return old_held;
    const RefPtr<Node> self(this);
    // Both the place and the record go by what stays: when the new child is old's own neighbour, the
    // neighbour beyond it counts (DOM, "replace").
    RefPtr<Node> next(old_child->GetNextSibling());
    if (next == new_child) next = RefPtr<Node>(new_child->GetNextSibling());
    const RefPtr<Node> previous(old_child->GetPreviousSibling());

    NodeChildren added;
    if (new_child->Is(kIsFragment)) {
        added = new_child->children_;
    } else {
        added.push_back(new_child);
    }
    RemoveChild(old_child, true);
    if (next && next->parent_ != this) next = nullptr;  // page code moved it away
    InsertBefore(new_child, next.get(), true);
    Node* before = previous == new_child.get() ? nullptr : previous.get();
    QueueChildListRecord({{added.data(), added.size()}, {&old_held, 1}, before, next.get()});
    return old_held;
}

void Node::RemoveAllChildren() {
    if (children_.empty()) return;
    const RefPtr<Node> self(this);
    const bool was_in_document = IsInDocument();
    NodeChildren removed = std::move(children_);
    const std::span<const RefPtr<Node>> nodes(removed.data(), removed.size());
    QueueChildListRecord({{}, nodes, nullptr, nullptr});
    for (const RefPtr<Node>& child : removed) {
        if (document_->mutationObserverKinds && document_->mutationRegistry)
            document_->mutationRegistry->AddTransientObservers(*child, *this);
        if (was_in_document) {
            if (document_->inspector) document_->inspector->OnNodeLeft(*this, *child);
            LeaveDocument(*child);
        }
        if (child->parent_ == this) child->parent_ = nullptr;
    }
    AfterRemoval();
}

void Node::SetTextContent(std::string_view text) {
    if (children_.size() == 1 && children_[0]->IsText()) {
        static_cast<Text&>(*children_[0]).SetData(text);
        return;
    }
    while (!children_.empty())
        RemoveChild(children_.back().get());
    AppendChild(script::MakeHandle<Text>(*document_, text));
}

void Node::Normalize() {
    // Document order by hand: the tree changes under the walk, always behind the node that is looked at.
    for (Node* node = this; node; node = node->GetNextInTree(this)) {
        for (size_t i = 0; i < node->children_.size();) {
            RefPtr<Node> child = node->children_[i];
            if (!child->IsText()) {
                ++i;
                continue;
            }
            auto& text = static_cast<Text&>(*child);
            if (text.GetData().empty()) {
                node->RemoveChild(child.get());
                continue;
            }
            NodeText joined;
            while (i + 1 < node->children_.size() && node->children_[i + 1]->IsText()) {
                RefPtr<Node> next = node->children_[i + 1];
                if (joined.empty()) joined = text.GetData();
                joined.append(static_cast<Text&>(*next).GetData());
                node->RemoveChild(next.get());
            }
            if (!joined.empty()) text.SetData(joined);
            ++i;
        }
    }
}

}  // namespace qorvex::dom
