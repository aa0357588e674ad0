// Facts that follow from a node's style alone, refreshed at the start of every pass.
#pragma once

#include "layout/layout_handle.h"

namespace qorvex::layout {

void RefreshNodeFlags(LayoutNode& node);

}  // namespace qorvex::layout
