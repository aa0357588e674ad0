#include "layout/flex_measure.h"

#include "display/display_element.h"
#include "layout/layout_handle.h"
#include "layout/length_bounds.h"

#include <utility>

namespace qorvex::layout {

namespace {
thread_local uint32_t g_measureCount = 0;

dsp::MeasureMode ModeOf(YGMeasureMode mode) {
    switch (mode) {
        case YGMeasureModeExactly:
            return dsp::MeasureMode::Exactly;
        case YGMeasureModeAtMost:
            return dsp::MeasureMode::AtMost;
        default:
            return dsp::MeasureMode::Undefined;
    }
}
}  // namespace

YGSize MeasureFlexNode(YGNodeConstRef node, float width, YGMeasureMode widthMode, float height,
                       YGMeasureMode heightMode) {
    auto* handle = static_cast<LayoutHandle*>(YGNodeGetContext(node));
    dsp::IDisplayElement* display = handle->node().display.get();
    if (display == nullptr) return {0, 0};
    ++g_measureCount;
    Size size;
    display->Measure(*handle, width, height, ModeOf(widthMode), ModeOf(heightMode), size);
    return {BoundSize(size.width), BoundSize(size.height)};
}

uint32_t TakeMeasureCount() {
    return std::exchange(g_measureCount, 0);
}

}  // namespace qorvex::layout
