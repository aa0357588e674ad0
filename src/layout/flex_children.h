// Keeps Yoga's child lists equal to the children of the layout nodes. Runs in the commit.
#pragma once

#include "layout/handle_set.h"
#include "layout/layout_handle.h"

namespace qorvex::layout {

// Makes the flex children of `handle` those of its node, with the fewest insertions that a common prefix and
// suffix allow. Children of measured nodes and of nodes at the depth limit stay out. Children that Yoga did
// not know before get their flex nodes, and so does all that lies below them; a handle without one is left
// alone. What comes anew and is not among `changed` needs its style written, which the store then notes.
void SyncFlexChildren(LayoutHandle& handle, const HandleSet& changed);

// Gives the handle and all below it flex nodes. True when it had none: then no style was written to them yet.
bool EnsureFlexTree(LayoutHandle& handle);

// Renumbers children and depths from `top` down: through the changed handles below it, and through everything
// whose depth came out different. Flex children of handles that did not change are synced on the way; those
// of changed ones wait until all depths are known.
void UpdateDepths(LayoutHandle& top, const HandleSet& changed);

}  // namespace qorvex::layout
