// The search of font-fit-mode, over any way to try a size.
#pragma once

#include <algorithm>
#include <cmath>

#include "core/limits.h"
#include "css/values/keywords.h"

namespace qorvex::layout {

// The largest size of base, base + 1, ... that fits, where `base` fits. A text that fits at one size fits at
// any smaller one, so the search doubles its step and halves it again instead of trying every size: a short
// word in a large box would need thousands of layouts.
template <class FitsAt>
float LargestFittingSize(float base, FitsAt& fitsAt) {
    float low = base;
    float step = 1;
    while (low + step < limits::kLargestFitSize && fitsAt(low + step)) {
        low += step;
        step *= 2;
    }
    for (step = std::floor(step / 2); step >= 1; step = std::floor(step / 2)) {
        if (low + step < limits::kLargestFitSize && fitsAt(low + step)) low += step;
    }
    return low;
}

// The largest size of base - 1, base - 2, ... that fits, or the smallest one that is tried.
template <class FitsAt>
float FirstFittingSizeBelow(float base, FitsAt& fitsAt) {
    // Steps of one down to the limit, searched by halves for the same reason.
    const auto steps = static_cast<int>(std::ceil(base - limits::kSmallestFitSize));
    int low = 1;
    int high = std::max(steps, 1);
    while (low < high) {
        const int middle = (low + high) / 2;
        if (fitsAt(std::max(base - static_cast<float>(middle), limits::kSmallestFitSize))) {
            high = middle;
        } else {
            low = middle + 1;
        }
    }
    return std::max(base - static_cast<float>(low), limits::kSmallestFitSize);
}

// `fits`: whether the text fits at `base`. The last size tried need not be the one returned.
template <class FitsAt>
float FindFittingSize(css::FontFitModeType mode, float base, bool fits, FitsAt&& fitsAt) {
    if (fits) return mode == css::FontFitModeType::Fit ? LargestFittingSize(base, fitsAt) : base;
    return base > limits::kSmallestFitSize ? FirstFittingSizeBelow(base, fitsAt) : base;
}

}  // namespace qorvex::layout
