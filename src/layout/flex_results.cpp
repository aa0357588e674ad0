#include "layout/flex_results.h"

#include "core/memory/temp_vector.h"
#include "display/display_paragraph.h"
#include "display/transforms.h"
#include "layout/layout_store.h"
#include "layout/length_bounds.h"
#include "layout/prefetch.h"

#include <yoga/Yoga.h>

namespace qorvex::layout {

namespace {

struct Entry {
    LayoutHandle* handle;
    LayoutHandle* fixedContainer;
    Point origin;           // of the parent's box, in the document
    bool containerChanged;  // a containing block above was laid out anew or moved
};

void CopyEdges(YGNodeConstRef flex, float (*get)(YGNodeConstRef, YGEdge), Edges& out) {
    out.left = BoundResult(get(flex, YGEdgeLeft));
    out.right = BoundResult(get(flex, YGEdgeRight));
    out.top = BoundResult(get(flex, YGEdgeTop));
    out.bottom = BoundResult(get(flex, YGEdgeBottom));
}

void CopyMetrics(LayoutNode& node, EdgesCache& cache) {
    node.box.width = BoundSize(YGNodeLayoutGetWidth(node.flex));
    node.box.height = BoundSize(YGNodeLayoutGetHeight(node.flex));
    if (!node.isBox) return;
    BoxEdges edges;
    CopyEdges(node.flex, YGNodeLayoutGetBorder, edges.border);
    CopyEdges(node.flex, YGNodeLayoutGetPadding, edges.padding);
    CopyEdges(node.flex, YGNodeLayoutGetMargin, edges.margin);
    node.AsBox().edges.Set(edges, cache);
}

// The box that a fixed node is placed in: the padding box of its container, or the view.
Rect FixedContainingBox(const Entry& entry, const LayoutPass& pass) {
    if (entry.fixedContainer == nullptr)
        return {0, 0, 0, static_cast<float>(pass.viewWidth), static_cast<float>(pass.viewHeight)};
    const LayoutNode& container = entry.fixedContainer->node();
    return Inset(container.box, container.border());
}

bool IsInset(YGNodeConstRef flex, YGEdge edge) {
    return !std::isnan(YGNodeStyleGetPosition(flex, edge).value);
}

// Yoga has no fixed position: it placed the box as an absolute one, in a box that is not the one meant.
// Insets are in pixels by now (flex_style.cpp), so the place follows from them; without insets the static
// place stands.
void PlaceFixed(LayoutNode& node, const Rect& in, Point origin) {
    const YGNodeConstRef flex = node.flex;
    node.box.x = origin.x + BoundResult(YGNodeLayoutGetLeft(flex));
    node.box.y = origin.y + BoundResult(YGNodeLayoutGetTop(flex));
    if (IsInset(flex, YGEdgeLeft)) {
        node.box.x = in.x + YGNodeStyleGetPosition(flex, YGEdgeLeft).value + node.margin().left;
    } else if (IsInset(flex, YGEdgeRight)) {
        node.box.x = Right(in) - YGNodeStyleGetPosition(flex, YGEdgeRight).value - node.margin().right -
                     node.box.width;
    }
    if (IsInset(flex, YGEdgeTop)) {
        node.box.y = in.y + YGNodeStyleGetPosition(flex, YGEdgeTop).value + node.margin().top;
    } else if (IsInset(flex, YGEdgeBottom)) {
        node.box.y = Bottom(in) - YGNodeStyleGetPosition(flex, YGEdgeBottom).value - node.margin().bottom -
                     node.box.height;
    }
}

void Place(const Entry& entry, LayoutPass& pass) {
    LayoutNode& node = entry.handle->node();
    if (node.flags.isFixed) {
        PlaceFixed(node, FixedContainingBox(entry, pass), entry.origin);
        return;
    }
    // Yoga gives every other box relative to its parent, absolute ones too: it knows their containing block,
    // since static boxes are static to it.
    node.box.x = entry.origin.x + BoundResult(YGNodeLayoutGetLeft(node.flex));
    node.box.y = entry.origin.y + BoundResult(YGNodeLayoutGetTop(node.flex));
}

// Those that Yoga laid out anew, or all.
void PushChildren(const LayoutNode& node, Entry& child, bool all, TempVector<Entry>& stack) {
    const HandleSpan children = node.Children();
    for (auto i = static_cast<uint32_t>(YGNodeGetChildCount(node.flex)); i-- > 0;) {
        if (!all && !YGNodeGetHasNewLayout(YGNodeGetChild(node.flex, i))) continue;
        child.handle = children[i].get();
        PrefetchHandle(*child.handle);
        stack.push_back(child);
    }
}

bool Same(const Rect& a, const Rect& b) {
    return a.x == b.x && a.y == b.y && a.width == b.width && a.height == b.height;
}
bool Same(const Edges& a, const Edges& b) {
    return a.left == b.left && a.right == b.right && a.top == b.top && a.bottom == b.bottom;
}

}  // namespace

void NoteBoxChange(LayoutHandle& handle, const OldBox& old, LayoutPass& pass) {
    LayoutNode& node = handle.node();
    ++pass.update.counters.laidOut;
    // Most boxes that are laid out again only say that they stay.
    if (Same(old.box, node.box) && Same(old.border, node.border()) && Same(old.padding, node.padding()))
        return;
    const bool metrics = !Near(old.box.width, node.box.width) || !Near(old.box.height, node.box.height) ||
                         !Near(old.border, node.border()) || !Near(old.padding, node.padding());
    if (metrics) node.boxMetricsChanged = true;
    const bool moved = !Same(old.box, node.box) && !Near(SnapToPixels(old.box), SnapToPixels(node.box));
    if (moved) node.rectChanged = true;
    const bool shifted = old.box.x != node.box.x || old.box.y != node.box.y;
    if (!metrics && !moved && !shifted) return;
    pass.update.updated.Add(handle);
    dsp::MarkForTransform(handle);
}

void ReadYogaResults(const FlexReadRoot& root, LayoutPass& pass) {
    const TempMark mark;
    // Depth first, as Yoga's nodes lie in memory.
    TempVector<Entry> stack;
    stack.push_back({root.handle, root.fixedContainer, root.origin, root.everything});
    while (!stack.empty()) {
        const Entry entry = stack.back();
        stack.pop_back();
        LayoutNode& node = entry.handle->node();
        const OldBox old(node);
        const bool isNew = YGNodeGetHasNewLayout(node.flex);
        if (isNew) {
            CopyMetrics(node, entry.handle->store().recentEdges);
            YGNodeSetHasNewLayout(node.flex, false);
        }
        Place(entry, pass);
        const bool moved = node.box.x != old.box.x || node.box.y != old.box.y;
        if (isNew || moved) NoteBoxChange(*entry.handle, old, pass);

        const bool placed = isNew || moved || root.everything;
        if (placed && node.display && node.display->Has(dsp::IDisplayElement::kFlowsChildren))
            static_cast<dsp::DisplayParagraph&>(*node.display).PlaceContent(*entry.handle, pass);

        Entry child = entry;
        child.origin = {node.box.x, node.box.y};
        if (node.flags.containsFixedDescendants) child.fixedContainer = entry.handle;
        // Sticky: a nearer container that stayed does not tell what a farther one, of a fixed box, did.
        child.containerChanged = entry.containerChanged || isNew || moved;
        const bool carriesAll = root.everything || moved || (child.containerChanged && node.absoluteBelow);
        if (carriesAll || isNew) PushChildren(node, child, carriesAll, stack);
    }
}

}  // namespace qorvex::layout
