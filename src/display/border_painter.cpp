#include "display/border_painter.h"

#include "display/path_cache.h"

#include <algorithm>
#include <cmath>

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

bool IsVertical(uint32_t side) {
    return side <= kRight;
}

// A corner of the box, with the vertical and the horizontal side that meet there.
struct Corner {
    uint32_t vertical, horizontal;
    Point outer;
    Point to;  // from the outer corner to the inner one
    Point radius;
};

Corner TopLeft(const BoxShape& s) {
    return {kLeft, kTop, {s.box.x, s.box.y}, {s.border.left, s.border.top}, s.radii.topLeft};
}
Corner TopRight(const BoxShape& s) {
    return {kRight, kTop, {layout::Right(s.box), s.box.y}, {-s.border.right, s.border.top}, s.radii.topRight};
}
Corner BottomLeft(const BoxShape& s) {
    return {kLeft,
            kBottom,
            {s.box.x, layout::Bottom(s.box)},
            {s.border.left, -s.border.bottom},
            s.radii.bottomLeft};
}
Corner BottomRight(const BoxShape& s) {
    return {kRight,
            kBottom,
            {layout::Right(s.box), layout::Bottom(s.box)},
            {-s.border.right, -s.border.bottom},
            s.radii.bottomRight};
}

// Two smoothed edges along one line let shine through what is below, so sides meet in a mitre only where
// nothing else will do. Vertical sides are drawn first.
enum class Joint {
    Butt,  // of one colour: the horizontal side takes the corner, the vertical one ends before it
    Lap,   // both opaque: the mitre of the horizontal side lies on the vertical one
    Mitre
};

Joint JointAt(const BoxShape& shape, const Corner& corner) {
    if (!Draws(shape, corner.vertical) || !Draws(shape, corner.horizontal)) return Joint::Mitre;
    const fresco::Color &a = shape.colors[corner.vertical], &b = shape.colors[corner.horizontal];
    if (SameColor(a, b)) return Joint::Butt;
    return a.a >= 1 && b.a >= 1 ? Joint::Lap : Joint::Mitre;
}

// One end of a side: on the outer edge of the box and on the inner.
struct SideEnd {
    Point outer, inner;
};

SideEnd SharpEnd(const BoxShape& shape, const Corner& c, uint32_t side) {
    const Joint joint = JointAt(shape, c);
    const Point inner{c.outer.x + c.to.x, c.outer.y + c.to.y};
    if (joint == Joint::Butt) {
        const Point straight{c.outer.x, inner.y};
        return IsVertical(side) ? SideEnd{straight, inner} : SideEnd{c.outer, straight};
    }
    if (joint == Joint::Lap && IsVertical(side)) return {c.outer, {inner.x, c.outer.y}};
    return {c.outer, inner};
}

// Along the joint to the inner corner, and on to where the ring of the border leaves it, but not past the
// middle of the box.
SideEnd RoundEnd(const BoxShape& shape, const Corner& c, uint32_t side) {
    const float x = std::fabs(c.to.x), y = std::fabs(c.to.y);
    float reach = 1;
    if (x > 0) reach = std::max(reach, c.radius.x / x);
    if (y > 0) reach = std::max(reach, c.radius.y / y);
    if (x > 0) reach = std::min(reach, std::max(shape.box.width / 2 / x, 1.0f));
    if (y > 0) reach = std::min(reach, std::max(shape.box.height / 2 / y, 1.0f));
    SideEnd end{c.outer, {c.outer.x + c.to.x * reach, c.outer.y + c.to.y * reach}};
    const bool opaque = shape.colors[c.vertical].a >= 1 && shape.colors[c.horizontal].a >= 1;
    if (!IsVertical(side) || !opaque || !(x > 0) || !Draws(shape, c.horizontal)) return end;
    // About a pixel further, below the horizontal side.
    const float further = std::copysign(std::min(std::hypot(x, y) / x, 3.0f), c.to.y);
    end.outer.y -= further;
    end.inner.y -= further;
    return end;
}

// One side's share of the border.
template <class End>
void SideQuad(const BoxShape& shape, uint32_t side, End end, Point out[4]) {
    const Corner first = side == kRight    ? TopRight(shape)
                         : side == kBottom ? BottomLeft(shape)
                                           : TopLeft(shape);
    const Corner last = side == kLeft  ? BottomLeft(shape)
                        : side == kTop ? TopRight(shape)
                                       : BottomRight(shape);
    const SideEnd a = end(shape, first, side), b = end(shape, last, side);
    const Point quad[4] = {a.outer, a.inner, b.inner, b.outer};
    std::copy(quad, quad + 4, out);
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
        SideQuad(shape, side, SharpEnd, quad);
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

// A stroke has the corners of the ring only where its middle line is round.
bool IsStroke(const BoxShape& shape) {
    if ((shape.bits & kShapeIrregular) != 0) return false;
    const float half = shape.border.left / 2;
    for (const Point& radius :
         {shape.radii.topLeft, shape.radii.topRight, shape.radii.bottomRight, shape.radii.bottomLeft}) {
        if (radius.x > 0 && radius.x <= half) return false;
    }
    return true;
}

// The whole ring in one colour; clips choose what of it shows.
void PaintRing(PaintContext& context, const BoxShape& shape, const fresco::Color& color,
               CommandBuffer& buffer) {
    Paint paint = SolidPaint(color);
    if (!IsStroke(shape)) {
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
        SideQuad(shape, side, RoundEnd, quad);
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
