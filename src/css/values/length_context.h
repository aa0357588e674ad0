// Lengths to pixels. Layout, paint and style solving all resolve through here.
#pragma once

#include <cmath>
#include <limits>

#include "css/values/length.h"

namespace qorvex::css {

// What lengths resolve against. Made fresh for each pass, em set per node.
struct LengthContext {
    float vw = 0;        // one hundredth of the viewport width
    float vh = 0;        // one hundredth of the viewport height
    float em = 0;        // computed font size of the node
    float rem = 0;       // computed font size of the root
    float fallback = 0;  // for a percentage without a base
};

// Stands for "this property has no percentage base".
inline constexpr float kNoPercentBase = std::numeric_limits<float>::quiet_NaN();

[[nodiscard]] inline float ResolveLength(Length length, const LengthContext& context,
                                         float percentBase = kNoPercentBase) {
    switch (length.unit) {
        case LengthUnit::Px:
            return length.value;
        case LengthUnit::Percent:
            return std::isnan(percentBase) ? context.fallback : length.value / 100 * percentBase;
        case LengthUnit::Vw:
            return length.value * context.vw;
        case LengthUnit::Vh:
            return length.value * context.vh;
        case LengthUnit::Vmin:
            return length.value * std::fmin(context.vw, context.vh);
        case LengthUnit::Vmax:
            return length.value * std::fmax(context.vw, context.vh);
        case LengthUnit::Em:
            return length.value * context.em;
        case LengthUnit::Rem:
            return length.value * context.rem;
        // Physical units land on whole pixels; the factor of pt is this number, not 4/3.
        case LengthUnit::In:
            return std::round(length.value * 96);
        case LengthUnit::Pt:
            return std::round(length.value * 1.333333f);
    }
    return context.fallback;
}

// The caller's default (often NaN or 0) for auto and the keywords.
[[nodiscard]] inline float ResolveExtent(const Extent& extent, const LengthContext& context,
                                         float percentBase, float whenAuto) {
    return extent.IsLength() ? ResolveLength(extent.AsLength(), context, percentBase) : whenAuto;
}

[[nodiscard]] inline float ResolveBorderWidth(const BorderWidth& width, const LengthContext& context) {
    switch (width.kind) {
        case BorderWidthKind::Thin:
            return 1;
        case BorderWidthKind::Medium:
            return 3;
        case BorderWidthKind::Thick:
            return 5;
        case BorderWidthKind::Length:
            return ResolveLength(width.AsLength(), context);
        default:
            return 0;
    }
}

}  // namespace qorvex::css
