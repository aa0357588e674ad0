// Shapes as small as a glyph: lines go straight into a grid of cells. A line that lies within the bounds, as
// all of a glyph do, needs no clipping and 32 bits; any other is added by the rows' own arithmetic.
#include <cstring>

#include "fresco/cpu/edge_area.h"
#include "fresco/cpu/rasterizer.h"

namespace fresco::cpu {

// From the corner of the bounds.
struct Rasterizer::GridPoint {
    int64_t x, y;
    bool inside;
};

void Rasterizer::BeginSmall(const IRect& bounds) {
    Begin(bounds);
    small_ = true;
    const size_t cells = size_t(bounds.Width() + 1) * size_t(bounds.Height());
    if (grid_.size() < cells) grid_.resize(cells);
}

void Rasterizer::AddToGrid(const Vec2* points, size_t count) {
    if (count == 0) return;
    const int64_t left = int64_t(bounds_.x0) << kShift, top = int64_t(bounds_.y0) << kShift;
    const uint64_t width = uint64_t(bounds_.Width()) << kShift, height = uint64_t(bounds_.Height()) << kShift;
    const auto place = [=](Vec2 point) {
        GridPoint placed{ToFixed(point.x) - left, ToFixed(point.y) - top, false};
        placed.inside = uint64_t(placed.x) < width && uint64_t(placed.y) <= height;
        return placed;
    };
    GridPoint from = place(points[count - 1]);
    for (size_t i = 0; i < count; ++i) {
        const GridPoint to = place(points[i]);
        if (from.y != to.y) {
            if (from.inside && to.inside) [[likely]]
                AddInsideToGrid(from, to);
            else
                AddClippedToGrid(from, to);
        }
        from = to;
    }
}

void Rasterizer::AddClippedToGrid(const GridPoint& from, const GridPoint& to) {
    const bool down = from.y < to.y;
    const GridPoint &upper = down ? from : to, &lower = down ? to : from;
    const double slope = double(lower.x - upper.x) / double(lower.y - upper.y);
    const int64_t bottom = std::min(lower.y, int64_t(bounds_.Height()) << kShift);
    const int width = bounds_.Width();
    for (int64_t y = std::max<int64_t>(upper.y, 0), end; y < bottom; y = end) {
        end = std::min(bottom, (y | (kOne - 1)) + 1);
        int32_t* cells = grid_.data() + (y >> kShift) * (width + 1);
        Accumulate(upper.x + Across(y - upper.y, slope), upper.x + Across(end - upper.y, slope),
                   int32_t(end - y), down ? 1 : -1, width,
                   [cells](int x, int32_t value) { cells[x] += value; });
    }
}

namespace {

// Accumulate without a border: both places lie within the row. Most lines of a glyph stay in one cell, and
// nearly all others in two.
inline void AccumulateInside(int32_t* row, int32_t from, int32_t to, int32_t height, int32_t winding) {
    const int32_t left = std::min(from, to), right = std::max(from, to);
    int32_t* cell = row + (left >> kShift);
    int32_t end = (left | (kOne - 1)) + 1, start = left, rest = height;
    if (right > end) {
        const double perStep = height / double(right - left);
        int32_t gained = 0;
        for (; right > end; ++cell, start = end, end += kOne) {
            const int32_t reached = std::min(height, RoundPositive(double(end - left) * perStep));
            const int32_t share = reached - gained;
            const int32_t beyond = AreaBeyond(share, start - end + kOne, kOne);
            cell[0] += winding * (share - beyond);
            cell[1] += winding * beyond;
            gained = reached;
        }
        rest -= gained;
    }
    const int32_t beyond = AreaBeyond(rest, start - end + kOne, right - end + kOne);
    cell[0] += winding * (rest - beyond);
    cell[1] += winding * beyond;
}

}  // namespace

inline void Rasterizer::AddInsideToGrid(const GridPoint& from, const GridPoint& to) {
    const bool down = from.y < to.y;
    const int32_t winding = down ? 1 : -1;
    const auto x = int32_t(down ? from.x : to.x), lowerX = int32_t(down ? to.x : from.x);
    const auto top = int32_t(down ? from.y : to.y), bottom = int32_t(down ? to.y : from.y);
    const int pitch = bounds_.Width() + 1;
    int32_t* cells = grid_.data() + size_t(top >> kShift) * size_t(pitch);
    int32_t rowEnd = (top | (kOne - 1)) + 1;
    if (bottom <= rowEnd) return AccumulateInside(cells, x, lowerX, bottom - top, winding);
    const double slope = double(lowerX - x) / double(bottom - top);
    int32_t above = x, y = top;
    for (; rowEnd < bottom; rowEnd += kOne, cells += pitch) {
        const int32_t below = x + int32_t(Across(rowEnd - top, slope));
        AccumulateInside(cells, above, below, rowEnd - y, winding);
        above = below;
        y = rowEnd;
    }
    AccumulateInside(cells, above, lowerX, bottom - y, winding);
}

void Rasterizer::SweepInto(uint8_t* coverage) {
    const size_t width = size_t(bounds_.Width()), height = size_t(bounds_.Height());
    const size_t size = (width + 1) * height;
    int32_t* const cells = grid_.data();
    for (size_t row = 0; row < size; row += width + 1) {
        int32_t sum = 0;
        for (size_t x = row; x < row + width; ++x)
            cells[x] = sum += cells[x];
    }
    // All rows at once: one is too short for whole registers.
    if (gridCoverage_.size() < size) gridCoverage_.resize(size);
    uint8_t* bytes = gridCoverage_.data();
    for (size_t i = 0; i < size; ++i)
        bytes[i] = ToCoverage(cells[i], kFillNonZero);
    for (size_t y = 0; y < height; ++y, bytes += width + 1, coverage += width)
        std::memcpy(coverage, bytes, width);
    std::fill_n(cells, size, 0);
}

}  // namespace fresco::cpu
