// The order in which the nodes of one stacking context paint.
//
// From back to front: contexts of negative z-index; in-flow content in tree order; positioned content and
// contexts of z-index 0 in tree order, however deep; contexts of positive z-index (CSS 2.1, appendix E,
// without floats). A positioned node that is no context paints together with its own in-flow content, as one
// layer.
//
// Children of a node that preserves 3D paint from the farthest to the nearest, by the middle of their boxes;
// only what is equally near keeps the order above. Planes that cross are not cut, and the node's own content
// stays behind all of them.
#pragma once

#include "core/memory/temp_vector.h"
#include "layout/prefetch.h"
#include "layout/work_counters.h"

#include <algorithm>
#include <span>

namespace qorvex::dsp {

struct PaintEntry {
    const layout::LayoutNode* node = nullptr;
    int32_t zIndex = 0;
    uint32_t layer =
        0;  // 0: in flow; else the tree order of the positioned node or context that it paints with
    uint32_t order = 0;  // tree order
    int32_t depth = 0;   // larger is nearer; 0 for all where space is flat
    // All below paints in tree order right after the node, and is not listed.
    bool withSubtree = false;
};

using PaintList = TempVector<PaintEntry>;

// Lists what paints below `context`, which is a stacking context, a clip or the root. Children of entries
// that are contexts or clips are left to the recursion of those entries. What touches none of the rectangles
// in `areas` (view coordinates) is left out with its subtree; no rectangles ask for everything.
void CollectPaintOrder(const layout::LayoutNode& context, std::span<const layout::Rect> areas, PaintList& out,
                       layout::WorkCounters& counters);
// The same order, but a plain node over nothing than in-flow content stands for all of its subtree: a page's
// list is as long as its layers ask for.
void CollectPaintRuns(const layout::LayoutNode& context, std::span<const layout::Rect> areas, PaintList& out,
                      layout::WorkCounters& counters);

// A plain node paints by itself; a context or clip recurses.
inline bool PaintsAsUnit(const layout::LayoutNode& node) {
    return node.establishesStackingContext || node.flags.shouldOverflowClip;
}

inline bool TouchesAny(std::span<const layout::Rect> areas, const layout::Rect& rect) {
    if (areas.empty()) return true;
    for (const layout::Rect& area : areas) {
        if (layout::Intersects(area, rect)) return true;
    }
    return false;
}

// Is there nothing below but in-flow content, up to the contexts' and clips' own?
inline bool PaintsInTreeOrder(const layout::LayoutNode& node) {
    return !node.layeredBelow;
}

// Calls visit(child) for the children that may touch the areas.
template <typename Visit>
void ForEachChild(const layout::LayoutNode& parent, std::span<const layout::Rect> areas, Visit&& visit) {
    const layout::HandleSpan children = parent.Children();
    const auto count = static_cast<uint32_t>(children.size());
    for (uint32_t i = 0; i < std::min(count, layout::kNodesAhead); ++i)
        layout::PrefetchPaint(*children[i]);
    const auto visitChild = [&](uint32_t i) {
        if (i + layout::kNodesAhead < count) layout::PrefetchPaint(*children[i + layout::kNodesAhead]);
        visit(children[i]->node());
    };
    if (count > layout::ChildGroups::kFanout) {
        const auto& below = parent.AsBox().below;
        if (below && below->groups && below->groups->Fit(count)) {
            below->groups->Walk([&](const layout::ChildSum& sum) { return TouchesAny(areas, sum.visual); },
                                visitChild);
            return;
        }
    }
    for (uint32_t i = 0; i < count; ++i)
        visitChild(i);
}

}  // namespace qorvex::dsp
