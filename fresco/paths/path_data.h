// The storage behind Path: verbs and points. The back ends build scratch outlines with it too.
#pragma once
#include <fresco/path.h>
#include "fresco/core/heap.h"

namespace fresco {

struct PathData {
    Vector<PathVerb> verbs;
    Vector<Point> points;

    void Clear();
    void MoveTo(Point p);
    void LineTo(Point p);
    void QuadTo(Point c, Point p);
    void CubicTo(Point c1, Point c2, Point p);
    void Close();
    void AddRect(float x, float y, float width, float height);
    // Corners that are wider or higher than the box are drawn as they are; the caller has fitted them.
    void AddRoundedRect(const Rect& rect, const CornerRadii& radii);
    void AddEllipse(float cx, float cy, float rx, float ry);
    // An elliptical arc as cubics, from the current point on; `sweep` in radians, either sign.
    void AddArc(Point center, float rx, float ry, float rotation, float start, float sweep);
};

}  // namespace fresco
