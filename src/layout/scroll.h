// Limits of a node's scroll position.
#pragma once

#include "layout/layout_handle.h"

namespace qorvex::layout {

// A position beyond what the content of a clipping node allows becomes the limit; NaN and negative positions
// become 0. Nodes that do not clip cannot scroll.
ScrollPosition ClampScroll(ScrollPosition position, const LayoutNode& node);

}  // namespace qorvex::layout
