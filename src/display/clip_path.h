// Applies the clip-path of a node to a buffer.
#pragma once

#include "display/paint_context.h"

#include <fresco/command_buffer.h>

namespace qorvex::dsp {

// Intersects the clip with the node's shape. False when nothing of the node can show.
bool ApplyClipPath(const layout::LayoutNode& node, PaintContext& context, fresco::CommandBuffer& buffer);

}  // namespace qorvex::dsp
