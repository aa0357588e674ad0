// font-fit-mode: the size at which a text fills, or at least fits, its box.
#include <algorithm>

#include "core/limits.h"
#include "layout/text/text_layout.h"

namespace qorvex::layout {

namespace {

bool Fits(const TextRequest& request, const TextInfo& info) {
    return (std::isnan(request.availableWidth) || info.width <= request.availableWidth) &&
           (std::isnan(request.availableHeight) || info.height <= request.availableHeight);
}

bool FitsAt(const TextRequest& request, TextStyle& style, float size, TextInfo& out) {
    style.usedSize = size;
    const TextRequest sized = {request.text,
                               style,
                               request.availableWidth,
                               request.availableHeight,
                               request.fonts,
                               request.iterator,
                               request.firstLineOffset,
                               request.applyLineHeight};
    return CalculateTextRunsAndGlyphs(sized, out) && Fits(request, out);
}

// The largest size of base, base + 1, ... that fits, where `base` fits. A text that fits at one size fits at
// any smaller one, so the search doubles its step and halves it again instead of trying every size: a short
// word in a large box would need thousands of layouts.
float LargestFitting(const TextRequest& request, TextStyle& style, float base, TextInfo& out) {
    float low = base;
    float step = 1;
    while (low + step < limits::kLargestFitSize && FitsAt(request, style, low + step, out)) {
        low += step;
        step *= 2;
    }
    for (step = std::floor(step / 2); step >= 1; step = std::floor(step / 2)) {
        if (low + step < limits::kLargestFitSize && FitsAt(request, style, low + step, out)) low += step;
    }
    return low;
}

// The largest size of base - 1, base - 2, ... that fits, or the smallest one that is tried.
float FirstFittingBelow(const TextRequest& request, TextStyle& style, float base, TextInfo& out) {
    // Steps of one down to the limit, searched by halves for the same reason.
    const auto steps = static_cast<int>(std::ceil(base - limits::kSmallestFitSize));
    int low = 1;
    int high = std::max(steps, 1);
    while (low < high) {
        const int middle = (low + high) / 2;
        if (FitsAt(request, style, std::max(base - static_cast<float>(middle), limits::kSmallestFitSize),
                   out)) {
            high = middle;
        } else {
            low = middle + 1;
        }
    }
    return std::max(base - static_cast<float>(low), limits::kSmallestFitSize);
}

}  // namespace

bool LayoutText(const TextRequest& request, TextInfo& out) {
    using css::FontFitModeType;
    TextStyle style = request.style;
    const FontFitModeType mode = style.fit;
    const bool known = !std::isnan(request.availableWidth) || !std::isnan(request.availableHeight);
    const bool fits = FitsAt(request, style, style.fontSize, out);
    if (mode == FontFitModeType::None || !known || out.lines.empty())
        return !out.lines.empty() || request.text.empty();
    float size = style.fontSize;
    if (fits && mode == FontFitModeType::Fit) {
        size = LargestFitting(request, style, size, out);
    } else if (!fits && size > limits::kSmallestFitSize) {
        size = FirstFittingBelow(request, style, size, out);
    }
    if (!Near(out.usedSize, size)) FitsAt(request, style, size, out);
    return true;
}

}  // namespace qorvex::layout
