// Draws the box shadows of one box, sharp ones directly and blurred ones through the shadow cache.
#pragma once

#include "display/box_shape.h"
#include "display/paint_context.h"

#include <fresco/command_buffer.h>

namespace qorvex::dsp {

void PaintOuterShadows(PaintContext& context, const layout::LayoutNode& node, const BoxShape& shape,
                       fresco::CommandBuffer& buffer);
void PaintInsetShadows(PaintContext& context, const layout::LayoutNode& node, const BoxShape& shape,
                       fresco::CommandBuffer& buffer);

}  // namespace qorvex::dsp
