// Records one node with its subtree: transforms, layers, clips and scrolling around the paint of display
// elements.
//
// Invariant: every call leaves the transform and clip of the buffer as it found them; the current transform
// inside a node is the node's world matrix. Recursion happens at stacking contexts and clips only and is
// bounded by kMaxLayoutDepth.
#pragma once

#include "display/paint_context.h"
#include "layout/layout_handle.h"

#include <fresco/command_buffer.h>

#include <span>

namespace qorvex::dsp {

// What touches none of `areas` (view coordinates, at most DirtyRegion::kScissorCount) is left out.
void RecordNode(const layout::LayoutNode& node, PaintContext& context, std::span<const layout::Rect> areas,
                fresco::CommandBuffer* buffer);

}  // namespace qorvex::dsp
