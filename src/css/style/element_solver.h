// The computed style of one element: decides which of its properties have to be looked at, and by which path.
#pragma once

#include "css/style/style_run.h"

namespace qorvex::css {

// dom::ChangeMask bits of what changed; 0 when there was nothing to look at. The element's parent is solved
// already, and keeps its dirty properties until the run ends.
[[nodiscard]] uint32_t SolveElement(dom::Element& element, StyleRun& run);

}  // namespace qorvex::css
