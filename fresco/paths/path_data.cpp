#include "fresco/paths/path_data.h"

namespace fresco {

void PathData::Clear() {
    verbs.clear();
    points.clear();
}

void PathData::MoveTo(Point p) {
    verbs.push_back(PathVerb::Move);
    points.push_back(p);
}

void PathData::LineTo(Point p) {
    verbs.push_back(PathVerb::Line);
    points.push_back(p);
}

void PathData::QuadTo(Point c, Point p) {
    verbs.push_back(PathVerb::Quad);
    points.push_back(c);
    points.push_back(p);
}

void PathData::CubicTo(Point c1, Point c2, Point p) {
    verbs.push_back(PathVerb::Cubic);
    points.push_back(c1);
    points.push_back(c2);
    points.push_back(p);
}

void PathData::Close() {
    verbs.push_back(PathVerb::Close);
}

void PathData::AddRect(float x, float y, float width, float height) {
    MoveTo({x, y});
    LineTo({x + width, y});
    LineTo({x + width, y + height});
    LineTo({x, y + height});
    Close();
}

void PathData::AddArc(Point center, float rx, float ry, float rotation, float start, float sweep) {
    // One cubic for 45 degrees at most: its error is below 5e-6 of the radius.
    const int pieces = std::max(1, int(std::ceil(std::abs(sweep) / 0.7854f - 1e-4f)));
    const double step = double(sweep) / pieces;
    const double k = 4.0 / 3.0 * std::tan(step / 4);
    const double cosR = std::cos(double(rotation)), sinR = std::sin(double(rotation));
    const auto at = [&](double ux, double uy) {
        const double x = ux * rx, y = uy * ry;
        return Point{float(center.x + x * cosR - y * sinR), float(center.y + x * sinR + y * cosR)};
    };
    for (int i = 0; i < pieces; ++i) {
        const double a = start + step * i, b = start + step * (i + 1);
        const double ca = std::cos(a), sa = std::sin(a), cb = std::cos(b), sb = std::sin(b);
        CubicTo(at(ca - k * sa, sa + k * ca), at(cb + k * sb, sb - k * cb), at(cb, sb));
    }
}

namespace {

// Half of a quarter circle as a cubic: the unit points between (1, 0) and (0, 1).
constexpr float kArcTan = 0.26521648984f;  // 4/3 tan(pi/16)
constexpr float kHalf = 0.70710678119f;

void AddCorner(PathData& path, Point center, Point u, Point v) {
    // From center + u to center + v along the ellipse, u and v its half axes.
    const auto at = [&](float a, float b) {
        return Point{center.x + u.x * a + v.x * b, center.y + u.y * a + v.y * b};
    };
    path.CubicTo(at(1, kArcTan), at(kHalf + kArcTan * kHalf, kHalf - kArcTan * kHalf), at(kHalf, kHalf));
    path.CubicTo(at(kHalf - kArcTan * kHalf, kHalf + kArcTan * kHalf), at(kArcTan, 1), at(0, 1));
}

}  // namespace

void PathData::AddRoundedRect(const Rect& rect, const CornerRadii& radii) {
    const float left = rect.x, top = rect.y, right = rect.x + rect.width, bottom = rect.y + rect.height;
    const auto rounded = [](Point r) { return r.x > 0 && r.y > 0; };
    const Point tl = rounded(radii.topLeft) ? radii.topLeft : Point{};
    const Point tr = rounded(radii.topRight) ? radii.topRight : Point{};
    const Point br = rounded(radii.bottomRight) ? radii.bottomRight : Point{};
    const Point bl = rounded(radii.bottomLeft) ? radii.bottomLeft : Point{};
    MoveTo({left + tl.x, top});
    LineTo({right - tr.x, top});
    if (tr.x > 0) AddCorner(*this, {right - tr.x, top + tr.y}, {0, -tr.y}, {tr.x, 0});
    LineTo({right, bottom - br.y});
    if (br.x > 0) AddCorner(*this, {right - br.x, bottom - br.y}, {br.x, 0}, {0, br.y});
    LineTo({left + bl.x, bottom});
    if (bl.x > 0) AddCorner(*this, {left + bl.x, bottom - bl.y}, {0, bl.y}, {-bl.x, 0});
    LineTo({left, top + tl.y});
    if (tl.x > 0) AddCorner(*this, {left + tl.x, top + tl.y}, {-tl.x, 0}, {0, -tl.y});
    Close();
}

void PathData::AddEllipse(float cx, float cy, float rx, float ry) {
    MoveTo({cx + rx, cy});
    AddCorner(*this, {cx, cy}, {rx, 0}, {0, ry});
    AddCorner(*this, {cx, cy}, {0, ry}, {-rx, 0});
    AddCorner(*this, {cx, cy}, {-rx, 0}, {0, -ry});
    AddCorner(*this, {cx, cy}, {0, -ry}, {rx, 0});
    Close();
}

}  // namespace fresco
