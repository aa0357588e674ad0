// Gradients of coloured glyphs: the colour line and the three geometries of the COLR table.
#pragma once
#include <cstdint>

#include "fresco/core/heap.h"
#include "fresco/paths/matrix.h"

namespace fresco {

// Premultiplied; the offset is along the gradient line, also beyond 0 and 1.
struct GlyphColorStop {
    float offset = 0;
    float r = 0, g = 0, b = 0, a = 0;
};

enum class GradientExtend : uint8_t { Pad, Repeat, Reflect };

class ColorLine {
  public:
    // Stops may come in any order.
    ColorLine(Vector<GlyphColorStop> stops, GradientExtend extend);
    // Premultiplied RGBA8.
    uint32_t At(double t) const;

  private:
    Vector<GlyphColorStop> stops_;
    GradientExtend extend_;
};

// Where on the gradient line a point lies; a NaN where it lies on none and nothing is drawn.
class GradientGeometry {
  public:
    // p2 turns the lines of equal colour: they are parallel to p0 p2.
    static GradientGeometry Linear(Vec2 p0, Vec2 p1, Vec2 p2);
    // From one circle to another.
    static GradientGeometry Radial(Vec2 c0, double r0, Vec2 c1, double r1);
    // Counter-clockwise from the x axis, in radians.
    static GradientGeometry Sweep(Vec2 center, double start, double end);

    double At(Vec2 point) const;

  private:
    enum class Kind : uint8_t { Nothing, Linear, Radial, Sweep };
    double OnCircles(Vec2 point) const;

    Kind kind_ = Kind::Nothing;
    Vec2 origin_, direction_;        // Linear: the parameter is the product with the direction
    double start_ = 0, change_ = 0;  // a radius or an angle, and how it grows along the line
};

}  // namespace fresco
