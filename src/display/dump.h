// Text of the layout tree and of the stacking contexts, for tests and for people. Any thread, while the
// layout side is idle.
#pragma once

#include "core/memory/containers.h"
#include "layout/layout_handle.h"

namespace qorvex::dsp {

using DumpText = TaggedString<MemoryTag::DebugDump>;

// One line a node in tree order: display, box, flags.
DumpText DumpLayoutTree(const layout::LayoutHandle& root);
// One line a node in paint order; what a context or clip paints by itself is indented below it.
DumpText DumpStackingContexts(const layout::LayoutHandle& root);

}  // namespace qorvex::dsp
