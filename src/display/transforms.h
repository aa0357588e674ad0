// World transforms, bounds and scroll extents of laid-out nodes, and what of them must be painted again.
//
// One recursive pass from the root serves all changes: it enters only subtrees that hold a marked node or
// whose matrices moved, and gives the same result as visiting everything. Depth is bounded by
// kMaxLayoutDepth.
#pragma once

#include "layout/layout_handle.h"
#include "layout/perform_layout.h"

namespace qorvex::dsp {

void RunTransformPass(layout::LayoutPass& pass);

// The node's box, style, scroll position or paint changed: the next pass visits it.
void MarkForTransform(layout::LayoutHandle& handle);

// The part of a node's visual bounds that its ancestors let through, as of the last pass; the whole bounds of
// an ancestor whose filter spreads what changes below it.
layout::Rect ClipToAncestors(const layout::LayoutNode& node);

// The box as it is painted and transformed.
layout::Rect PaintBox(const layout::LayoutNode& node, bool snapToPixels);
// Where a clipping node cuts its children, before its transform.
layout::Rect ClipBox(const layout::LayoutNode& node, bool snapToPixels);

}  // namespace qorvex::dsp
