#include "display/border_painter.h"

#include "display/path_cache.h"

#include <algorithm>

namespace qorvex::dsp {

using fresco::CommandBuffer;
using fresco::Paint;
using layout::Edges;
using layout::Point;
using layout::Rect;

namespace {

enum Side : uint32_t { kLeft, kRight, kTop, kBottom };

bool Draws(const BoxShape& shape, uint32_t side) {
    return (shape.bits & (1u << side)) != 0;
}

// From an outer corner along the joint of its two sides: to the inner corner, and with a round corner on to
// where the ring of the border leaves the joint, but not past the middle of the box.
Point JointEnd(const BoxShape& shape, Point corner, Point radius, float toX, float toY) {
    const float x = std::fabs(toX), y = std::fabs(toY);
    float reach = 1;
    if (x > 0) reach = std::max(reach, radius.x / x);
    if (y > 0) reach = std::max(reach, radius.y / y);
    if (x > 0) reach = std::min(reach, std::max(shape.box.width / 2 / x, 1.0f));
    if (y > 0) reach = std::min(reach, std::max(shape.box.height / 2 / y, 1.0f));
    return {corner.x + toX * reach, corner.y + toY * reach};
}

// One side's share of the border: its outer edge and the joints with its neighbours.
void SideQuad(const BoxShape& shape, uint32_t side, Point out[4]) {
    const Rect& box = shape.box;
    const Edges& b = shape.border;
    const Point topLeft{box.x, box.y}, topRight{layout::Right(box), box.y};
    const Point bottomLeft{box.x, layout::Bottom(box)}, bottomRight{layout::Right(box), layout::Bottom(box)};
    auto joint = [&](Point corner, Point radius, float x, float y) {
        return JointEnd(shape, corner, radius, x, y);
    };
    const Point innerTopLeft = joint(topLeft, shape.radii.topLeft, b.left, b.top);
    const Point innerTopRight = joint(topRight, shape.radii.topRight, -b.right, b.top);
    const Point innerBottomLeft = joint(bottomLeft, shape.radii.bottomLeft, b.left, -b.bottom);
    const Point innerBottomRight = joint(bottomRight, shape.radii.bottomRight, -b.right, -b.bottom);
    const Point quads[4][4] = {{topLeft, innerTopLeft, innerBottomLeft, bottomLeft},
                               {topRight, bottomRight, innerBottomRight, innerTopRight},
                               {topLeft, topRight, innerTopRight, innerTopLeft},
                               {bottomLeft, innerBottomLeft, innerBottomRight, bottomRight}};
    std::copy(quads[side], quads[side] + 4, out);
}

void PaintSharpBorder(const BoxShape& shape, CommandBuffer& buffer) {
    const bool uniform = (shape.bits & kShapeUniformRect) != 0;
    if (uniform && (shape.bits & kAnyDiffers) == 0) {
        const float width = shape.border.left;
        Paint paint = SolidPaint(shape.colors[kLeft]);
        paint.strokeWidth = width;
        buffer.StrokeRect(layout::Inset(shape.box, {width / 2, width / 2, width / 2, width / 2}), paint);
        return;
    }
    for (uint32_t side = 0; side < 4; ++side) {
        if (!Draws(shape, side) || shape.colors[side].a <= 0) continue;
        Point quad[4];
        SideQuad(shape, side, quad);
        buffer.FillQuad(quad, SolidPaint(shape.colors[side]));
    }
}

// At a corner between two sides that do not draw both curves of the ring would be the same, and only straight
// edges that coincide leave no trace of their smoothing.
fresco::CornerRadii RingRadii(const BoxShape& shape) {
    fresco::CornerRadii radii = shape.radii;
    const Edges& b = shape.border;
    if (b.left == 0 && b.top == 0) radii.topLeft = {};
    if (b.right == 0 && b.top == 0) radii.topRight = {};
    if (b.left == 0 && b.bottom == 0) radii.bottomLeft = {};
    if (b.right == 0 && b.bottom == 0) radii.bottomRight = {};
    return radii;
}

// The ring between the rounded border box and the rounded padding box, at the origin.
PathPtr FramePath(PaintContext& context, const BoxShape& shape) {
    const TempMark mark;
    CacheKey key;
    key.Add('f').Add(shape.box.width).Add(shape.box.height).Add(shape.radii).Add(shape.border);
    return context.paths.Get(key.view(), [&](fresco::Path& path) {
        const Rect outer{0, 0, 0, shape.box.width, shape.box.height};
        path.SetFillRule(fresco::kFillEvenOdd);
        const fresco::CornerRadii radii = RingRadii(shape);
        path.AddRoundedRect(outer, radii);
        const Rect inner = layout::Inset(outer, shape.border);
        if (!layout::IsEmpty(inner)) path.AddRoundedRect(inner, InsetRadii(radii, shape.border));
    });
}

// The whole ring in one colour; clips choose what of it shows.
void PaintRing(PaintContext& context, const BoxShape& shape, const fresco::Color& color,
               CommandBuffer& buffer) {
    Paint paint = SolidPaint(color);
    if ((shape.bits & kShapeIrregular) != 0) {
        const PathPtr path = FramePath(context, shape);
        if (!path) return;
        buffer.PushState(fresco::kStateTransform);
        buffer.Translate(shape.box.x, shape.box.y);
        buffer.FillPath(*path, paint);
        buffer.PopState();
        return;
    }
    // Uniform widths: a stroke along the middle of the ring.
    const float half = shape.border.left / 2;
    paint.strokeWidth = shape.border.left;
    const Rect middle = layout::Inset(shape.box, {half, half, half, half});
    const Point center{middle.x + middle.width / 2, middle.y + middle.height / 2};
    if ((shape.bits & kShapeCircle) != 0) {
        buffer.StrokeCircle(center.x, center.y, 0, middle.width / 2, paint);
    } else if ((shape.bits & kShapeEllipse) != 0) {
        buffer.StrokeEllipse(center.x, center.y, 0, middle.width / 2, middle.height / 2, paint);
    } else {
        buffer.StrokeRoundedRect(middle, InsetRadii(shape.radii, {half, half, half, half}), paint);
    }
}

// Null when two sides that draw differ, whether they meet in a corner or face each other.
const fresco::Color* OnlyColor(const BoxShape& shape) {
    const fresco::Color* only = nullptr;
    for (uint32_t side = 0; side < 4; ++side) {
        if (!Draws(shape, side)) continue;
        if (only && !SameColor(*only, shape.colors[side])) return nullptr;
        only = &shape.colors[side];
    }
    return only;
}

void PaintRoundBorder(PaintContext& context, const BoxShape& shape, CommandBuffer& buffer) {
    if (const fresco::Color* color = OnlyColor(shape)) return PaintRing(context, shape, *color, buffer);
    for (uint32_t side = 0; side < 4; ++side) {
        if (!Draws(shape, side) || shape.colors[side].a <= 0) continue;
        Point quad[4];
        SideQuad(shape, side, quad);
        fresco::Point3 clip[4];
        for (int i = 0; i < 4; ++i)
            clip[i] = {quad[i].x, quad[i].y, 0};
        buffer.PushState(fresco::kStateClip);
        buffer.ClipQuad(clip, fresco::kClipIntersect);
        PaintRing(context, shape, shape.colors[side], buffer);
        buffer.PopState();
    }
}

}  // namespace

void PaintBorder(PaintContext& context, const BoxShape& shape, CommandBuffer& buffer) {
    bool visible = false;
    for (uint32_t side = 0; side < 4; ++side)
        visible = visible || (Draws(shape, side) && shape.colors[side].a > 0);
    if (!visible) return;
    shape.kind == BoxKind::Bordered ? PaintSharpBorder(shape, buffer)
                                    : PaintRoundBorder(context, shape, buffer);
}

}  // namespace qorvex::dsp
