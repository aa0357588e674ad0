// What a node paints by itself, told apart once a change instead of once a frame.
#pragma once

#include "layout/layout_handle.h"

namespace qorvex::dsp {

// layout::OwnPaint bits; 0 for a node that shows nothing of its own.
uint8_t FindOwnPaint(const layout::LayoutNode& node);

}  // namespace qorvex::dsp
