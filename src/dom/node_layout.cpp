// A node's side of the layout tree: its handle, its dirty mark, its scroll position.

#include "core/limits.h"
#include "core/logging/log.h"
#include "dom/document.h"
#include "dom/element.h"
#include "layout/layout_tree.h"

namespace qorvex::dom {

layout::HandlePtr Node::CreateLayoutNode(layout::LayoutTree& tree, layout::LayoutHandle& parent) {
    const css::LaidOutStyle* style = GetOwnLaidOutStyle();
    if (!Is(kDisplayable) || !style) return nullptr;
    layout_node_ = tree.AddChild(parent, FindLayoutIndex(parent),
                                 {.style = *style,
                                  .display = display_element_,
                                  .link = GetLayoutLink(),
                                  .scroll = GetStoredScroll(),
                                  .isImage = tag_ == css::TagId::Img});
    return layout_node_;
}

uint32_t Node::FindLayoutIndex(const layout::LayoutHandle& parent) const {
    const layout::HandleSpan handles = parent.data().Children();
    if (!parent_) return static_cast<uint32_t>(handles.size());
    const NodeChildren& siblings = parent_->children_;
    const size_t own_index = GetIndexInParent();
    // Behind the nearest sibling that has a handle. That one comes as far from the front as among the
    // siblings but for those without a handle, and children that arrive in order come behind the last one.
    for (size_t i = own_index; i-- > 0;) {
        ++document_->work.siblingsSearched;
        if (!siblings[i]->Is(kInLayoutTree)) continue;
        const layout::HandlePtr& before = siblings[i]->layout_node_;
        if (!handles.empty() && handles.back() == before) return static_cast<uint32_t>(handles.size());
        for (size_t place = std::min<size_t>(i + 1, handles.size()); place > 0; --place) {
            ++document_->work.siblingsSearched;
            if (handles[static_cast<uint32_t>(place - 1)] == before) return static_cast<uint32_t>(place);
        }
        break;
    }
    // Nobody before it has one: in front of the first one behind it that does, which is the first of all.
    for (size_t i = own_index + 1; i < siblings.size(); ++i) {
        ++document_->work.siblingsSearched;
        if (!siblings[i]->Is(kInLayoutTree)) continue;
        for (uint32_t place = 0; place < handles.size(); ++place) {
            ++document_->work.siblingsSearched;
            if (handles[place] == siblings[i]->layout_node_) return place;
        }
        break;
    }
    return handles.size();
}

void Node::MarkLayoutDirty() {
    if (layout_node_ && IsInDocument()) document_->QueueLayoutChange(*this);
    // The next solve reports a layout change for this node. Its properties stay clean: a child that came or
    // went changes none of them, and dirty inherited properties would be looked at in the whole subtree.
    styleSolved = 0;
}

const layout::LayoutResult* Node::GetLayoutResult() const {
    return layout_node_ && Is(kInLayoutTree) ? &layout_node_->data().result : nullptr;
}

const layout::BoxResult* Node::GetBoxResult() const {
    const bool has_box = layout_node_ && Is(kInLayoutTree) && layout_node_->data().isBox;
    return has_box ? &layout_node_->data().AsBox().result : nullptr;
}

layout::ScrollPosition Node::ClampScroll(layout::ScrollPosition wanted) const {
    const layout::LayoutResult* outer = GetLayoutResult();
    const layout::BoxResult* box = GetBoxResult();
    if (!box) return wanted;
    const layout::Edges& border = box->edges.border();
    const float width = outer->width - border.left - border.right;
    const float height = outer->height - border.top - border.bottom;
    const float max_x = std::max(0.0f, box->scrollSize.width - width);
    const float max_y = std::max(0.0f, box->scrollSize.height - height);
    return {std::clamp(wanted.x, 0.0f, max_x), std::clamp(wanted.y, 0.0f, max_y)};
}

// What a smaller box cut off is gone, also when the box grows again.
layout::ScrollPosition Node::KeepScrollInside() {
    return rare_ ? rare_->scroll = ClampScroll(rare_->scroll) : layout::ScrollPosition();
}

float Node::GetScrollLeft() {
    return KeepScrollInside().x;
}

float Node::GetScrollTop() {
    return KeepScrollInside().y;
}

void Node::SetScrollLeft(float value) {
    SetScroll({value, GetStoredScroll().y});
}
void Node::SetScrollTop(float value) {
    SetScroll({GetStoredScroll().x, value});
}

void Node::SetScroll(layout::ScrollPosition wanted) {
    if (!std::isfinite(wanted.x) || !std::isfinite(wanted.y)) return;
    const layout::ScrollPosition clamped = ClampScroll(wanted);
    const layout::ScrollPosition before = GetStoredScroll();
    if (layout::Near(clamped.x, before.x) && layout::Near(clamped.y, before.y)) return;
    EnsureRareData().scroll = clamped;
    if (!layout_node_ || !IsInDocument()) return;
    document_->GetLayoutTree().SetScroll(*layout_node_, clamped);
    document_->QueueTransformChange(*this);
}

float Node::GetScrollWidth() const {
    const layout::BoxResult* box = GetBoxResult();
    return box ? std::max(box->scrollSize.width, GetLayoutResult()->width) : 0;
}

float Node::GetScrollHeight() const {
    const layout::BoxResult* box = GetBoxResult();
    return box ? std::max(box->scrollSize.height, GetLayoutResult()->height) : 0;
}

}  // namespace qorvex::dom
