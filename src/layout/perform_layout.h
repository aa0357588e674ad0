// The bodies of a frame's layout tasks. Layout thread, one task of a view at a time.
#pragma once

#include "layout/layout_handle.h"
#include "layout/layout_update.h"

namespace qorvex::layout {

enum class FlexAlgorithm : uint8_t {
    Yoga = 0,
    // Boxes of the previous layout stay; only transforms, bounds and dirty areas are refreshed.
    Internal = 1,
};

// What every layout task of one frame works on. Borrowed for the call; the frame keeps it alive.
struct LayoutPass {
    LayoutUpdateData& update;
    LayoutHandle* root = nullptr;  // null: the document has no tree, every task does nothing
    uint32_t view_width = 0;
    uint32_t view_height = 0;
    dsp::DirtyRegion& dirty;
    FlexAlgorithm algorithm = FlexAlgorithm::Yoga;
    bool disable_flex_basis_units = false;
    // False under --dont-snap-to-integer-coords-before-transform.
    bool snap_to_pixels = true;
};

// Body of the task Layout.
void PerformLayout(LayoutPass& pass);
// Body of the task UpdateNodeTransforms.
void UpdateNodeTransforms(LayoutPass& pass);
// Body of the task UpdateNodeFlags.
void UpdateNodeFlags(LayoutPass& pass);
// Body of the task RecalculateVisualStyle.
void RecalculateVisualStyle(LayoutPass& pass);

// Facts that follow from style alone, refreshed at the start of every pass.
NodeFlags ComputeNodeFlags(const LayoutNode& node);

}  // namespace qorvex::layout
