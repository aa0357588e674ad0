// Outlines to edges: flattening, projection with near-plane clipping, and strokes.
#pragma once
#include "fresco/cpu/rasterizer.h"
#include "fresco/paths/matrix.h"
#include "fresco/paths/path_data.h"

namespace fresco::cpu {

struct StrokeStyle {
    double width = 1;
    double miterLimit = 10;
    uint32_t cap = 0, join = 0;  // LineCap, LineJoin
};

struct PathView {
    const PathVerb* verbs = nullptr;
    size_t verbCount = 0;
    const Point* points = nullptr;
    size_t pointCount = 0;

    PathView() = default;
    PathView(const PathVerb* v, size_t verbs_, const Point* p, size_t points_)
        : verbs(v), verbCount(verbs_), points(p), pointCount(points_) {}
    PathView(const PathData& data)  // NOLINT: a view of it
        : PathView(data.verbs.data(), data.verbs.size(), data.points.data(), data.points.size()) {}
};

// Turns outlines of the user's plane into device edges. Keeps its scratch memory from draw to draw.
class OutlineBuilder {
  public:
    // Device bounds of the control points, empty when all of them lie behind the eye.
    static IRect DeviceBounds(const PathView& path, const Homography& transform, double outset = 0);

    // Contours are closed implicitly.
    void AddFill(const PathView& path, const Homography& transform, Rasterizer& out);
    // Each piece of the stroke is a convex outline of one orientation: to be swept with the non-zero rule.
    void AddStroke(const PathView& path, const StrokeStyle& style, const Homography& transform,
                   Rasterizer& out);

  private:
    void FlattenContours(const PathView& path, const Homography& transform, bool forStroke,
                         const StrokeStyle* style, Rasterizer& out);
    void FlushFill(const Homography& transform, Rasterizer& out);
    void FlushStroke(bool closed, const StrokeStyle& style, const Homography& transform, Rasterizer& out);
    void AddJoin(Vec2 p, Vec2 d0, Vec2 d1, bool smooth, const StrokeStyle& style, const Homography& transform,
                 Rasterizer& out);
    void AddCap(Vec2 p, Vec2 outward, const StrokeStyle& style, const Homography& transform, Rasterizer& out);
    void AddPie(Vec2 p, double from, double sweep, double radius, const Homography& transform,
                Rasterizer& out);
    void AddPolygon(const Vec2* points, size_t count, const Homography& transform, bool orient,
                    Rasterizer& out);

    struct Vec3 {
        double x, y, w;
    };
    Vector<Vec2> contour_, device_;
    Vector<uint8_t> smooth_;  // per point of the contour: inside of a flattened curve
    Vector<Vec3> near_, clipped_;
    Vector<Vec2> piece_;
    double pieceScale_ = 1;
};

}  // namespace fresco::cpu
