// Rectangles, edges and matrices of the layout side. Rectangles and matrices are those of the rendering
// library, so that recording passes them on unchanged.
#pragma once

#include <fresco/geometry.h>

#include <algorithm>
#include <cmath>
#include <cstdint>

namespace qorvex::layout {

using Rect = fresco::Rect;
using Matrix = fresco::Matrix4;
using Point = fresco::Point;
using Size = fresco::Size;

// Two lengths, opacities or rates closer than this are the same.
inline constexpr float kLengthTolerance = 0.001f;
// The same for matrix entries.
inline constexpr float kMatrixTolerance = 1e-5f;

struct Edges {
    float left = 0;
    float right = 0;
    float top = 0;
    float bottom = 0;
};

// Of one box. Shared: most boxes have none, and the DOM side takes over what the layout side found.
struct BoxEdges {
    Edges border;
    Edges padding;
    Edges margin;
};

struct ScrollPosition {
    float x = 0;
    float y = 0;
};

inline bool Near(float a, float b) {
    return std::fabs(a - b) <= kLengthTolerance;
}
inline bool Near(const Edges& a, const Edges& b) {
    return Near(a.left, b.left) && Near(a.right, b.right) && Near(a.top, b.top) && Near(a.bottom, b.bottom);
}
bool Near(const Rect& a, const Rect& b);
inline bool IsScrolled(const ScrollPosition& s) {
    return !Near(s.x, 0) || !Near(s.y, 0);
}

inline Rect MakeRect(float x, float y, float width, float height) {
    return {x, y, 0, width, height};
}
inline float Right(const Rect& rect) {
    return rect.x + rect.width;
}
inline float Bottom(const Rect& rect) {
    return rect.y + rect.height;
}
inline bool IsEmpty(const Rect& rect) {
    return !(rect.width > 0 && rect.height > 0);
}
inline bool Intersects(const Rect& a, const Rect& b) {
    return a.x < Right(b) && b.x < Right(a) && a.y < Bottom(b) && b.y < Bottom(a);
}
inline bool Contains(const Rect& outer, const Rect& inner) {
    return outer.x <= inner.x && outer.y <= inner.y && Right(outer) >= Right(inner) &&
           Bottom(outer) >= Bottom(inner);
}
// Empty rectangles count as nothing in a union.
inline Rect Union(const Rect& a, const Rect& b) {
    if (IsEmpty(a)) return b;
    if (IsEmpty(b)) return a;
    const float x = std::min(a.x, b.x);
    const float y = std::min(a.y, b.y);
    return {x, y, 0, std::max(Right(a), Right(b)) - x, std::max(Bottom(a), Bottom(b)) - y};
}
inline Rect Intersection(const Rect& a, const Rect& b) {
    const float x = std::max(a.x, b.x);
    const float y = std::max(a.y, b.y);
    const float width = std::min(Right(a), Right(b)) - x;
    const float height = std::min(Bottom(a), Bottom(b)) - y;
    if (!(width > 0 && height > 0)) return {};
    return {x, y, 0, width, height};
}
Rect Inset(const Rect& rect, const Edges& edges);
// To the next whole number, halves away from zero. As std::round, which is a call.
inline float RoundToPixel(float value) {
    constexpr float kAllWhole = 8388608;  // from here on a float has no fraction
    if (!(std::fabs(value) < kAllWhole)) return value;
    const auto whole = static_cast<float>(static_cast<int32_t>(value));
    const float rest = value - whole;
    return whole + static_cast<float>(rest >= 0.5f) - static_cast<float>(rest <= -0.5f);
}
// Each edge lands on the pixel that it would reach alone.
inline Rect SnapToPixels(const Rect& rect) {
    auto fraction = [](float value) {
        constexpr float kAllWhole = 8388608;
        return std::fabs(value) < kAllWhole ? value - static_cast<float>(static_cast<int32_t>(value)) : 0;
    };
    const float x = fraction(rect.x), y = fraction(rect.y);
    return {RoundToPixel(rect.x), RoundToPixel(rect.y), rect.z,
            RoundToPixel(x + rect.width) - RoundToPixel(x), RoundToPixel(y + rect.height) - RoundToPixel(y)};
}
// As std::floor and std::ceil, which are calls too.
inline float RoundDown(float value) {
    constexpr float kAllWhole = 8388608;
    if (!(std::fabs(value) < kAllWhole)) return value;
    const auto whole = static_cast<float>(static_cast<int32_t>(value));
    return whole - static_cast<float>(whole > value);
}
inline float RoundUp(float value) {
    return -RoundDown(-value);
}
// Outward to whole pixels.
inline Rect RoundOut(const Rect& rect) {
    const float x = RoundDown(rect.x);
    const float y = RoundDown(rect.y);
    return {x, y, rect.z, RoundUp(Right(rect)) - x, RoundUp(Bottom(rect)) - y};
}

bool Near(const Matrix& a, const Matrix& b);
// Neither depth nor perspective: what maps the plane to the plane.
bool IsFlat(const Matrix& m);
bool IsFinite(const Rect& rect);
// The axis-aligned bounds of a mapped rectangle. Empty when a corner is not finite or when all of it lies
// behind the eye; a rectangle that is cut by the plane of the eye counts as unbounded on that side.
Rect MapBoundsInSpace(const Matrix& m, const Rect& rect);
// The same, at once for matrices that only scale and move, which most are.
inline Rect MapBounds(const Matrix& m, const Rect& rect) {
    const float* a = m.m;
    const bool straight = a[1] == 0 && a[4] == 0 && a[3] == 0 && a[7] == 0 && a[11] == 0 && a[15] == 1;
    constexpr float kHuge = 1e9f;
    const float x = a[0] * rect.x + a[8] * rect.z + a[12], y = a[5] * rect.y + a[9] * rect.z + a[13];
    const float right = a[0] * Right(rect) + a[8] * rect.z + a[12];
    const float bottom = a[5] * Bottom(rect) + a[9] * rect.z + a[13];
    const float left = std::min(x, right), top = std::min(y, bottom);
    const float width = std::max(x, right) - left, height = std::max(y, bottom) - top;
    const bool ordinary = left > -kHuge && top > -kHuge && left + width < kHuge && top + height < kHuge;
    return straight && ordinary ? Rect{left, top, 0, width, height} : MapBoundsInSpace(m, rect);
}
// False for a singular matrix.
bool Invert(const Matrix& m, Matrix& out);

}  // namespace qorvex::layout
