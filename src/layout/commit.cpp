// The crossing from the DOM side to the layout side: runs on the DOM thread while no layout task of the view
// runs.
#include "css/values/style_groups.h"
#include "display/dirty_region.h"
#include "display/transforms.h"
#include "layout/debug_names.h"
#include "layout/flex_children.h"
#include "layout/layout_store.h"
#include "layout/layout_tree.h"

#include <yoga/Yoga.h>

#include <algorithm>
#include <utility>

namespace qorvex::layout {

namespace {

bool SameChildren(const HandleVector& a, const HandleVector& b) {
    return a.size() == b.size() && std::equal(a.begin(), a.end(), b.begin());
}

// A handle that left the tree keeps nothing of it, so that it may be attached anywhere or die alone.
void Sever(LayoutHandle& handle) {
    LayoutNode& node = handle.node();
    node.parent = nullptr;
    node.depth = 0;
    node.absoluteBelow = node.layeredBelow = false;
    node.visualAabb = {};
    if (node.isBox) {
        BoxNode& box = node.AsBox();
        box.children.clear();
        box.below.reset();
        box.paintBounds = {};
    }
    handle.store().FreeFlexNode(node);
}

void CopyBox(const BoxData& data, LayoutNode& node) {
    BoxNode& box = node.AsBox();
    box.zIndex = data.zIndex;
    box.scroll = data.scroll;
    node.display = data.display;
    if (SameChildren(box.children, data.children)) return;
    box.children = data.children;
    // The bounds by groups are made anew: any child may have moved to another one.
    if (box.below && box.below->groups) box.below->groups->Clear();
    node.childrenChanged = true;
}

void CopyToLayoutSide(LayoutHandle& handle, dsp::DirtyRegion* dirty) {
    LayoutData& data = handle.data();
    LayoutNode& node = handle.node();
    data.changed = data.changed || data.written.Has(css::StyleGroup::Visual) ||
                   data.written.Has(css::StyleGroup::TextLayout);
    if (data.changed && data.inTree && dirty != nullptr) {
        dirty->Add(dsp::ClipToAncestors(node));
    }
    if (data.style != nullptr) handle.TakeStyle(*data.style);
    node.flags = data.flags;
    node.parent = data.parent;
    // A layout or transform value may change paint order and stacking although every box stays.
    node.visualChanged = node.visualChanged || data.changed || data.written.Has(css::StyleGroup::Layout) ||
                         data.written.Has(css::StyleGroup::Transform);
    // Text, its font or its element changed: the cached size may be wrong.
    if (data.changed && node.flex && YGNodeHasMeasureFunc(node.flex)) {
        if (dirty == nullptr)
            node.contentChanged = true;
        else
            YGNodeMarkDirty(node.flex);
    }
    data.changed = false;
    data.written.Clear();
    if (data.isBox) CopyBox(data.AsBox(), node);
}

}  // namespace

void LayoutTree::Commit(LayoutUpdateData& update, dsp::DirtyRegion* dirty, DebugNames* names) {
    removed_.ForEach([&](LayoutHandle& handle) {
        if (names != nullptr) names->Erase(&handle);
        changed_.Erase(&handle);
        // The bounds of a subtree's root cover the subtree.
        LayoutHandle* parent = handle.node().parent;
        if (parent == nullptr || parent->data().inTree)
            update.vanished.Add(dsp::ClipToAncestors(handle.node()));
    });
    if (std::exchange(textsMoved_, false)) {
        changed_.ForEach([&](LayoutHandle& handle) {
            const LayoutNode& node = handle.node();
            if (!node.isBox && node.parent != nullptr) update.vanished.Add(dsp::ClipToAncestors(node));
        });
    }
    changed_.ForEach([&](LayoutHandle& handle) {
        CopyToLayoutSide(handle, dirty);
        if (names != nullptr && handle.data().node) names->Set(&handle, handle.data().node->DebugName());
        ++update.counters.committed;
    });
    // Child lists and depths need the parents of all handles in place. One walk from each top-most changed
    // handle keeps deep trees linear.
    changed_.ForEach([&](LayoutHandle& handle) {
        const LayoutHandle* parent = handle.node().parent;
        if (parent == nullptr || !changed_.Contains(parent)) UpdateDepths(handle, changed_);
    });
    changed_.ForEach([&](LayoutHandle& handle) { SyncFlexChildren(handle, changed_); });
    removed_.ForEach([](LayoutHandle& handle) { Sever(handle); });
    changed_.ForEach([](LayoutHandle& handle) { dsp::MarkForTransform(handle); });
    // Two commits may meet before one layout ran; nothing of the first may be lost.
    if (update.changed.Empty()) {
        update.changed.Swap(changed_);
    } else {
        changed_.ForEach([&](LayoutHandle& handle) { update.changed.Insert(&handle); });
    }
    changed_.Clear();
    removed_.Clear();
}

}  // namespace qorvex::layout
