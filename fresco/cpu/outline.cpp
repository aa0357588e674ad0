#include "fresco/cpu/outline.h"

#include <fresco/paint.h>

namespace fresco::cpu {
namespace {

// Largest distance between a curve and its chords, in device pixels.
// At this a circle of 60 pixels loses less than a thousandth of its area.
constexpr double kTolerance = 1.0 / 32;
constexpr int kMaxCurvePieces = 512;
// What lies nearer to the eye's plane than this is cut off.
constexpr double kNear = 1.0 / 1024;
constexpr double kPi = 3.14159265358979323846;

Vec2 ToVec(Point p) {
    return {p.x, p.y};
}

double Distance(Vec2 a, Vec2 b) {
    return std::hypot(b.x - a.x, b.y - a.y);
}

// Chords that keep a Bezier curve within the tolerance, from its second differences (Wang's bound).
int CurvePieces(double secondDifference, double factor, double scale) {
    const double pieces = std::ceil(std::sqrt(secondDifference * scale * factor / kTolerance));
    return int(std::clamp(pieces, 1.0, double(kMaxCurvePieces)));
}

double SecondDifference(Vec2 a, Vec2 b, Vec2 c) {
    const double x = a.x - 2 * b.x + c.x, y = a.y - 2 * b.y + c.y;
    return std::sqrt(x * x + y * y);
}

// A factor from user units to device pixels that is good enough to count chords with.
double ScaleOf(const PathView& path, const Homography& transform) {
    if (transform.IsAffine()) return transform.MaxScale();
    double scale = 0;
    for (size_t i = 0; i < path.pointCount; ++i) {
        const Point p = path.points[i];
        if (transform.wx * p.x + transform.wy * p.y + transform.w0 < kNear) continue;
        scale = std::max(scale, transform.MaxScale(p.x, p.y));
    }
    return std::clamp(scale, 1e-3, 1e4);
}

}  // namespace

IRect OutlineBuilder::DeviceBounds(const PathView& path, const Homography& transform, double outset) {
    double x0 = 1e30, y0 = 1e30, x1 = -1e30, y1 = -1e30;
    const auto add = [&](double x, double y) {
        x0 = std::min(x0, x), y0 = std::min(y0, y), x1 = std::max(x1, x), y1 = std::max(y1, y);
    };
    if (!transform.IsAffine()) {
        // The hull of the control points may cross the eye's plane, where bounds have no meaning.
        for (size_t i = 0; i < path.pointCount; ++i) {
            const Point p = path.points[i];
            for (const double dx : {-outset, outset}) {
                for (const double dy : {-outset, outset}) {
                    const double px = p.x + dx, py = p.y + dy;
                    if (transform.wx * px + transform.wy * py + transform.w0 < kNear)
                        return RoundOut(-1e9, -1e9, 1e9, 1e9);
                    const Vec2 v = transform.Project(px, py);
                    add(v.x, v.y);
                }
            }
        }
        return RoundOut(x0 - 1, y0 - 1, x1 + 1, y1 + 1);
    }
    for (size_t i = 0; i < path.pointCount; ++i) {
        const Vec2 v = transform.Apply(path.points[i].x, path.points[i].y);
        add(v.x, v.y);
    }
    if (path.pointCount == 0) return {};
    const double grow = outset * transform.MaxScale();
    // A line has no area, but its stroke may have.
    return RoundOut(x0 - grow - 1e-3, y0 - grow - 1e-3, x1 + grow + 1e-3, y1 + grow + 1e-3);
}

void OutlineBuilder::AddPolygon(const Vec2* points, size_t count, const Homography& transform, bool orient,
                                Rasterizer& out) {
    if (count < 3) return;
    bool reverse = false;
    if (orient) {
        double area = 0;
        for (size_t i = 0, j = count - 1; i < count; j = i++)
            area += points[j].x * points[i].y - points[i].x * points[j].y;
        reverse = area < 0;
    }
    const auto flush = [&] {
        if (reverse) std::reverse(device_.begin(), device_.end());
        out.AddContour(device_.data(), device_.size());
    };
    if (transform.IsAffine()) {
        device_.resize(count);
        for (size_t i = 0; i < count; ++i)
            device_[i] = transform.Apply(points[i].x, points[i].y);
        return flush();
    }
    // Sutherland and Hodgman against w >= kNear, then the division.
    near_.clear();
    clipped_.clear();
    for (size_t i = 0; i < count; ++i) {
        const Vec2 v = transform.Apply(points[i].x, points[i].y);
        near_.push_back({v.x, v.y, transform.wx * points[i].x + transform.wy * points[i].y + transform.w0});
    }
    for (size_t i = 0, j = count - 1; i < count; j = i++) {
        const Vec3 a = near_[j], b = near_[i];
        if ((a.w >= kNear) != (b.w >= kNear)) {
            const double t = (kNear - a.w) / (b.w - a.w);
            clipped_.push_back({a.x + (b.x - a.x) * t, a.y + (b.y - a.y) * t, kNear});
        }
        if (b.w >= kNear) clipped_.push_back(b);
    }
    device_.resize(clipped_.size());
    for (size_t i = 0; i < clipped_.size(); ++i)
        device_[i] = {clipped_[i].x / clipped_[i].w, clipped_[i].y / clipped_[i].w};
    flush();
}

void OutlineBuilder::FlushFill(const Homography& transform, Rasterizer& out) {
    AddPolygon(contour_.data(), contour_.size(), transform, false, out);
}

// Walks the verbs and collects each contour as a polyline in user units. Curves are cut evenly in their
// parameter: the count depends on the transform, the points do not.
void OutlineBuilder::FlattenContours(const PathView& path, const Homography& transform, bool forStroke,
                                     const StrokeStyle* style, Rasterizer& out) {
    const double scale = ScaleOf(path, transform);
    pieceScale_ = scale;
    contour_.clear();
    smooth_.clear();
    const Point* p = path.points;
    Vec2 start, current;
    const auto add = [&](Vec2 v, bool smooth) {
        contour_.push_back(v);
        if (forStroke) smooth_.push_back(smooth);
        current = v;
    };
    const auto flush = [&](bool closed) {
        if (forStroke)
            FlushStroke(closed, *style, transform, out);
        else
            FlushFill(transform, out);
        contour_.clear();
        smooth_.clear();
    };
    for (size_t i = 0; i < path.verbCount; ++i) {
        switch (path.verbs[i]) {
            case PathVerb::Move:
                flush(false);
                start = ToVec(*p++);
                add(start, false);
                break;
            case PathVerb::Line:
                add(ToVec(*p++), false);
                break;
            case PathVerb::Quad: {
                const Vec2 a = current, b = ToVec(p[0]), c = ToVec(p[1]);
                const int pieces = CurvePieces(SecondDifference(a, b, c), 0.25, scale);
                for (int k = 1; k < pieces; ++k) {
                    const double t = double(k) / pieces, u = 1 - t;
                    add({u * u * a.x + 2 * u * t * b.x + t * t * c.x,
                         u * u * a.y + 2 * u * t * b.y + t * t * c.y},
                        true);
                }
                add(c, false);
                p += 2;
                break;
            }
            case PathVerb::Cubic: {
                const Vec2 a = current, b = ToVec(p[0]), c = ToVec(p[1]), d = ToVec(p[2]);
                const double bend = std::max(SecondDifference(a, b, c), SecondDifference(b, c, d));
                const int pieces = CurvePieces(bend, 0.75, scale);
                for (int k = 1; k < pieces; ++k) {
                    const double t = double(k) / pieces, u = 1 - t;
                    const double w0 = u * u * u, w1 = 3 * u * u * t, w2 = 3 * u * t * t, w3 = t * t * t;
                    add({w0 * a.x + w1 * b.x + w2 * c.x + w3 * d.x,
                         w0 * a.y + w1 * b.y + w2 * c.y + w3 * d.y},
                        true);
                }
                add(d, false);
                p += 3;
                break;
            }
            case PathVerb::Close:
                flush(true);
                add(start, false);
                break;
        }
    }
    // What Close left behind is a single point without a stroke of its own.
    const bool afterClose = path.verbCount > 0 && path.verbs[path.verbCount - 1] == PathVerb::Close;
    if (!afterClose) flush(false);
}

void OutlineBuilder::AddFill(const PathView& path, const Homography& transform, Rasterizer& out) {
    FlattenContours(path, transform, false, nullptr, out);
}

void OutlineBuilder::AddStroke(const PathView& path, const StrokeStyle& style, const Homography& transform,
                               Rasterizer& out) {
    if (!(style.width > 0)) return;
    FlattenContours(path, transform, true, &style, out);
}

void OutlineBuilder::AddPie(Vec2 p, double from, double sweep, double radius, const Homography& transform,
                            Rasterizer& out) {
    const double chord = std::clamp(kTolerance / std::max(radius * pieceScale_, 1e-6), 1e-6, 1.0);
    const double step = 2 * std::acos(1 - chord);
    const int pieces = int(std::clamp(std::ceil(std::abs(sweep) / step), 1.0, double(kMaxCurvePieces)));
    piece_.clear();
    piece_.push_back(p);
    for (int i = 0; i <= pieces; ++i) {
        const double angle = from + sweep * i / pieces;
        piece_.push_back({p.x + radius * std::cos(angle), p.y + radius * std::sin(angle)});
    }
    AddPolygon(piece_.data(), piece_.size(), transform, true, out);
}

void OutlineBuilder::AddJoin(Vec2 p, Vec2 d0, Vec2 d1, bool smooth, const StrokeStyle& style,
                             const Homography& transform, Rasterizer& out) {
    const double radius = style.width / 2;
    const double cross = d0.x * d1.y - d0.y * d1.x, dot = d0.x * d1.x + d0.y * d1.y;
    if (std::abs(cross) < 1e-9 && dot > 0) return;
    const double side = cross > 0 ? -1 : 1;  // the outer side, as a factor of the left normal (-dy, dx)
    const Vec2 a{p.x - d0.y * radius * side, p.y + d0.x * radius * side};
    const Vec2 b{p.x - d1.y * radius * side, p.y + d1.x * radius * side};
    if (!smooth && style.join == kJoinRound) {
        const double from = std::atan2(a.y - p.y, a.x - p.x);
        double sweep = std::atan2(b.y - p.y, b.x - p.x) - from;
        if (sweep > kPi) sweep -= 2 * kPi;
        if (sweep < -kPi) sweep += 2 * kPi;
        return AddPie(p, from, sweep, radius, transform, out);
    }
    // 1 / sin of half the angle between the two lines is the miter's length in stroke widths.
    const double halfSine = std::sqrt(std::max(0.0, (1 + dot) / 2));
    const bool miter =
        (smooth && dot > 0) || (!smooth && style.join == kJoinMiter && halfSine * style.miterLimit >= 1);
    if (miter && halfSine > 1e-6) {
        const Vec2 middle{-(d0.y + d1.y) * side, (d0.x + d1.x) * side};
        const double length = std::hypot(middle.x, middle.y), reach = radius / halfSine / length;
        const Vec2 quad[] = {p, a, {p.x + middle.x * reach, p.y + middle.y * reach}, b};
        return AddPolygon(quad, 4, transform, true, out);
    }
    const Vec2 triangle[] = {p, a, b};
    AddPolygon(triangle, 3, transform, true, out);
}

void OutlineBuilder::AddCap(Vec2 p, Vec2 outward, const StrokeStyle& style, const Homography& transform,
                            Rasterizer& out) {
    const double radius = style.width / 2;
    if (style.cap == kCapRound) {
        return AddPie(p, std::atan2(outward.y, outward.x) - kPi / 2, kPi, radius, transform, out);
    }
    if (style.cap == kCapSquare) {
        const Vec2 n{-outward.y * radius, outward.x * radius}, o{outward.x * radius, outward.y * radius};
        const Vec2 quad[] = {{p.x + n.x, p.y + n.y},
                             {p.x + n.x + o.x, p.y + n.y + o.y},
                             {p.x - n.x + o.x, p.y - n.y + o.y},
                             {p.x - n.x, p.y - n.y}};
        AddPolygon(quad, 4, transform, true, out);
    }
}

void OutlineBuilder::FlushStroke(bool closed, const StrokeStyle& style, const Homography& transform,
                                 Rasterizer& out) {
    // Points that fall together have no direction.
    size_t count = 0;
    for (size_t i = 0; i < contour_.size(); ++i) {
        if (count > 0 && Distance(contour_[count - 1], contour_[i]) < 1e-6) continue;
        contour_[count] = contour_[i];
        smooth_[count++] = smooth_[i];
    }
    if (closed && count > 1 && Distance(contour_[0], contour_[count - 1]) < 1e-6) --count;
    if (count == 0 || (contour_.size() == 1 && !closed)) return;
    if (count == 1) {
        // A contour of no length is a dot under round and square caps.
        AddCap(contour_[0], {1, 0}, style, transform, out);
        AddCap(contour_[0], {-1, 0}, style, transform, out);
        return;
    }
    const double radius = style.width / 2;
    const size_t segments = closed ? count : count - 1;
    Vec2 first, previous;
    for (size_t i = 0; i < segments; ++i) {
        const Vec2 a = contour_[i], b = contour_[(i + 1) % count];
        const double length = Distance(a, b);
        const Vec2 d{(b.x - a.x) / length, (b.y - a.y) / length};
        const Vec2 n{-d.y * radius, d.x * radius};
        const Vec2 quad[] = {
            {a.x + n.x, a.y + n.y}, {b.x + n.x, b.y + n.y}, {b.x - n.x, b.y - n.y}, {a.x - n.x, a.y - n.y}};
        AddPolygon(quad, 4, transform, true, out);
        if (i > 0)
            AddJoin(a, previous, d, smooth_[i], style, transform, out);
        else
            first = d;
        previous = d;
    }
    if (closed) return AddJoin(contour_[0], previous, first, smooth_[0], style, transform, out);
    AddCap(contour_[0], {-first.x, -first.y}, style, transform, out);
    AddCap(contour_[count - 1], previous, style, transform, out);
}

}  // namespace fresco::cpu
