// Fills and strokes of rectangles, quadrilaterals, ellipses and paths, in one colour or a gradient.
#include "fresco/cpu/cpu_backend.h"

namespace fresco::cpu {
namespace {

Rect Outset(const Rect& rect, float by) {
    return {rect.x - by, rect.y - by, rect.z, rect.width + 2 * by, rect.height + 2 * by};
}

// Radii of an outline that runs `by` outside of another; square corners stay square.
CornerRadii Outset(const CornerRadii& radii, float by) {
    const auto grow = [by](Point r) {
        return r.x > 0 && r.y > 0 ? Point{std::max(0.0f, r.x + by), std::max(0.0f, r.y + by)} : Point{};
    };
    return {grow(radii.topLeft), grow(radii.topRight), grow(radii.bottomRight), grow(radii.bottomLeft)};
}

// Corners that are larger than the box reach out of it.
Rect BoundsOf(const Rect& rect, const CornerRadii& radii) {
    float most = 0;
    for (const Point& r : {radii.topLeft, radii.topRight, radii.bottomRight, radii.bottomLeft})
        most = std::max({most, r.x, r.y});
    return most * 2 <= std::min(rect.width, rect.height) ? rect : Outset(rect, most);
}

}  // namespace

void CpuBackend::DrawRect(const Rect& rect, const Ink& ink) {
    EndScissors();
    const Homography plane = PlaneAt(rect.z);
    if (ink.DrawsNothing() || IsOutside(rect, plane)) return;
    IRect aligned;
    if (AlignedRect(rect, plane, &aligned)) return FillAligned(aligned, ink);
    path_.Clear();
    path_.AddRect(rect.x, rect.y, rect.width, rect.height);
    DrawOutline(path_, plane, kFillNonZero, ink);
}

void CpuBackend::ClearRect(const ClearRectRecord& record, const NoneTail&) {
    Ink ink;
    ink.blend = kBlendClear;
    if (record.flag & 1) {
        EndScissors();
        const Bitmap bitmap = CurrentBitmap();
        const bool onTarget = bitmap.data == target_.data;
        const IRect area = onTarget ? Intersect(bitmap.bounds, band_) : bitmap.bounds;
        for (int y = area.y0; y < area.y1; ++y)
            std::memset(bitmap.Row(y) + area.x0, 0, size_t(area.Width()) * 4);
        Touch(area);
        return;
    }
    DrawRect(record.rect, ink);
}

void CpuBackend::FillRect(const FillRectRecord& record, const NoneTail&) {
    DrawRect(record.rect, SolidInk(record.paint));
}

void CpuBackend::StrokeRect(const StrokeRectRecord& record, const NoneTail&) {
    const Ink ink = SolidInk(record.paint);
    const Homography plane = PlaneAt(record.rect.z);
    path_.Clear();
    if (record.paint.lineJoin != kJoinMiter) {
        path_.AddRect(record.rect.x, record.rect.y, record.rect.width, record.rect.height);
        return DrawStroke(path_, plane, record.paint, ink);
    }
    // Sharp corners: a frame of two rectangles is exact.
    const float half = record.paint.strokeWidth / 2;
    if (!(half > 0)) return;
    const Rect outer = Outset(record.rect, half), inner = Outset(record.rect, -half);
    path_.AddRect(outer.x, outer.y, outer.width, outer.height);
    if (inner.width > 0 && inner.height > 0) path_.AddRect(inner.x, inner.y, inner.width, inner.height);
    DrawOutline(path_, plane, kFillEvenOdd, ink);
}

void CpuBackend::FillQuad(const FillQuadRecord& record, const NoneTail&) {
    path_.Clear();
    path_.MoveTo(record.quad.points[0]);
    for (int i = 1; i < 4; ++i)
        path_.LineTo(record.quad.points[i]);
    path_.Close();
    DrawOutline(path_, PlaneAt(0), kFillNonZero, SolidInk(record.paint));
}

void CpuBackend::FillRoundedRect(const FillRoundedRectRecord& record, const NoneTail&) {
    const Homography plane = PlaneAt(record.rect.z);
    if (IsOutside(BoundsOf(record.rect, record.radii), plane)) return EndScissors();
    path_.Clear();
    path_.AddRoundedRect(record.rect, record.radii);
    DrawOutline(path_, plane, kFillNonZero, SolidInk(record.paint));
}

void CpuBackend::StrokeRoundedRect(const StrokeRoundedRectRecord& record, const NoneTail&) {
    const float half = record.paint.strokeWidth / 2;
    const Rect reach = Outset(BoundsOf(record.rect, record.radii), half);
    if (!(half > 0) || IsOutside(reach, PlaneAt(record.rect.z))) return EndScissors();
    const Rect inner = Outset(record.rect, -half);
    path_.Clear();
    path_.AddRoundedRect(Outset(record.rect, half), Outset(record.radii, half));
    if (inner.width > 0 && inner.height > 0) path_.AddRoundedRect(inner, Outset(record.radii, -half));
    DrawOutline(path_, PlaneAt(record.rect.z), kFillEvenOdd, SolidInk(record.paint));
}

void CpuBackend::FillEllipse(const FillEllipseRecord& record, const NoneTail&) {
    const Circle& c = record.circle;
    if (!(c.rx > 0) || !(c.ry > 0)) return;
    path_.Clear();
    path_.AddEllipse(c.cx, c.cy, c.rx, c.ry);
    DrawOutline(path_, PlaneAt(c.z), kFillNonZero, SolidInk(record.paint));
}

void CpuBackend::StrokeEllipse(const StrokeEllipseRecord& record, const NoneTail&) {
    const Circle& c = record.circle;
    const float half = record.paint.strokeWidth / 2;
    if (!(half > 0) || c.rx < 0 || c.ry < 0) return;
    path_.Clear();
    if (c.rx != c.ry) {
        // The line beside an ellipse is no ellipse.
        path_.AddEllipse(c.cx, c.cy, c.rx, c.ry);
        return DrawStroke(path_, PlaneAt(c.z), record.paint, SolidInk(record.paint));
    }
    path_.AddEllipse(c.cx, c.cy, c.rx + half, c.ry + half);
    if (c.rx > half) path_.AddEllipse(c.cx, c.cy, c.rx - half, c.ry - half);
    DrawOutline(path_, PlaneAt(c.z), kFillEvenOdd, SolidInk(record.paint));
}

void CpuBackend::FillPath(const FillPathRecord& record, const PathTail& path) {
    DrawOutline({path.verbs, path.verbCount, path.points, path.pointCount}, PlaneAt(0), path.fillRule,
                SolidInk(record.paint));
}

void CpuBackend::StrokePath(const StrokePathRecord& record, const PathTail& path) {
    DrawStroke({path.verbs, path.verbCount, path.points, path.pointCount}, PlaneAt(0), record.paint,
               SolidInk(record.paint));
}

void CpuBackend::FillAnimatedPath(const FillAnimatedPathRecord& record, const PathTail& path) {
    DrawOutline({path.verbs, path.verbCount, path.points, path.pointCount}, PlaneAt(0), path.fillRule,
                SolidInk(record.morph.paint));
}

void CpuBackend::StrokeAnimatedPath(const StrokeAnimatedPathRecord& record, const PathTail& path) {
    DrawStroke({path.verbs, path.verbCount, path.points, path.pointCount}, PlaneAt(0), record.morph.paint,
               SolidInk(record.morph.paint));
}

// The geometry is in units of the rectangle's larger side, from its corner.
void CpuBackend::DrawGradient(const Rect& rect, const Paint& paint, const StopsTail& stops,
                              const LinearGradient* linear, const RadialGradient* radial) {
    const float unit = std::max(std::abs(rect.width), std::abs(rect.height));
    Homography toDevice = PlaneAt(rect.z), place, toUnit;
    place.xx = place.yy = unit, place.x0 = rect.x, place.y0 = rect.y;
    if (!(unit > 0) || IsOutside(rect, toDevice) || !(toDevice * place).Invert(&toUnit)) return;
    GradientSource source =
        linear ? GradientSource(*linear, toUnit, gradient_) : GradientSource(*radial, toUnit, gradient_);
    source.SetStops(stops.stops, stops.count, std::clamp(paint.color.a * paint.opacity, 0.0f, 1.0f));
    Ink ink;
    ink.source = &source;
    ink.blend = paint.blend;
    DrawRect(rect, ink);
}

void CpuBackend::FillLinearGradient(const FillLinearGradientRecord& record, const StopsTail& stops) {
    DrawGradient(record.rect, record.paint, stops, &record.geometry, nullptr);
}

void CpuBackend::FillRadialGradient(const FillRadialGradientRecord& record, const StopsTail& stops) {
    DrawGradient(record.rect, record.paint, stops, nullptr, &record.geometry);
}

}  // namespace fresco::cpu
