// The style of one text node, from its parent alone.
#pragma once

#include "css/style/style_run.h"

namespace qorvex::css {

// dom::ChangeMask bits of what changed;
// `parentDirty` tells what may be different on the parent.
[[nodiscard]] uint32_t SolveTextNode(dom::Node& text, const PropertySet& parentDirty, StyleRun& run);

}  // namespace qorvex::css
