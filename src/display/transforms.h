// World transforms, bounds and scroll extents of laid-out nodes, and what of them must be painted again.
#pragma once

#include "layout/layout_handle.h"
#include "layout/perform_layout.h"

namespace qorvex::dsp {

// Runs the transform pass below the root, visiting only what is marked by MarkForTransform and the ancestors
// of it. With `everything`, visits the whole tree; both give the same result.
void RunTransformPass(layout::LayoutPass& pass, bool everything);

// The node's box, style transform, scroll position or stacking inputs changed: the next pass visits it.
void MarkForTransform(layout::LayoutHandle& handle);

// z-index, opacity, transforms and the like decide whether a node paints its subtree as one unit.
bool ComputeEstablishesStackingContext(const layout::LayoutNode& node);

// Takes `area` of the node's children from their document coordinates to the view: world transform and clips
// of all ancestors. Used at the commit for the area that a node covered before it changed.
layout::Rect ClipToAncestors(const layout::LayoutNode& node, layout::Rect area);

}  // namespace qorvex::dsp
