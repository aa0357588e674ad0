// The computed style of one element: decides which of its properties have to be looked at, and by which path.
#pragma once

#include "css/style/style_run.h"

namespace qorvex::css {

struct SolvedElement {
    uint32_t changeMask = 0;  // dom::ChangeMask bits; 0 when there was nothing to look at
    // The children may inherit something new, or were never solved themselves. When it is not set they have
    // to be looked at only if they are dirty themselves.
    bool reachesChildren = false;
};

// The element's parent is solved already, and keeps its dirty properties until its children have been.
[[nodiscard]] SolvedElement SolveElement(dom::Element& element, StyleRun& run);

}  // namespace qorvex::css
