// Writes computed style to a Yoga node. Yoga's setters compare before they write and mark dirty only on a
// change, which is what keeps its own caches alive.
#pragma once

#include "css/values/length_context.h"
#include "layout/layout_handle.h"

namespace qorvex::layout {

struct FlexStyleContext {
    css::LengthContext lengths;  // em is set per node
    bool disableFlexBasisUnits = false;
    const LayoutHandle* root = nullptr;
};

bool SyncStyleToYoga(LayoutHandle& handle, FlexStyleContext& context);

// Widths of the four borders in pixels; a side without a painting or counting style is 0.
Edges ResolveBorders(const css::LayoutStyle& style, const css::LengthContext& lengths);

}  // namespace qorvex::layout
