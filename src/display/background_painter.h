// Draws the background colour and images of a box, and its border image.
#pragma once

#include "display/box.h"
#include "display/box_shape.h"
#include "display/paint_context.h"

#include <fresco/command_buffer.h>

namespace qorvex::dsp {

void PaintBackgroundColor(const layout::LayoutNode& node, const BoxShape& shape,
                          fresco::CommandBuffer& buffer);
void PaintBackgroundImages(PaintContext& context, const layout::LayoutNode& node, const BoxShape& shape,
                           const ImageSlots* slots, fresco::CommandBuffer& buffer);
// False when there is no border image to draw, and the border of the style shows.
bool PaintBorderImage(const layout::LayoutNode& node, const BoxShape& shape, const ImageSlots* slots,
                      fresco::CommandBuffer& buffer);

}  // namespace qorvex::dsp
