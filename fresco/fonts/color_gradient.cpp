#include "fresco/fonts/color_gradient.h"

#include <algorithm>
#include <cmath>
#include <limits>

#include "fresco/cpu/pixels.h"

namespace fresco {
namespace {

constexpr double kNowhere = std::numeric_limits<double>::quiet_NaN();
constexpr double kPi = 3.14159265358979323846;
// In font units; gradients that are shorter have no direction.
constexpr double kLeastLength = 1e-6;

double Dot(Vec2 a, Vec2 b) {
    return a.x * b.x + a.y * b.y;
}
Vec2 Between(Vec2 from, Vec2 to) {
    return {to.x - from.x, to.y - from.y};
}

uint32_t Pack(const GlyphColorStop& c) {
    return cpu::PackPixel(c.r, c.g, c.b, c.a);
}

}  // namespace

ColorLine::ColorLine(Vector<GlyphColorStop> stops, GradientExtend extend)
    : stops_(std::move(stops)), extend_(extend) {
    std::stable_sort(stops_.begin(), stops_.end(),
                     [](const GlyphColorStop& a, const GlyphColorStop& b) { return a.offset < b.offset; });
}

uint32_t ColorLine::At(double t) const {
    if (stops_.empty() || std::isnan(t)) return 0;
    const double first = stops_.front().offset, length = stops_.back().offset - first;
    if (extend_ != GradientExtend::Pad && length > 0) {
        double turns = (t - first) / length;
        const double whole = std::floor(turns);
        turns -= whole;
        const bool backward = extend_ == GradientExtend::Reflect && std::fmod(whole, 2) != 0;
        t = first + (backward ? 1 - turns : turns) * length;
    }
    const auto after =
        std::upper_bound(stops_.begin(), stops_.end(), t,
                         [](double at, const GlyphColorStop& stop) { return at < double(stop.offset); });
    if (after == stops_.begin()) return Pack(stops_.front());
    if (after == stops_.end()) return Pack(stops_.back());
    const GlyphColorStop &a = *(after - 1), &b = *after;
    const auto part = float((t - double(a.offset)) / double(b.offset - a.offset));
    const auto mix = [part](float from, float to) { return from + (to - from) * part; };
    return cpu::PackPixel(mix(a.r, b.r), mix(a.g, b.g), mix(a.b, b.b), mix(a.a, b.a));
}

GradientGeometry GradientGeometry::Linear(Vec2 p0, Vec2 p1, Vec2 p2) {
    GradientGeometry geometry;
    const Vec2 along = Between(p0, p1), turned = Between(p0, p2);
    Vec2 normal = along;
    if (std::hypot(turned.x, turned.y) > kLeastLength) {
        // What remains of the line at a right angle to p0 p2.
        const double part = Dot(along, turned) / Dot(turned, turned);
        normal = {along.x - turned.x * part, along.y - turned.y * part};
    }
    const double square = Dot(normal, normal);
    if (!(square > kLeastLength * kLeastLength)) return geometry;
    geometry.kind_ = Kind::Linear;
    geometry.origin_ = p0;
    geometry.direction_ = {normal.x / square, normal.y / square};
    return geometry;
}

GradientGeometry GradientGeometry::Radial(Vec2 c0, double r0, Vec2 c1, double r1) {
    GradientGeometry geometry;
    if (r0 < 0 || r1 < 0) return geometry;
    geometry.kind_ = Kind::Radial;
    geometry.origin_ = c0;
    geometry.direction_ = Between(c0, c1);
    geometry.start_ = r0;
    geometry.change_ = r1 - r0;
    return geometry;
}

GradientGeometry GradientGeometry::Sweep(Vec2 center, double start, double end) {
    GradientGeometry geometry;
    if (start == end) return geometry;
    geometry.kind_ = Kind::Sweep;
    geometry.origin_ = center;
    geometry.start_ = start;
    geometry.change_ = end - start;
    return geometry;
}

// The circle through the point that lies furthest along the line, of those with a radius.
double GradientGeometry::OnCircles(Vec2 point) const {
    const Vec2 p = Between(origin_, point);
    const double a = Dot(direction_, direction_) - change_ * change_;
    const double b = Dot(p, direction_) + start_ * change_;
    const double c = Dot(p, p) - start_ * start_;
    const auto valid = [&](double t) { return start_ + t * change_ >= 0; };
    if (std::abs(a) < kLeastLength) {
        const double t = b != 0 ? c / (2 * b) : kNowhere;
        return valid(t) ? t : kNowhere;
    }
    const double square = b * b - a * c;
    if (square < 0) return kNowhere;
    const double root = std::sqrt(square);
    const double one = (b + root) / a, other = (b - root) / a;
    if (valid(std::max(one, other))) return std::max(one, other);
    return valid(std::min(one, other)) ? std::min(one, other) : kNowhere;
}

double GradientGeometry::At(Vec2 point) const {
    switch (kind_) {
        case Kind::Linear:
            return Dot(Between(origin_, point), direction_);
        case Kind::Radial:
            return OnCircles(point);
        case Kind::Sweep: {
            const Vec2 p = Between(origin_, point);
            double angle = std::atan2(p.y, p.x);
            if (angle < 0) angle += 2 * kPi;
            return (angle - start_) / change_;
        }
        default:
            return kNowhere;
    }
}

}  // namespace fresco
