// Layout computes in floats, and NaN means "undefined" to it: what a page may write, and what many such
// numbers add up to, is kept where neither breaks.
#pragma once

#include <cmath>

namespace qorvex::layout {

// A hundred thousand screens.
inline constexpr float kMaxLength = 1e7f;

// Of a style: pixels or percent. NaN stays.
inline float BoundLength(float value) {
    if (value > kMaxLength) return kMaxLength;
    return value < -kMaxLength ? -kMaxLength : value;
}

// Of a computed box. NaN, the outcome of infinite differences, becomes 0.
inline float BoundResult(float value) {
    constexpr float kLargest = kMaxLength * 100;
    if (value > kLargest) return kLargest;
    if (value < -kLargest) return -kLargest;
    return std::isnan(value) ? 0 : value;
}
inline float BoundSize(float value) {
    return value > 0 ? BoundResult(value) : 0;
}

}  // namespace qorvex::layout
