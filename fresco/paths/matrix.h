// Matrices beyond what records need: inversion, and the plane homography that the CPU back end draws through.
#pragma once
#include <fresco/geometry.h>
#include <cmath>
#include <cstdlib>

namespace fresco {

// False for a matrix that is singular or not finite.
bool Invert(const Matrix4& matrix, Matrix4* inverse);

struct Vec2 {
    double x = 0, y = 0;
};

// How a transform maps small distances: (dx, dy) goes to (xx * dx + xy * dy, yx * dx + yy * dy).
struct Jacobian {
    double xx = 1, xy = 0, yx = 0, yy = 1;
};

// What a 4 by 4 transform does to the plane of a draw: (x, y) goes to (X / W, Y / W). Depth is of no use
// here.
struct Homography {
    double xx = 1, xy = 0, x0 = 0;  // X = xx * x + xy * y + x0
    double yx = 0, yy = 1, y0 = 0;
    double wx = 0, wy = 0, w0 = 1;

    static Homography FromMatrix(const Matrix4& matrix, double z = 0);

    bool IsAffine() const { return wx == 0 && wy == 0 && w0 == 1; }
    // Axis-aligned rectangles stay axis-aligned rectangles, without a turn by 90 degrees.
    bool IsScaleTranslate() const { return IsAffine() && xy == 0 && yx == 0; }
    Vec2 Apply(double x, double y) const { return {xx * x + xy * y + x0, yx * x + yy * y + y0}; }
    Vec2 Project(double x, double y) const {
        const double w = wx * x + wy * y + w0;
        return {(xx * x + xy * y + x0) / w, (yx * x + yy * y + y0) / w};
    }
    bool Invert(Homography* inverse) const;
    Jacobian At(double x, double y) const;
    // The largest factor by which a length near (x, y) grows.
    double MaxScale(double x = 0, double y = 0) const;
};

Homography operator*(const Homography& a, const Homography& b);

}  // namespace fresco
