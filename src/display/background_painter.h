// Draws the background colour and images of a box.
#pragma once

#include "display/box.h"
#include "display/box_shape.h"
#include "display/paint_context.h"

#include <fresco/command_buffer.h>

namespace qorvex::dsp {

// The whole of a box with a colour and nothing else.
void PaintPlainColor(const layout::LayoutNode& node, bool snapToPixels, fresco::CommandBuffer& buffer);
void PaintBackgroundColor(const layout::LayoutNode& node, const BoxShape& shape,
                          fresco::CommandBuffer& buffer);
void PaintBackgroundImages(PaintContext& context, const layout::LayoutNode& node, const BoxShape& shape,
                           const ImageSlots* slots, fresco::CommandBuffer& buffer);

}  // namespace qorvex::dsp
