#include "layout/layout_tree.h"

#include "core/memory/temp_vector.h"
#include "display/dirty_region.h"
#include "layout/layout_store.h"
#include "layout/node_flags.h"

#include <algorithm>

namespace qorvex::layout {

LayoutTree::LayoutTree() : store_(MakeRef<LayoutStore>()) {}

LayoutTree::~LayoutTree() {
    Clear(nullptr);
}

HandlePtr LayoutTree::Create(NewNode&& node) {
    HandlePtr handle =
        store_->MakeHandle(!(node.display && node.display->Has(dsp::IDisplayElement::kIsText)));
    LayoutData& data = handle->data();
    data.style = &node.style;
    // The first commit carries everything.
    data.written.AddAll();
    data.node = std::move(node.link);
    data.isImage = node.isImage;
    SetDisplayFlags(data.flags, node.display.get());
    if (data.isBox) {
        data.AsBox().scroll = node.scroll;
        data.AsBox().display = std::move(node.display);
    } else {
        // No task knows of the handle yet.
        handle->node().display = std::move(node.display);
    }
    data.changed = true;
    changed_.Insert(handle.get());
    return handle;
}

HandlePtr LayoutTree::CreateRoot(NewNode&& node) {
    Clear(nullptr);
    root_ = Create(std::move(node));
    root_->data().inTree = true;
    if (root_->data().node) root_->data().node->SetInLayoutTree(true);
    return root_;
}

HandlePtr LayoutTree::AddChild(LayoutHandle& parent, uint32_t index, NewNode&& node) {
    HandlePtr handle = Create(std::move(node));
    Attach(*handle, parent, index);
    return handle;
}

void LayoutTree::Attach(LayoutHandle& handle, LayoutHandle& parent, uint32_t index) {
    LayoutData& data = handle.data();
    if (data.inTree) Remove(handle, nullptr);
    HandleVector& siblings = parent.data().AsBox().children;
    siblings.insert(siblings.begin() + std::min<uint32_t>(index, siblings.size()), HandlePtr(&handle));
    data.parent = &parent;
    data.inTree = true;
    data.changed = true;
    if (data.node) data.node->SetInLayoutTree(true);
    if (removed_.Erase(&handle) && !data.isBox) textsMoved_ = true;
    changed_.Insert(&handle);
    changed_.Insert(&parent);
}

// The whole subtree falls apart into single handles: each of its nodes is attached again, if at all, by
// itself, and no handle is left that points at a parent which may die before it.
void LayoutTree::Remove(LayoutHandle& handle, dsp::DirtyRegion* dirty) {
    if (!handle.data().inTree) return;
    if (LayoutHandle* parent = handle.data().parent) {
        HandleVector& siblings = parent->data().AsBox().children;
        // From both ends: children that go one after another do so from the first or from the last.
        for (uint32_t front = 0, back = siblings.size(); front < back; ++front) {
            const bool isFront = siblings[front].get() == &handle;
            if (!isFront && siblings[--back].get() != &handle) continue;
            removed_.Insert(&handle);
            siblings.erase(siblings.begin() + (isFront ? front : back));
            break;
        }
        changed_.Insert(parent);
    }
    const TempMark mark;
    TempVector<LayoutHandle*> queue;
    removed_.Insert(&handle);
    queue.push_back(&handle);
    for (uint32_t next = 0; next < queue.size(); ++next) {
        LayoutData& data = queue[next]->data();
        data.inTree = false;
        data.parent = nullptr;
        if (data.node) data.node->SetInLayoutTree(false);
        // What a text covered the next commit finds out.
        if (!data.isBox) continue;
        BoxData& box = data.AsBox();
        if (dirty != nullptr) dirty->Add(box.result.visualAabb);
        for (HandlePtr& child : box.children) {
            removed_.Insert(child.get());
            queue.push_back(child.get());
        }
        box.children.clear();
    }
    if (root_ == &handle) root_.reset();
}

void LayoutTree::Clear(dsp::DirtyRegion* dirty) {
    if (root_) Remove(*root_, dirty);
    root_.reset();
    changed_.Clear();
}

void LayoutTree::MarkChanged(LayoutHandle& handle) {
    handle.data().changed = true;
    changed_.Insert(&handle);
}

void LayoutTree::UpdateStyle(LayoutHandle& handle, const css::LaidOutStyle& style,
                             css::WrittenGroups written) {
    LayoutData& data = handle.data();
    data.style = &style;
    data.written |= written;
    changed_.Insert(&handle);
}

void LayoutTree::SetScroll(LayoutHandle& handle, ScrollPosition scroll) {
    handle.data().AsBox().scroll = scroll;
    MarkChanged(handle);
}

void LayoutTree::SetDisplayElement(LayoutHandle& handle, dsp::DisplayElementPtr display) {
    LayoutData& data = handle.data();
    data.AsBox().display = std::move(display);
    SetDisplayFlags(data.flags, data.AsBox().display.get());
    MarkChanged(handle);
}

}  // namespace qorvex::layout
