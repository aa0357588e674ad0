#include "display/clip_path.h"

#include "css/values/style_groups.h"
#include "display/box_shape.h"
#include "display/path_cache.h"
#include "display/transforms.h"

#include <algorithm>
#include <cmath>

namespace qorvex::dsp {

using css::ResolveLength;
using fresco::CommandBuffer;
using layout::LayoutNode;
using layout::Point;
using layout::Rect;

namespace {

Rect ReferenceBox(const LayoutNode& node, const css::ClipPathType& clip, bool snap) {
    const Rect box = PaintBox(node, snap);
    // Without a keyword the border box (CSS Masking 1, section 7.1).
    if (!clip.hasBox) return box;
    switch (clip.box) {
        case css::ClipBox::MarginBox:
            return layout::Inset(
                box, {-node.margin().left, -node.margin().right, -node.margin().top, -node.margin().bottom});
        case css::ClipBox::PaddingBox:
            return layout::Inset(box, node.border());
        case css::ClipBox::ContentBox:
            return layout::Inset(layout::Inset(box, node.border()), node.padding());
        default:
            return box;
    }
}

bool ClipInset(const css::InsetShape& shape, const Rect& in, const css::LengthContext& lengths,
               CommandBuffer& buffer) {
    auto y = [&](const css::Length& length) { return ResolveLength(length, lengths, in.height); };
    auto x = [&](const css::Length& length) { return ResolveLength(length, lengths, in.width); };
    const Rect rect = layout::Inset(
        in, {x(shape.offsets[3]), x(shape.offsets[1]), y(shape.offsets[0]), y(shape.offsets[2])});
    if (layout::IsEmpty(rect)) return false;
    auto corner = [&](const css::BorderRadius& radius) {
        return Point{x(radius.horizontal), y(radius.vertical)};
    };
    fresco::CornerRadii radii{corner(shape.radii[0]), corner(shape.radii[1]), corner(shape.radii[2]),
                              corner(shape.radii[3])};
    FitRadii(radii, rect.width, rect.height);
    HasRadii(radii) ? buffer.ClipRoundedRect(rect, radii, fresco::kClipIntersect)
                    : buffer.ClipRect(rect, fresco::kClipIntersect);
    return true;
}

// `low` and `high` are the distances from the centre to the two sides that the keyword looks at.
float ResolveRadius(const css::ShapeRadius& radius, const css::LengthContext& lengths, float base, float low,
                    float high) {
    switch (radius.kind) {
        case css::ShapeRadiusKind::ClosestSide:
            return std::min(std::fabs(low), std::fabs(high));
        case css::ShapeRadiusKind::FarthestSide:
            return std::max(std::fabs(low), std::fabs(high));
        default:
            return ResolveLength(radius.length, lengths, base);
    }
}

bool ClipCircle(const css::CircleShape& shape, const Rect& in, const css::LengthContext& lengths,
                CommandBuffer& buffer) {
    const Point center{ResolveLength(shape.centerX, lengths, in.width),
                       ResolveLength(shape.centerY, lengths, in.height)};
    // Percentages refer to the diagonal scaled to a square (CSS Shapes 1, section 3.1).
    const float base = std::hypot(in.width, in.height) / std::sqrt(2.0f);
    const float x = ResolveRadius(shape.radius, lengths, base, center.x, in.width - center.x);
    const float y = ResolveRadius(shape.radius, lengths, base, center.y, in.height - center.y);
    const bool farthest = shape.radius.kind == css::ShapeRadiusKind::FarthestSide;
    const float radius = farthest ? std::max(x, y) : std::min(x, y);
    if (!(radius > 0)) return false;
    buffer.ClipEllipse(in.x + center.x, in.y + center.y, radius, radius, fresco::kClipIntersect);
    return true;
}

bool ClipToPath(const PathPtr& path, const Rect& in, CommandBuffer& buffer) {
    if (!path || path->IsEmpty()) return false;
    buffer.PushState(fresco::kStateTransform);
    buffer.Translate(in.x, in.y);
    buffer.ClipPath(*path, fresco::kClipIntersect);
    buffer.PopState();
    return true;
}

bool ClipShapeEllipse(const css::EllipseShape& shape, const Rect& in, PaintContext& context,
                      CommandBuffer& buffer) {
    const css::LengthContext& lengths = context.lengths;
    const Point center{ResolveLength(shape.centerX, lengths, in.width),
                       ResolveLength(shape.centerY, lengths, in.height)};
    const float rx = ResolveRadius(shape.radiusX, lengths, in.width, center.x, in.width - center.x);
    const float ry = ResolveRadius(shape.radiusY, lengths, in.height, center.y, in.height - center.y);
    if (!(rx > 0 && ry > 0)) return false;
    const TempMark mark;
    CacheKey key;
    key.Add('e').Add(center).Add(rx).Add(ry);
    const PathPtr path = context.paths.Get(key.view(), [&](fresco::Path& out) {
        out.Ellipse(center.x, center.y, rx, ry, 0, 0, 6.2831853f, false);
        out.Close();
    });
    return ClipToPath(path, in, buffer);
}

bool ClipPolygon(const css::PolygonShape& shape, const Rect& in, PaintContext& context,
                 CommandBuffer& buffer) {
    if (shape.points.size() < 3) return false;
    const TempMark mark;
    CacheKey key;
    key.Add('p').Add(shape.fillRule);
    TempVector<Point> points;
    points.reserve(shape.points.size());
    for (const css::PolygonShape::Point& point : shape.points) {
        points.push_back({ResolveLength(point.x, context.lengths, in.width),
                          ResolveLength(point.y, context.lengths, in.height)});
    }
    for (const Point& point : points)
        key.Add(point);
    const PathPtr path = context.paths.Get(key.view(), [&](fresco::Path& out) {
        out.SetFillRule(shape.fillRule == css::FillRule::EvenOdd ? fresco::kFillEvenOdd
                                                                 : fresco::kFillNonZero);
        out.MoveTo(points[0].x, points[0].y);
        for (uint32_t i = 1; i < points.size(); ++i)
            out.LineTo(points[i].x, points[i].y);
        out.Close();
    });
    return ClipToPath(path, in, buffer);
}

void BuildPath(const css::SvgPathData& data, fresco::Path& out) {
    const float* c = data.coordinates.data();
    for (const css::PathVerb verb : data.verbs) {
        switch (verb) {
            case css::PathVerb::Move:
                out.MoveTo(c[0], c[1]), c += 2;
                break;
            case css::PathVerb::Line:
                out.LineTo(c[0], c[1]), c += 2;
                break;
            case css::PathVerb::Quad:
                out.QuadraticCurveTo(c[0], c[1], c[2], c[3]), c += 4;
                break;
            case css::PathVerb::Cubic:
                out.BezierCurveTo(c[0], c[1], c[2], c[3], c[4], c[5]), c += 6;
                break;
            case css::PathVerb::Close:
                out.Close();
                break;
        }
    }
}

bool ClipSvgPath(const css::PathShape& shape, const Rect& in, PaintContext& context, CommandBuffer& buffer) {
    if (shape.data.empty()) return false;
    const TempMark mark;
    CacheKey key;
    key.Add('s');
    for (const css::PathVerb verb : shape.data.verbs)
        key.Add(verb);
    for (const float coordinate : shape.data.coordinates)
        key.Add(coordinate);
    const PathPtr path =
        context.paths.Get(key.view(), [&](fresco::Path& out) { BuildPath(shape.data, out); });
    return ClipToPath(path, in, buffer);
}

}  // namespace

bool ApplyClipPath(const LayoutNode& node, PaintContext& context, CommandBuffer& buffer) {
    const css::ClipPathType& clip = node.style->visual->clipPath;
    if (clip.IsNone()) return true;
    const Rect in = ReferenceBox(node, clip, context.snapToPixels);
    if (!clip.shape) {
        if (layout::IsEmpty(in)) return false;
        buffer.ClipRect(in, fresco::kClipIntersect);
        return true;
    }
    const css::BasicShape& shape = *clip.shape;
    switch (shape.kind()) {
        case css::ShapeKind::Inset:
            return ClipInset(static_cast<const css::InsetShape&>(shape), in, context.lengths, buffer);
        case css::ShapeKind::Circle:
            return ClipCircle(static_cast<const css::CircleShape&>(shape), in, context.lengths, buffer);
        case css::ShapeKind::Ellipse:
            return ClipShapeEllipse(static_cast<const css::EllipseShape&>(shape), in, context, buffer);
        case css::ShapeKind::Polygon:
            return ClipPolygon(static_cast<const css::PolygonShape&>(shape), in, context, buffer);
        case css::ShapeKind::Path:
            return ClipSvgPath(static_cast<const css::PathShape&>(shape), in, context, buffer);
    }
    return true;
}

}  // namespace qorvex::dsp
