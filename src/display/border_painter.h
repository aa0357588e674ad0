// Draws solid borders from the analysis of a box.
#pragma once

#include "display/box_shape.h"
#include "display/paint_context.h"

#include <fresco/command_buffer.h>

namespace qorvex::dsp {

void PaintBorder(PaintContext& context, const BoxShape& shape, fresco::CommandBuffer& buffer);

}  // namespace qorvex::dsp
