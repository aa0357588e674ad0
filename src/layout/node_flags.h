// Facts that follow from a node's style alone, refreshed at the start of every pass.
#pragma once

#include "layout/layout_handle.h"

namespace qorvex::layout {

void RefreshNodeFlags(LayoutNode& node);
// Those that follow from the display element, which may be null.
void SetDisplayFlags(NodeFlags& flags, const dsp::IDisplayElement* display);

}  // namespace qorvex::layout
