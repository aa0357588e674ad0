// Border images: the nine parts of an image around and in a box (CSS Backgrounds 3, section 6).
#pragma once

#include "css/values/length_context.h"
#include "display/box.h"
#include "display/box_shape.h"
#include "display/paint_context.h"

#include <fresco/command_buffer.h>

namespace qorvex::dsp {

// Slices, widths, outsets and the geometry of a gradient source, in pixels. Nothing for a box without a
// border image.
void ResolveBorderImage(const layout::LayoutNode& node, const layout::Rect& box,
                        const css::LengthContext& lengths, ResolvedVisuals& out);

// False when there is no border image to draw, and the border of the style shows.
bool PaintBorderImage(PaintContext& context, const layout::LayoutNode& node, const BoxShape& shape,
                      const ImageSlots* slots, fresco::CommandBuffer& buffer);

}  // namespace qorvex::dsp
