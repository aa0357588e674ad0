// Rectangles, edges and matrices of the layout side. Rectangles and matrices are those of the rendering
// library, so that recording passes them on unchanged.
#pragma once

#include <fresco/geometry.h>

#include <cmath>
#include <cstdint>

namespace qorvex::layout {

using Rect = fresco::Rect;
using Matrix = fresco::Matrix4x4;

// Two lengths, opacities or rates closer than this are the same.
inline constexpr float kLengthTolerance = 0.001f;
// The same for matrix entries.
inline constexpr float kMatrixTolerance = 1e-5f;

struct Size {
    float width = 0;
    float height = 0;
};

struct Point {
    float x = 0;
    float y = 0;
};

struct Edges {
    float left = 0;
    float right = 0;
    float top = 0;
    float bottom = 0;
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

Rect MakeRect(float x, float y, float width, float height);
bool IsEmpty(const Rect& rect);
bool Intersects(const Rect& a, const Rect& b);
bool Contains(const Rect& outer, const Rect& inner);
// Empty rectangles count as nothing in a union.
Rect Union(const Rect& a, const Rect& b);
Rect Intersection(const Rect& a, const Rect& b);
Rect Inset(const Rect& rect, const Edges& edges);
// Each edge lands on the pixel that it would reach alone; halves round away from zero.
Rect SnapToPixels(const Rect& rect);
// Outward to whole pixels.
Rect RoundOut(const Rect& rect);

bool IsIdentity(const Matrix& m);
bool Near(const Matrix& a, const Matrix& b);
// Drops depth: the z row and the z column become those of the identity.
void Flatten(Matrix& m);
Matrix Translation(float x, float y, float z = 0);
Matrix Multiply(const Matrix& a, const Matrix& b);
// The axis-aligned bounds of a mapped rectangle. Empty when the matrix is singular or not finite, or when the
// rectangle lies wholly behind the eye.
Rect MapBounds(const Matrix& m, const Rect& rect);
bool Invert(const Matrix& m, Matrix& out);

}  // namespace qorvex::layout
