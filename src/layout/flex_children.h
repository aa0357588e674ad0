// Keeps Yoga's child lists equal to the children of the layout nodes. Runs in the commit.
#pragma once

#include "layout/layout_handle.h"

namespace qorvex::layout {

// Makes the flex children of `handle` those of its node, with the fewest insertions that a common prefix and
// suffix allow. Children of measured nodes and of nodes at the depth limit stay out.
void SyncFlexChildren(LayoutHandle& handle);

// Renumbers the children of `handle` and, where their depth changed, everything below them.
void UpdateDepths(LayoutHandle& handle);

}  // namespace qorvex::layout
