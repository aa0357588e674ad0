// Text of the layout tree and of the stacking contexts, for tests and for people. Layout side idle, any
// thread.
#pragma once

#include "core/memory/containers.h"
#include "layout/layout_handle.h"

namespace qorvex::dsp {

// One line a node: depth as indentation, name, box, flags.
String DumpLayoutTree(const layout::LayoutHandle& root);
// The paint order of every stacking context, nested.
String DumpStackingContexts(const layout::LayoutHandle& root);

}  // namespace qorvex::dsp
