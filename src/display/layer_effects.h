// The layer that a node needs around its paint, with its filters, blend mode and custom effect.
#pragma once

#include "display/paint_context.h"
#include "layout/layout_handle.h"

#include <fresco/command_buffer.h>

namespace qorvex::dsp {

bool NeedsLayer(const layout::LayoutNode& node);
// Both return the buffer that takes the commands that follow.
fresco::CommandBuffer* OpenLayer(const layout::LayoutNode& node, PaintContext& context,
                                 fresco::CommandBuffer* buffer);
fresco::CommandBuffer* CloseLayer(const layout::LayoutNode& node, fresco::CommandBuffer* buffer);

}  // namespace qorvex::dsp
