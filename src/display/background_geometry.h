// Where the images of a box lie: sizes, positions and repetition of background and mask layers, and the
// geometry of gradients (CSS Backgrounds 3, section 2; CSS Images 3, section 3).
#pragma once

#include "css/values/image_values.h"
#include "css/values/length_context.h"
#include "display/resolved_visuals.h"
#include "layout/layout_handle.h"

namespace qorvex::dsp {

// Fills the background and mask layers of `out`. `box` is the border box.
void ResolveBackgrounds(const layout::LayoutNode& node, const layout::Rect& box,
                        const css::LengthContext& lengths, ResolvedVisuals& out);

// Start and end (linear) or centre and half axes (radial) for a tile of this size, in units of its larger
// side.
void ResolveGradient(const css::Gradient& gradient, layout::Size tile, const css::LengthContext& lengths,
                     ResolvedImageLayer& out);

}  // namespace qorvex::dsp
