// Sizes of boxes whose content has a size of its own: pictures. Sides that the style leaves open follow from
// the content and keep its proportions.
#pragma once

#include "display/display_element.h"
#include "layout/geometry.h"

#include <limits>

namespace qorvex::layout {

struct LayoutNode;

struct SizeLimits {
    float minWidth = 0;
    float maxWidth = std::numeric_limits<float>::infinity();
    float minHeight = 0;
    float maxHeight = std::numeric_limits<float>::infinity();
};

// The content box. NaN stands for a side that is open; a given side is the final one.
// https://www.w3.org/TR/CSS22/visudet.html#min-max-widths
Size FitReplaced(Size natural, float width, float height, const SizeLimits& limits);

// An answer to Measure. Limits are those of the flex engine; the simple one knows none.
Size MeasureReplaced(const LayoutNode& node, Size natural, float availableWidth, float availableHeight,
                     dsp::MeasureMode widthMode, dsp::MeasureMode heightMode);

}  // namespace qorvex::layout
