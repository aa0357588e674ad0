// The engine for pages whose <body> is `display: simple`: children overlap at the content origin of their
// parent, positioned ones are placed by left and top. Only the subtrees of changed nodes are touched.
#pragma once

#include "css/values/length_context.h"
#include "layout/perform_layout.h"

namespace qorvex::layout {

// Lays out every top-most changed node with its subtree; with `everything`, the whole tree.
void PerformSimpleLayout(LayoutPass& pass, const css::LengthContext& lengths, bool everything);

// A flex element inside a simple tree: a run of Yoga of its own, with no available size.
void LayoutFlexInSimple(const css::LengthContext& lengths, LayoutPass& pass, LayoutHandle& handle,
                        Point place, LayoutHandle* fixedContainer);

}  // namespace qorvex::layout
