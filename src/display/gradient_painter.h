// Fills rectangles with CSS gradients.
#pragma once

#include "css/values/image_values.h"
#include "display/paint_context.h"
#include "display/resolved_visuals.h"

#include <fresco/command_buffer.h>

namespace qorvex::dsp {

// The layer's tile, moved to the border box at `origin`, repeated over `area`.
void PaintGradientLayer(PaintContext& context, const css::Gradient& gradient, const ResolvedImageLayer& layer,
                        layout::Point origin, const layout::Rect& area, fresco::CommandBuffer& buffer);

}  // namespace qorvex::dsp
