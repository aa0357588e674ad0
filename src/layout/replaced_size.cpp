#include "layout/replaced_size.h"

#include "layout/layout_handle.h"

#include <yoga/Yoga.h>

#include <algorithm>
#include <cmath>

namespace qorvex::layout {

namespace {

constexpr float kOpen = std::numeric_limits<float>::quiet_NaN();

float Clamp(float value, float low, float high) {
    return std::max(low, std::min(value, high));
}

float InnerLimit(YGValue limit, float edges, float none) {
    return limit.unit == YGUnitPoint && !std::isnan(limit.value) ? std::max(limit.value - edges, 0.0f) : none;
}

// Yoga tells a maximum in percent only by what it offers; all else that it offers is the room around, over
// which a picture hangs out.
float InnerMaximum(YGValue limit, float edges, float available, dsp::MeasureMode mode) {
    if (limit.unit == YGUnitPercent && mode == dsp::MeasureMode::AtMost) return available;
    return InnerLimit(limit, edges, std::numeric_limits<float>::infinity());
}

float EdgesOf(YGNodeConstRef node, YGEdge start, YGEdge end) {
    return YGNodeLayoutGetPadding(node, start) + YGNodeLayoutGetPadding(node, end) +
           YGNodeLayoutGetBorder(node, start) + YGNodeLayoutGetBorder(node, end);
}

}  // namespace

Size FitReplaced(Size natural, float width, float height, const SizeLimits& limits) {
    const bool openWidth = std::isnan(width), openHeight = std::isnan(height);
    const bool hasRatio = natural.width > 0 && natural.height > 0;
    if (openWidth && openHeight && hasRatio) {
        const float least = std::max(limits.minWidth / natural.width, limits.minHeight / natural.height);
        const float most = std::min(limits.maxWidth / natural.width, limits.maxHeight / natural.height);
        const float scale = std::max(least, std::min(most, 1.0f));
        width = natural.width * scale;
        height = natural.height * scale;
    } else if (openWidth) {
        width = hasRatio ? height * (natural.width / natural.height) : natural.width;
        if (openHeight) height = natural.height;
    } else if (openHeight) {
        height = hasRatio ? width * (natural.height / natural.width) : natural.height;
    }
    // One scale cannot serve limits that contradict the proportions.
    return {openWidth ? Clamp(width, limits.minWidth, limits.maxWidth) : width,
            openHeight ? Clamp(height, limits.minHeight, limits.maxHeight) : height};
}

Size MeasureReplaced(const LayoutNode& node, Size natural, float availableWidth, float availableHeight,
                     dsp::MeasureMode widthMode, dsp::MeasureMode heightMode) {
    SizeLimits limits;
    if (const YGNodeConstRef flex = node.flex) {
        const float across = EdgesOf(flex, YGEdgeLeft, YGEdgeRight);
        const float down = EdgesOf(flex, YGEdgeTop, YGEdgeBottom);
        limits = {InnerLimit(YGNodeStyleGetMinWidth(flex), across, 0),
                  InnerMaximum(YGNodeStyleGetMaxWidth(flex), across, availableWidth, widthMode),
                  InnerLimit(YGNodeStyleGetMinHeight(flex), down, 0),
                  InnerMaximum(YGNodeStyleGetMaxHeight(flex), down, availableHeight, heightMode)};
    }
    return FitReplaced(natural, widthMode == dsp::MeasureMode::Exactly ? availableWidth : kOpen,
                       heightMode == dsp::MeasureMode::Exactly ? availableHeight : kOpen, limits);
}

}  // namespace qorvex::layout
