// Layout computes in floats, and NaN means "undefined" to it: what a page may write, and what many such
// numbers add up to, is kept where neither breaks.
#pragma once

#include "core/limits.h"

#include <cmath>

namespace qorvex::layout {

// Of a style: pixels or percent. NaN stays.
inline float BoundLength(float value) {
    if (value > limits::kMaxLength) return limits::kMaxLength;
    return value < -limits::kMaxLength ? -limits::kMaxLength : value;
}

// Of a computed box. NaN, the outcome of infinite differences, becomes 0.
inline float BoundResult(float value) {
    constexpr float kLargest = limits::kMaxLength * 100;
    if (value > kLargest) return kLargest;
    if (value < -kLargest) return -kLargest;
    return std::isnan(value) ? 0 : value;
}
inline float BoundSize(float value) {
    return value > 0 ? BoundResult(value) : 0;
}

}  // namespace qorvex::layout
