// The order in which the nodes of one stacking context paint.
//
// From back to front: negative z-index contexts; in-flow content in tree order; positioned content and
// z-index 0 contexts in tree order, however deep; positive z-index contexts (CSS 2.1, appendix E, without
// floats).
#pragma once

#include "core/memory/containers.h"
#include "layout/layout_handle.h"

#include <span>

namespace qorvex::dsp {

struct PaintEntry {
    const layout::LayoutNode* node = nullptr;
    int32_t zIndex = 0;
    uint32_t layer = 0;  // 0 for in-flow content, 1 for positioned content and contexts
    uint32_t order = 0;  // tree order
};

using PaintList = TempVector<PaintEntry>;

// Lists what paints below `context`, which is a stacking context, a clip or the root. Children of entries
// that are contexts or clips are left to the recursion of those entries. With a cull rectangle (view
// coordinates), what cannot touch it is left out.
void CollectPaintOrder(const layout::LayoutNode& context, std::span<const layout::Rect> cull, PaintList& out);

// A plain node paints by itself; a context or clip recurses.
inline bool PaintsAsUnit(const layout::LayoutNode& node) {
    return node.establishesStackingContext || node.flags.shouldOverflowClip;
}

}  // namespace qorvex::dsp
