#include "display/shadow_painter.h"

#include "css/values/style_groups.h"
#include "display/path_cache.h"
#include "display/shadow_cache.h"

#include <algorithm>

namespace qorvex::dsp {

using fresco::CommandBuffer;
using fresco::CornerRadii;
using layout::Edges;
using layout::LayoutNode;
using layout::Rect;

namespace {

bool IsBlurred(const ResolvedShadow& shadow) {
    return shadow.blur > layout::kLengthTolerance;
}

fresco::Color ShadowColor(const LayoutNode& node, size_t index) {
    const css::ShadowItem& item = node.style->visual->boxShadow[index];
    return ToFresco(item.color.Resolve(node.style->text->color));
}

void FillRounded(CommandBuffer& buffer, const Rect& rect, const CornerRadii& radii,
                 const fresco::Paint& paint) {
    if (layout::IsEmpty(rect)) return;
    HasRadii(radii) ? buffer.FillRoundedRect(rect, radii, paint) : buffer.FillRect(rect, paint);
}

Rect Grown(const Rect& rect, float by) {
    return layout::Inset(rect, {-by, -by, -by, -by});
}

CacheKey& AddKey(CacheKey& key, char form, const ResolvedShadow& shadow, const Rect& rect,
                 const CornerRadii& radii, const fresco::Color& color) {
    return key.Add(form).Add(shadow.blur).Add(rect.width).Add(rect.height).Add(radii).Add(color);
}

void PaintOuterShadow(PaintContext& context, const BoxShape& shape, const ResolvedShadow& shadow,
                      const fresco::Color& color, CommandBuffer& buffer) {
    Rect rect = Grown(shape.box, shadow.spread);
    rect.x += shadow.x;
    rect.y += shadow.y;
    const CornerRadii radii = SpreadRadii(shape.radii, shadow.spread);
    if (layout::IsEmpty(rect)) return;
    if (!IsBlurred(shadow)) {
        FillRounded(buffer, rect, radii, SolidPaint(color));
        return;
    }
    const TempMark mark;
    CacheKey key;
    AddKey(key, 'o', shadow, rect, radii, color);
    const float margin = shadow.blur;
    CachedShadow surface;
    if (const CachedShadow* found = context.shadows.Find(key.view())) {
        surface = *found;
    } else {
        CommandBuffer* target = context.shadows.Render(key.view(), rect.width + 2 * margin,
                                                       rect.height + 2 * margin, context.record, surface);
        if (target == nullptr) {
            // Larger than any surface: sharp is nearer to the truth than nothing, unless hardly anything is
            // left of the shape.
            if (shadow.blur <= std::min(rect.width, rect.height))
                FillRounded(buffer, rect, radii, SolidPaint(color));
            return;
        }
        FillRounded(*target, {margin, margin, 0, rect.width, rect.height}, radii, SolidPaint(color));
        target->ApplyBlur(shadow.blur);
    }
    // Not the whole surface, whose size was rounded up: the blur may reach into the rest, but the bounds of
    // the node do not.
    const Rect source{0, 0, 0, rect.width + 2 * margin, rect.height + 2 * margin};
    const Rect destination = Grown(rect, margin);
    buffer.DrawSurface(surface.surface, source, destination, fresco::Paint());
}

// What lies between `outer` and `hole`, as four rectangles around a hole with square corners.
void FillFrame(CommandBuffer& buffer, const Rect& outer, const Rect& hole, const fresco::Paint& paint) {
    const Rect inner = layout::Intersection(outer, hole);
    if (layout::IsEmpty(inner)) {
        if (!layout::IsEmpty(outer)) buffer.FillRect(outer, paint);
        return;
    }
    const Rect sides[] = {
        {outer.x, outer.y, 0, outer.width, inner.y - outer.y},
        {outer.x, layout::Bottom(inner), 0, outer.width, layout::Bottom(outer) - layout::Bottom(inner)},
        {outer.x, inner.y, 0, inner.x - outer.x, inner.height},
        {layout::Right(inner), inner.y, 0, layout::Right(outer) - layout::Right(inner), inner.height}};
    for (const Rect& side : sides) {
        if (!layout::IsEmpty(side)) buffer.FillRect(side, paint);
    }
}

// A rectangle with a hole, relative to the rectangle's corner.
PathPtr HolePath(PaintContext& context, const Rect& outer, const Rect& hole, const CornerRadii& radii) {
    const TempMark mark;
    CacheKey key;
    const Rect relative{hole.x - outer.x, hole.y - outer.y, 0, hole.width, hole.height};
    key.Add('h').Add(outer.width).Add(outer.height).Add(relative).Add(radii);
    return context.paths.Get(key.view(), [&](fresco::Path& path) {
        path.SetFillRule(fresco::kFillEvenOdd);
        path.AddRect({0, 0, 0, outer.width, outer.height});
        if (!layout::IsEmpty(relative)) path.AddRoundedRect(relative, radii);
    });
}

void PaintSharpInset(PaintContext& context, const Rect& padding, const Rect& hole, const CornerRadii& radii,
                     const fresco::Color& color, CommandBuffer& buffer) {
    if (!HasRadii(radii)) {
        FillFrame(buffer, padding, hole, SolidPaint(color));
        return;
    }
    // The frame reaches around the hole wherever its offset puts it; the clip of the padding box cuts it.
    const Rect outer = layout::Union(padding, Grown(hole, 1));
    const PathPtr path = HolePath(context, outer, hole, radii);
    if (!path) return;
    buffer.PushState(fresco::kStateTransform);
    buffer.Translate(outer.x, outer.y);
    buffer.FillPath(*path, SolidPaint(color));
    buffer.PopState();
}

void PaintBlurredInset(PaintContext& context, const Rect& padding, const ResolvedShadow& shadow,
                       const Rect& hole, const CornerRadii& radii, const fresco::Color& color,
                       CommandBuffer& buffer) {
    const TempMark mark;
    CacheKey key;
    AddKey(key, 'i', shadow, hole, radii, color);
    // Beyond one and a half radii the shadow is solid; the surface reaches as far again, so that the blur of
    // its own edge stays outside of what is drawn.
    const float solid = std::ceil(shadow.blur * 1.5f);
    const float margin = 2 * solid;
    CachedShadow surface;
    if (const CachedShadow* found = context.shadows.Find(key.view())) {
        surface = *found;
    } else {
        const Rect whole{0, 0, 0, hole.width + 2 * margin, hole.height + 2 * margin};
        CommandBuffer* target =
            context.shadows.Render(key.view(), whole.width, whole.height, context.record, surface);
        if (target == nullptr) {
            // As above; a hole that the blur closes leaves the box solid.
            if (shadow.blur <= std::min(hole.width, hole.height)) {
                PaintSharpInset(context, padding, hole, radii, color, buffer);
            } else {
                buffer.FillRect(padding, SolidPaint(color));
            }
            return;
        }
        const PathPtr path = HolePath(context, whole, {margin, margin, 0, hole.width, hole.height}, radii);
        if (path) target->FillPath(*path, SolidPaint(color));
        target->ApplyBlur(shadow.blur);
    }
    const Rect source{margin - solid, margin - solid, 0, hole.width + 2 * solid, hole.height + 2 * solid};
    const Rect destination = Grown(hole, solid);
    buffer.DrawSurface(surface.surface, source, destination, fresco::Paint());
    FillFrame(buffer, padding, destination, SolidPaint(color));
}

bool HasOpaqueBackground(const LayoutNode& node) {
    const css::VisualStyle& visual = *node.style->visual;
    return visual.opacity.value >= 1 && visual.backgroundColor.alpha >= 1 && visual.backgroundImage.empty();
}

}  // namespace

void PaintOuterShadows(PaintContext& context, const LayoutNode& node, const BoxShape& shape,
                       CommandBuffer& buffer) {
    if ((shape.bits & kOuterShadow) == 0) return;
    const bool clips = !HasOpaqueBackground(node);
    if (clips) {
        buffer.PushState(fresco::kStateClip);
        buffer.ClipRoundedRect(shape.box, shape.radii, fresco::kClipExclude);
    }
    const auto& shadows = node.visuals->boxShadows;
    for (uint32_t i = shadows.size(); i-- > 0;) {
        const fresco::Color color = ShadowColor(node, i);
        if (!shadows[i].inset && color.a > 0) PaintOuterShadow(context, shape, shadows[i], color, buffer);
    }
    if (clips) buffer.PopState();
}

void PaintInsetShadows(PaintContext& context, const LayoutNode& node, const BoxShape& shape,
                       CommandBuffer& buffer) {
    if ((shape.bits & kInsetShadow) == 0) return;
    const Rect padding = layout::Inset(shape.box, node.border());
    if (layout::IsEmpty(padding)) return;
    const CornerRadii inner = InsetRadii(shape.radii, node.border());
    buffer.PushState(fresco::kStateClip);
    HasRadii(inner) ? buffer.ClipRoundedRect(padding, inner, fresco::kClipIntersect)
                    : buffer.ClipRect(padding, fresco::kClipIntersect);
    const auto& shadows = node.visuals->boxShadows;
    for (uint32_t i = shadows.size(); i-- > 0;) {
        const ResolvedShadow& shadow = shadows[i];
        const fresco::Color color = ShadowColor(node, i);
        if (!shadow.inset || color.a <= 0) continue;
        const float spread = shadow.spread;
        Rect hole = layout::Inset(padding, {spread, spread, spread, spread});
        hole.x += shadow.x;
        hole.y += shadow.y;
        const CornerRadii radii = SpreadRadii(inner, -spread);
        IsBlurred(shadow) ? PaintBlurredInset(context, padding, shadow, hole, radii, color, buffer)
                          : PaintSharpInset(context, padding, hole, radii, color, buffer);
    }
    buffer.PopState();
}

}  // namespace qorvex::dsp
