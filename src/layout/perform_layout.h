// The bodies of a frame's layout tasks. Layout thread, one task of a view at a time.
#pragma once

#include "css/values/length_context.h"
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
    uint32_t viewWidth = 0;
    uint32_t viewHeight = 0;
    dsp::DirtyRegion& dirty;
    FlexAlgorithm algorithm = FlexAlgorithm::Yoga;
    bool disableFlexBasisUnits = false;
    // False under --dont-snap-to-integer-coords-before-transform.
    bool snapToPixels = true;
    // Visit the whole tree instead of what changed: after a resize, and in tests as the slow path that the
    // fast one is compared with. PerformLayout sets it when the view or the root font changed.
    bool everything = false;
};

// em and rem are the root's font size; em is then set per node.
css::LengthContext MakeLengthContext(const LayoutPass& pass);

// Body of the task Layout.
void PerformLayout(LayoutPass& pass);
// Body of the task UpdateNodeTransforms.
void UpdateNodeTransforms(LayoutPass& pass);
// Body of the task UpdateNodeFlags. RecalculateVisualStyle (display/visual_style.h) always follows.
void UpdateNodeFlags(LayoutPass& pass);

}  // namespace qorvex::layout
