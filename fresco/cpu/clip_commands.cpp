// Clip records. Rectangles on pixel edges stay rectangles; everything else becomes coverage.
#include "fresco/core/log.h"
#include "fresco/cpu/cpu_backend.h"

namespace fresco::cpu {
namespace {

// Positions this near to a pixel edge are taken as on it: less than the 8 bits of coverage can show.
constexpr double kOnEdge = 1.0 / 1024;

bool OnEdge(double v) {
    return std::abs(v - std::round(v)) < kOnEdge;
}

PathData QuadPath(const Point points[4]) {
    PathData path;
    path.MoveTo(points[0]);
    for (int i = 1; i < 4; ++i)
        path.LineTo(points[i]);
    path.Close();
    return path;
}

}  // namespace

// True when the rectangle is one of whole pixels on the device.
bool CpuBackend::AlignedRect(const Rect& rect, const Homography& plane, IRect* aligned) const {
    if (!plane.IsScaleTranslate()) return false;
    const Vec2 a = plane.Apply(rect.x, rect.y);
    const Vec2 b = plane.Apply(double(rect.x) + rect.width, double(rect.y) + rect.height);
    if (!OnEdge(a.x) || !OnEdge(a.y) || !OnEdge(b.x) || !OnEdge(b.y)) return false;
    const double x0 = std::min(a.x, b.x), y0 = std::min(a.y, b.y), x1 = std::max(a.x, b.x),
                 y1 = std::max(a.y, b.y);
    *aligned = RoundOut(std::round(x0), std::round(y0), std::round(x1), std::round(y1));
    return true;
}

void CpuBackend::ApplyClipRect(const IRect& rect, uint32_t mode) {
    switch (mode) {
        case kClipExclude:
            return clip_.ExcludeRect(rect);
        case kClipIntersect:
            return clip_.IntersectRect(rect);
        case kClipAdd: {
            Clip added = base_;
            added.IntersectRect(rect);
            if (added.IsSimple()) return clip_.AddRect(added.bounds());
            // The base is a region or a mask itself: add it as coverage.
            ClipMaskPtr mask = MakeClipMask(added.bounds());
            if (!mask) return;
            MaskSink sink(*mask);
            const IRect b = added.bounds();
            for (int y = b.y0; y < b.y1; ++y)
                added.Filter(y, b.x0, b.x1, 255, sink);
            return clip_.AddMask(mask);
        }
        default:
            clip_ = base_;
            return clip_.IntersectRect(rect);
    }
}

void CpuBackend::ApplyClip(const PathView& path, const Homography& plane, FillRule rule, uint32_t mode) {
    const IRect device = OutlineBuilder::DeviceBounds(path, plane);
    if (scissor_ && (mode == kClipSet || mode == kClipAdd)) return ApplyClipRect(device, mode);
    EndScissors();
    // Only what the clip can let through needs coverage.
    const IRect limit = mode == kClipSet || mode == kClipAdd ? base_.bounds() : clip_.bounds();
    const IRect bounds = Intersect(device, limit);
    if (!shared_.clipMasks.HasRoom(bounds)) {
        FRESCO_WARN("No room for a clip of %d x %d pixels, clipping to its box", bounds.Width(),
                    bounds.Height());
        if (mode != kClipExclude) ApplyClipRect(bounds, mode);
        return;
    }
    ClipMaskPtr mask = MakeClipMask(bounds, &shared_.clipMasks);
    if (mask) {
        MaskSink sink(*mask);
        rasterizer_.Begin(bounds);
        builder_.AddFill(path, plane, rasterizer_);
        rasterizer_.Sweep(rule, sink);
        // Inside of the shape, as a small repaint often is: nothing to test for each span.
        if (mode != kClipAdd && mask->IsFull()) return ApplyClipRect(bounds, mode);
    }
    switch (mode) {
        case kClipExclude:
            return clip_.ExcludeMask(mask);
        case kClipIntersect:
            return clip_.IntersectMask(mask);
        case kClipAdd: {
            if (!mask) return;
            Clip added = base_;
            added.IntersectMask(mask);
            ClipMaskPtr visible = MakeClipMask(bounds);
            if (!visible) return;
            MaskSink sink(*visible);
            for (int y = bounds.y0; y < bounds.y1; ++y)
                added.Filter(y, bounds.x0, bounds.x1, 255, sink);
            return clip_.AddMask(visible);
        }
        default:
            clip_ = base_;
            return clip_.IntersectMask(mask);
    }
}

void CpuBackend::BeginScissor(const BeginScissorRecord&, const NoneTail&) {
    scissor_ = true;
    base_ = clip_;
}

void CpuBackend::ClipRect(const ClipRectRecord& record, const NoneTail&) {
    const Homography plane = PlaneAt(record.rect.z);
    IRect aligned;
    if (AlignedRect(record.rect, plane, &aligned)) {
        if (record.mode == kClipExclude || record.mode == kClipIntersect) EndScissors();
        return ApplyClipRect(aligned, record.mode);
    }
    path_.Clear();
    path_.AddRect(record.rect.x, record.rect.y, record.rect.width, record.rect.height);
    ApplyClip(path_, plane, kFillNonZero, record.mode);
}

void CpuBackend::ClipQuad(const ClipQuadRecord& record, const NoneTail&) {
    const Point3* p = record.quad.points;
    const bool upright = (p[0].y == p[1].y && p[1].x == p[2].x && p[2].y == p[3].y && p[3].x == p[0].x) ||
                         (p[0].x == p[1].x && p[1].y == p[2].y && p[2].x == p[3].x && p[3].y == p[0].y);
    const Homography plane = PlaneAt(p[0].z);
    IRect aligned;
    const Rect rect{std::min(p[0].x, p[2].x), std::min(p[0].y, p[2].y), p[0].z, std::abs(p[2].x - p[0].x),
                    std::abs(p[2].y - p[0].y)};
    if (upright && AlignedRect(rect, plane, &aligned)) {
        if (record.mode == kClipExclude || record.mode == kClipIntersect) EndScissors();
        return ApplyClipRect(aligned, record.mode);
    }
    const Point points[4] = {{p[0].x, p[0].y}, {p[1].x, p[1].y}, {p[2].x, p[2].y}, {p[3].x, p[3].y}};
    ApplyClip(QuadPath(points), plane, kFillNonZero, record.mode);
}

void CpuBackend::ClipRoundedRect(const ClipRoundedRectRecord& record, const NoneTail&) {
    path_.Clear();
    path_.AddRoundedRect(record.rect, record.radii);
    ApplyClip(path_, PlaneAt(record.rect.z), kFillNonZero, record.mode);
}

void CpuBackend::ClipEllipse(const ClipEllipseRecord& record, const NoneTail&) {
    path_.Clear();
    path_.AddEllipse(record.circle.cx, record.circle.cy, record.circle.rx, record.circle.ry);
    ApplyClip(path_, PlaneAt(record.circle.z), kFillNonZero, record.mode);
}

void CpuBackend::ClipPath(const ClipPathRecord& record, const PathTail& path) {
    ApplyClip({path.verbs, path.verbCount, path.points, path.pointCount}, PlaneAt(0), path.fillRule,
              record.mode);
}

}  // namespace fresco::cpu
