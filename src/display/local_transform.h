// Matrices that follow from a node's transform group, and what makes a node a stacking context.
#pragma once

#include "css/values/length_context.h"
#include "layout/layout_handle.h"

namespace qorvex::dsp {

// Both matrices work in document coordinates. They are absent where the style asks for none.
// True when either changed, appeared or went.
bool UpdateLocalMatrices(layout::LayoutNode& node, const layout::Rect& box,
                         const css::LengthContext& lengths);

// z-index where it applies, and whether the node paints its subtree as one unit.
void UpdateStacking(layout::LayoutNode& node);

// The steps of one `transform` value applied in order to a box of this size.
layout::Matrix TransformMatrix(const css::Transform& transform, const layout::Rect& box,
                               const css::LengthContext& lengths);

}  // namespace qorvex::dsp
