// The style of one text node, from its parent alone.
#pragma once

#include "css/style/style_run.h"
#include "dom/character_data.h"

namespace qorvex::css {

// dom::ChangeMask bits of what changed;
// `parentDirty` tells what may be different on the parent.
[[nodiscard]] uint32_t SolveTextNode(dom::Text& text, const PropertySet& parentDirty, StyleRun& run);

}  // namespace qorvex::css
