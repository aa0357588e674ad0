// The one measure function of all Yoga leaves: asks the display element.
#pragma once

#include <yoga/Yoga.h>

#include <cstdint>

namespace qorvex::layout {

YGSize MeasureFlexNode(YGNodeConstRef node, float width, YGMeasureMode widthMode, float height,
                       YGMeasureMode heightMode);

// How often the calling thread asked since the last call.
uint32_t TakeMeasureCount();

}  // namespace qorvex::layout
