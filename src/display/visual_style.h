// Resolves the paint values of changed nodes to pixels.
#pragma once

#include "display/resolved_visuals.h"
#include "layout/perform_layout.h"

namespace qorvex::dsp {

// Body of the task RecalculateVisualStyle, which runs in every frame: resolves what the frame's changes
// touched, adds what became dirty and grows the bounds of ancestors where shadows and filters reach further
// than before.
void RecalculateVisualStyle(layout::LayoutPass& pass);

// Whether any value of the style needs the record.
bool NeedsResolvedVisuals(const css::VisualStyle& style);
void ResolveVisuals(const layout::LayoutNode& node, const layout::Rect& box,
                    const css::LengthContext& lengths, ResolvedVisuals& out);

}  // namespace qorvex::dsp
