// The area that an edge covers of the cells that it crosses, in fixed point: places are 48.16, areas 1 /
// 65536 of a pixel. The rasteriser's rows and its grid of small shapes share it, and so give the same sums.
#pragma once
#include <algorithm>
#include <cmath>
#include <cstdint>
#include <utility>

#include <fresco/path.h>

namespace fresco::cpu {

inline constexpr int kShift = 16;
inline constexpr int32_t kOne = 1 << kShift;
// Beyond this the picture is far off any surface; holding points here keeps 48.16 arithmetic exact.
inline constexpr double kFarthest = double(1 << 22);

inline int32_t RoundPositive(double value) {
    return int32_t(value + 0.5);
}

inline int64_t ToFixed(double value) {
    return std::llrint(std::min(std::max(value, -kFarthest), kFarthest) * kOne);
}

// From one end of an edge to where it crosses a height `down` below it. All places come from the edge's own
// equation, never from the neighbouring row or cell, so that clipping cannot change them.
inline int64_t Across(int64_t down, double slope) {
    return std::llrint(double(down) * slope);
}

// Of `height` between two places within the cell that begins at 0, the part that lies right of them.
inline int32_t AreaBeyond(int32_t height, int64_t from, int64_t to) {
    return int32_t((height * (from + to) + kOne) >> (kShift + 1));
}

inline uint8_t ToCoverage(int32_t area, FillRule rule) {
    int32_t value = area < 0 ? -area : area;
    if (rule == kFillEvenOdd) {
        value &= 2 * kOne - 1;
        if (value > kOne) value = 2 * kOne - value;
    } else if (value > kOne) {
        value = kOne;
    }
    return uint8_t((value * 255 + kOne / 2) >> kShift);
}

// Adds what an edge between two places, counted from the left side of the bounds, covers of a row by
// add(cell, value).
template <class Add>
inline void Accumulate(int64_t left, int64_t right, int32_t height, int32_t winding, int width, Add add) {
    if (left > right) std::swap(left, right);
    if (left >= int64_t(width) << kShift) return;
    if (right <= 0) return add(0, winding * height);
    int cell = int(left >> kShift);
    int64_t begin = int64_t(cell) << kShift;
    if (right <= begin + kOne) {
        const int32_t beyond = AreaBeyond(height, left - begin, right - begin);
        add(cell, winding * (height - beyond));
        add(cell + 1, winding * beyond);
        return;
    }
    // The edge crosses several cells: the height it has gained at each cell boundary is rounded, and the
    // cell's share is the difference, so that the shares add up to the whole.
    const double perStep = height / double(right - left);
    int32_t gained = 0;
    int64_t from = left;
    if (cell < 0) {
        gained = RoundPositive(double(-left) * perStep);
        add(0, winding * gained);
        cell = 0;
        from = begin = 0;
    }
    for (; cell < width; ++cell, begin += kOne) {
        const bool last = right <= begin + kOne;
        const int64_t to = last ? right : begin + kOne;
        const int32_t reached = last ? height : std::min(height, RoundPositive(double(to - left) * perStep));
        const int32_t share = reached - gained;
        const int32_t beyond = AreaBeyond(share, from - begin, to - begin);
        add(cell, winding * (share - beyond));
        add(cell + 1, winding * beyond);
        if (last) return;
        gained = reached;
        from = to;
    }
}

}  // namespace fresco::cpu
