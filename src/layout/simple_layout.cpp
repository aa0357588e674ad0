#include "layout/simple_layout.h"

#include "core/memory/temp_vector.h"
#include "display/display_paragraph.h"
#include "layout/flex_children.h"
#include "layout/flex_measure.h"
#include "layout/flex_results.h"
#include "layout/flex_style.h"
#include "layout/layout_store.h"
#include "layout/length_bounds.h"
#include "layout/node_flags.h"

#include <yoga/Yoga.h>

#include <limits>

namespace qorvex::layout {

using css::LayoutStyle;
using css::LengthContext;

namespace {

constexpr float kUnknown = std::numeric_limits<float>::quiet_NaN();

float Resolve(const css::Extent& extent, const LengthContext& lengths, float base) {
    return BoundResult(BoundLength(css::ResolveExtent(extent, lengths, base, 0)));
}
float Resolve(const css::Length& length, const LengthContext& lengths, float base) {
    return BoundResult(BoundLength(css::ResolveLength(length, lengths, base)));
}

struct Containers {
    const LayoutNode* positioned;  // null only for the root
    LayoutHandle* fixed;           // null: the view
};

Rect ContainingBox(const LayoutNode& node, const Containers& in, const LengthContext& lengths) {
    if (node.flags.isFixed) {
        if (in.fixed != nullptr) return Inset(in.fixed->node().box, in.fixed->node().border());
        return {0, 0, 0, lengths.vw * 100, lengths.vh * 100};
    }
    if (node.flags.isAbsolute && in.positioned != nullptr)
        return Inset(in.positioned->box, in.positioned->border());
    if (node.parent == nullptr) return {0, 0, 0, lengths.vw * 100, lengths.vh * 100};
    const LayoutNode& parent = node.parent->node();
    return Inset(Inset(parent.box, parent.border()), parent.padding());
}

void ResolveEdges(LayoutHandle& handle, const LayoutStyle& style, const LengthContext& lengths, float base) {
    if (!handle.node().isBox) return;
    BoxEdges edges;
    edges.border = ResolveBorders(style, lengths);
    // Stored for scripts; in this engine margins move nothing.
    edges.margin = {Resolve(style.marginLeft, lengths, base), Resolve(style.marginRight, lengths, base),
                    Resolve(style.marginTop, lengths, base), Resolve(style.marginBottom, lengths, base)};
    edges.padding = {Resolve(style.paddingLeft, lengths, base), Resolve(style.paddingRight, lengths, base),
                     Resolve(style.paddingTop, lengths, base), Resolve(style.paddingBottom, lengths, base)};
    handle.node().AsBox().edges.Set(edges, handle.store().recentEdges);
}

Point PlaceIn(const Rect& in, const LayoutNode& node, const LayoutStyle& style,
              const LengthContext& lengths) {
    Point place{in.x, in.y};
    if (!node.flags.isPositioned) return place;
    place.x += Resolve(style.left, lengths, in.width);
    place.y += Resolve(style.top, lengths, in.height);
    return place;
}

// Extents of the in-flow children add up, although the children overlap.
void FitAutoSizes(LayoutNode& node, const LayoutStyle& style) {
    if (node.flags.measuredByDisplayElement || node.flags.isReplaced) return;
    if (style.width.IsLength() && style.height.IsLength()) return;
    Size sum{node.padding().left + node.padding().right + node.border().left + node.border().right,
             node.padding().top + node.padding().bottom + node.border().top + node.border().bottom};
    for (const HandlePtr& child : node.Children()) {
        const LayoutNode& flow = child->node();
        if (flow.flags.isAbsolute || flow.flags.isFixed) continue;
        sum.width += flow.box.width;
        sum.height += flow.box.height;
    }
    if (!style.width.IsLength()) node.box.width = sum.width;
    if (!style.height.IsLength()) node.box.height = sum.height;
}

// Given sides are those of the border box; open ones follow from the picture.
Size SizeReplaced(LayoutHandle& handle, const LayoutStyle& style, const LengthContext& lengths,
                  const Rect& containing) {
    const LayoutNode& node = handle.node();
    const Edges &border = node.border(), &padding = node.padding();
    const float across = border.left + border.right + padding.left + padding.right;
    const float down = border.top + border.bottom + padding.top + padding.bottom;
    const auto inner = [&](const css::Extent& side, float base, float edges) {
        return side.IsLength() ? std::max(ResolveExtent(side, lengths, base, 0) - edges, 0.0f) : kUnknown;
    };
    const auto mode = [](const css::Extent& side) {
        return side.IsLength() ? dsp::MeasureMode::Exactly : dsp::MeasureMode::Undefined;
    };
    Size size;
    node.display->Measure(handle, inner(style.width, containing.width, across),
                          inner(style.height, containing.height, down), mode(style.width), mode(style.height),
                          size);
    return {size.width + across, size.height + down};
}

// A paragraph reads edges and sizes of what it flows from the nodes of the flex engine.
void SyncFlow(LayoutHandle& paragraph, LayoutPass& pass, const LengthContext& lengths) {
    EnsureFlexTree(paragraph);
    FlexStyleContext context{lengths, false, pass.root};
    const TempMark mark;
    TempVector<LayoutHandle*> queue;
    queue.push_back(&paragraph);
    for (uint32_t next = 0; next < queue.size(); ++next) {
        SyncStyleToYoga(*queue[next], context);
        for (const HandlePtr& child : queue[next]->node().Children())
            queue.push_back(child.get());
    }
    dsp::InvalidateParagraphs(paragraph);
}

void LayoutSimpleSubtree(LayoutHandle& handle, LayoutPass& pass, LengthContext lengths, Containers in) {
    LayoutNode& node = handle.node();
    if (node.IsBeyondLimit()) return;
    handle.store().FreeFlexNode(node);
    RefreshNodeFlags(node);
    const LayoutStyle& style = *node.style->layout;
    const OldBox old(node);
    lengths.em = node.style->text->computedFontSize;
    const Rect containing = ContainingBox(node, in, lengths);
    ResolveEdges(handle, style, lengths, containing.width);
    const Point place = PlaceIn(containing, node, style, lengths);
    node.box.x = place.x;
    node.box.y = place.y;
    if (node.flags.measuredByDisplayElement) {
        if (node.display->Has(dsp::IDisplayElement::kFlowsChildren)) SyncFlow(handle, pass, lengths);
        Size size;
        node.display->Measure(handle, kUnknown, kUnknown, dsp::MeasureMode::Undefined,
                              dsp::MeasureMode::Undefined, size);
        ++pass.update.counters.measured;
        node.box.width = BoundSize(size.width);
        node.box.height = BoundSize(size.height);
    } else if (node.flags.isReplaced) {
        const Size size = SizeReplaced(handle, style, lengths, containing);
        node.box.width = BoundSize(size.width);
        node.box.height = BoundSize(size.height);
    } else {
        node.box.width = BoundSize(Resolve(style.width, lengths, containing.width));
        node.box.height = BoundSize(Resolve(style.height, lengths, containing.height));
    }
    const Containers below{node.flags.isPositioned || in.positioned == nullptr ? &node : in.positioned,
                           node.flags.containsFixedDescendants ? &handle : in.fixed};
    if (node.display && node.display->Has(dsp::IDisplayElement::kFlowsChildren)) {
        static_cast<dsp::DisplayParagraph&>(*node.display).PlaceContent(handle, pass);
        NoteBoxChange(handle, old, pass);
        return;
    }
    for (const HandlePtr& child : node.Children()) {
        LayoutNode& childNode = child->node();
        if (childNode.style->layout->display != css::CSSDisplay::Flex) {
            LayoutSimpleSubtree(*child, pass, lengths, below);
            continue;
        }
        RefreshNodeFlags(childNode);
        LengthContext own = lengths;
        own.em = childNode.style->text->computedFontSize;
        const Rect box = ContainingBox(childNode, below, own);
        LayoutFlexInSimple(lengths, pass, *child, PlaceIn(box, childNode, *childNode.style->layout, own),
                           below.fixed);
    }
    FitAutoSizes(node, style);
    NoteBoxChange(handle, old, pass);
}

// The top-most changed handle on the way from `handle` to the root, and the containers above it.
LayoutHandle* TopMostChanged(LayoutHandle& handle, const LayoutPass& pass) {
    LayoutHandle* top = &handle;
    for (LayoutHandle* parent = handle.node().parent; parent != nullptr; parent = parent->node().parent) {
        const LayoutNode& node = parent->node();
        // Inside a flex element the run of Yoga begins at that element.
        // Inside a paragraph the lines begin at that paragraph.
        const bool flows = node.display && node.display->Has(dsp::IDisplayElement::kFlowsChildren);
        if (pass.update.changed.Contains(parent) || node.style->layout->display == css::CSSDisplay::Flex ||
            flows)
            top = parent;
    }
    return top;
}

Containers ContainersAbove(const LayoutHandle& handle, const LayoutPass& pass) {
    Containers found{nullptr, nullptr};
    for (LayoutHandle* parent = handle.node().parent; parent != nullptr; parent = parent->node().parent) {
        const LayoutNode& node = parent->node();
        if (found.positioned == nullptr && node.flags.isPositioned) found.positioned = &node;
        if (found.fixed == nullptr && node.flags.containsFixedDescendants) found.fixed = parent;
    }
    if (found.positioned == nullptr && &handle != pass.root) found.positioned = &pass.root->node();
    return found;
}

void LayoutFrom(LayoutHandle& handle, LayoutPass& pass, const LengthContext& lengths) {
    const Containers above = ContainersAbove(handle, pass);
    LayoutNode& node = handle.node();
    if (node.style->layout->display != css::CSSDisplay::Flex) {
        LayoutSimpleSubtree(handle, pass, lengths, above);
        return;
    }
    RefreshNodeFlags(node);
    LengthContext own = lengths;
    own.em = node.style->text->computedFontSize;
    const Point place = PlaceIn(ContainingBox(node, above, own), node, *node.style->layout, own);
    LayoutFlexInSimple(lengths, pass, handle, place, above.fixed);
}

}  // namespace

void PerformSimpleLayout(LayoutPass& pass, const LengthContext& lengths, bool everything) {
    pass.update.changed.ForEach([](LayoutHandle& handle) { RefreshNodeFlags(handle.node()); });
    if (everything) {
        LayoutFrom(*pass.root, pass, lengths);
        return;
    }
    HandleSet done;
    pass.update.changed.ForEach([&](LayoutHandle& handle) {
        LayoutHandle* top = TopMostChanged(handle, pass);
        if (done.Contains(pass.root) || !done.Insert(top)) return;
        LayoutFrom(*top, pass, lengths);
    });
}

void LayoutFlexInSimple(const LengthContext& lengths, LayoutPass& pass, LayoutHandle& handle, Point place,
                        LayoutHandle* fixedContainer) {
    FlexStyleContext context{lengths, false, pass.root};
    const bool everything = EnsureFlexTree(handle) || pass.everything;
    const TempMark mark;
    TempVector<LayoutHandle*> queue;
    queue.push_back(&handle);
    for (uint32_t next = 0; next < queue.size(); ++next) {
        LayoutHandle* current = queue[next];
        if (everything || pass.update.changed.Contains(current)) {
            if (SyncStyleToYoga(*current, context)) ++pass.update.counters.synced;
            dsp::InvalidateParagraphs(*current);
        }
        const LayoutNode& node = current->node();
        const bool flows = node.display && node.display->Has(dsp::IDisplayElement::kFlowsChildren);
        if (YGNodeGetChildCount(node.flex) == 0 && !flows) continue;
        for (const HandlePtr& child : current->node().Children())
            queue.push_back(child.get());
    }
    YGNodeRef flex = handle.node().flex;
    YGNodeCalculateLayout(flex, YGUndefined, YGUndefined, YGDirectionLTR);
    pass.update.counters.measured += TakeMeasureCount();
    // The element itself stands where the simple engine puts it; the rest follows relative to it.
    FlexReadRoot root{&handle, fixedContainer, {}, everything};
    root.origin = {place.x - YGNodeLayoutGetLeft(flex), place.y - YGNodeLayoutGetTop(flex)};
    ReadYogaResults(root, pass);
}

}  // namespace qorvex::layout
