// The two phases of a node's mask image around its content.
#pragma once

#include "display/paint_context.h"

#include <fresco/command_buffer.h>

namespace qorvex::dsp {

enum class MaskState : uint8_t { None, Ready, Hold };

// Before the content: Hold while the image is not there, and then nothing of the node is painted.
MaskState PrepareMask(const layout::LayoutNode& node);
// After the content, inside the node's layer: multiplies what the layer holds by the mask.
void ApplyMask(const layout::LayoutNode& node, PaintContext& context, fresco::CommandBuffer& buffer);

}  // namespace qorvex::dsp
