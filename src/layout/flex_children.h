// Keeps Yoga's child lists equal to the children of the layout nodes. Runs in the commit.
#pragma once

#include "layout/handle_set.h"
#include "layout/layout_handle.h"

namespace qorvex::layout {

// Makes the flex children of `handle` those of its node, with the fewest insertions that a common prefix and
// suffix allow. Children of measured nodes and of nodes at the depth limit stay out.
void SyncFlexChildren(LayoutHandle& handle);

// Renumbers children and depths from `top` down: through the changed handles below it, and through everything
// whose depth came out different. Flex children of handles that did not change are synced on the way; those
// of changed ones wait until all depths are known.
void UpdateDepths(LayoutHandle& top, const HandleSet& changed);

}  // namespace qorvex::layout
