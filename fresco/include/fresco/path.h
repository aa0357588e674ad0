// Outlines. A `Path` is counted and, once given to a draw, must not change any more while other threads see
// it; buffers copy what they need at the call, so releasing it right after is fine.
#pragma once
#include <fresco/geometry.h>
#include <cstddef>

namespace fresco {

enum FillRule : uint32_t { kFillNonZero, kFillEvenOdd };

enum class PathVerb : uint8_t { Move, Line, Quad, Cubic, Close };

class Path {
  public:
    // One reference, owned by the caller. Null without memory.
    static Path* Create();

    virtual void AddRef() = 0;
    virtual void Release() = 0;

    // Numbers that are not finite make the command a no-op. A drawing command without a current point begins
    // at its own first point, as in the HTML canvas.
    virtual void MoveTo(float x, float y) = 0;
    virtual void LineTo(float x, float y) = 0;
    virtual void QuadraticCurveTo(float cx, float cy, float x, float y) = 0;
    virtual void BezierCurveTo(float c1x, float c1y, float c2x, float c2y, float x, float y) = 0;
    virtual void ArcTo(float x1, float y1, float x2, float y2, float radius) = 0;
    virtual void Arc(float cx, float cy, float radius, float startAngle, float endAngle,
                     bool counterClockwise) = 0;
    virtual void Ellipse(float cx, float cy, float rx, float ry, float rotation, float startAngle,
                         float endAngle, bool counterClockwise) = 0;
    // The elliptical arc of SVG path data; `rotation` in degrees.
    virtual void SvgArcTo(float rx, float ry, float rotation, bool largeArc, bool sweep, float x,
                          float y) = 0;
    virtual void AddRect(const Rect& rect) = 0;
    virtual void AddRoundedRect(const Rect& rect, const CornerRadii& radii) = 0;
    virtual void Close() = 0;
    virtual void Reset() = 0;
    virtual void SetFillRule(FillRule rule) = 0;
    // A hint of the canvas switch: curves may be flattened more coarsely.
    virtual void SetFastLineSegmentDrawing(bool enabled) = 0;

    virtual bool IsEmpty() const = 0;
    virtual FillRule GetFillRule() const = 0;
    // Of all points, control points included; empty for an empty path.
    virtual Rect GetBounds() const = 0;
    // Over verbs, points and fill rule; equal paths have equal hashes.
    virtual uint64_t GetHash() const = 0;
    virtual bool Equals(const Path& other) const = 0;
    virtual const PathVerb* GetVerbs() const = 0;
    virtual size_t GetVerbCount() const = 0;
    // Move and Line use one point, Quad two, Cubic three, Close none.
    virtual const Point* GetPoints() const = 0;
    virtual size_t GetPointCount() const = 0;

  protected:
    ~Path() = default;
};

// A path whose points move while its commands stay.
class AnimatedPath {
  public:
    static AnimatedPath* Create();

    virtual void AddRef() = 0;
    virtual void Release() = 0;
    // Copies the commands of `path`.
    virtual void SetPath(const Path& path) = 0;
    // Overwrites `count` points from `first` on; a range that does not fit is refused.
    virtual bool SetPoints(size_t first, const Point* points, size_t count) = 0;
    virtual const Path& GetPath() const = 0;

  protected:
    ~AnimatedPath() = default;
};

}  // namespace fresco
