#include "display/visual_style.h"

#include "css/values/style_groups.h"
#include "display/background_geometry.h"
#include "display/border_image.h"
#include "display/transforms.h"

#include <algorithm>

namespace qorvex::dsp {

using css::LengthContext;
using css::ResolveLength;
using layout::LayoutHandle;
using layout::LayoutNode;
using layout::Rect;

namespace {

layout::Point ResolveRadius(const css::BorderRadius& radius, const Rect& box, const LengthContext& lengths) {
    return {std::max(ResolveLength(radius.horizontal, lengths, box.width), 0.0f),
            std::max(ResolveLength(radius.vertical, lengths, box.height), 0.0f)};
}

bool IsZero(const css::BorderRadius& radius) {
    return radius.horizontal.value == 0 && radius.vertical.value == 0;
}

ResolvedShadow ResolveShadow(const css::ShadowItem& item, const LengthContext& lengths) {
    // A page may ask for any number; beyond this nothing of a shadow would be seen.
    constexpr float kFarthest = 1e5f;
    auto pixels = [&](const css::Length& length) {
        const float value = ResolveLength(length, lengths);
        return std::isfinite(value) ? std::clamp(value, -kFarthest, kFarthest) : 0;
    };
    return {pixels(item.offsetX), pixels(item.offsetY), std::max(pixels(item.blur), 0.0f),
            pixels(item.spread), item.inset};
}

FilterExtent ResolveFilter(const css::FilterFunction& filter, const LengthContext& lengths) {
    switch (filter.kind) {
        case css::FilterKind::Blur: {
            const float radius = ResolveLength(filter.radiusX, lengths);
            return {0, 0, radius, radius};
        }
        case css::FilterKind::AxisBlur:
            return {0, 0, ResolveLength(filter.radiusX, lengths), ResolveLength(filter.radiusY, lengths)};
        case css::FilterKind::DropShadow: {
            const ResolvedShadow shadow = ResolveShadow(filter.shadow, lengths);
            return {shadow.x, shadow.y, shadow.blur, shadow.blur};
        }
        default:
            return {};
    }
}

// True when the stored values differ, which makes the node paint anew.
bool Refresh(LayoutNode& node, LengthContext& lengths, bool snapToPixels) {
    if (!NeedsResolvedVisuals(*node.style->visual)) {
        if (!node.visuals) return false;
        node.visuals.reset();
        return true;
    }
    lengths.em = node.style->text->computedFontSize;
    ResolvedVisuals fresh;
    ResolveVisuals(node, PaintBox(node, snapToPixels), lengths, fresh);
    if (node.visuals) {
        if (Near(*node.visuals, fresh)) return false;
        *node.visuals = std::move(fresh);
        return true;
    }
    node.visuals = MakeUnique<ResolvedVisuals, MemoryTag::LayoutNodes>(std::move(fresh));
    return true;
}

}  // namespace

bool NeedsResolvedVisuals(const css::VisualStyle& style) {
    return !IsZero(style.borderTopLeftRadius) || !IsZero(style.borderTopRightRadius) ||
           !IsZero(style.borderBottomLeftRadius) || !IsZero(style.borderBottomRightRadius) ||
           !style.boxShadow.empty() || !style.textShadow.empty() || !style.filter.empty() ||
           !style.backgroundImage.empty() || style.maskImage.kind > css::ImageKind::Initial ||
           style.borderImageSource.kind > css::ImageKind::Initial;
}

void ResolveVisuals(const LayoutNode& node, const Rect& box, const LengthContext& lengths,
                    ResolvedVisuals& out) {
    const css::VisualStyle& style = *node.style->visual;
    out.radii = {ResolveRadius(style.borderTopLeftRadius, box, lengths),
                 ResolveRadius(style.borderTopRightRadius, box, lengths),
                 ResolveRadius(style.borderBottomRightRadius, box, lengths),
                 ResolveRadius(style.borderBottomLeftRadius, box, lengths)};
    for (const css::ShadowItem& item : style.boxShadow)
        out.boxShadows.push_back(ResolveShadow(item, lengths));
    for (const css::ShadowItem& item : style.textShadow)
        out.textShadows.push_back(ResolveShadow(item, lengths));
    for (const css::FilterFunction& filter : style.filter)
        out.filters.push_back(ResolveFilter(filter, lengths));
    ResolveBorderImage(node, box, lengths, out);
    ResolveBackgrounds(node, box, lengths, out);
}

void RecalculateVisualStyle(layout::LayoutPass& pass) {
    pass.dirty.Add(pass.update.vanished);
    pass.update.vanished.Clear();
    if (pass.root == nullptr) return;
    LengthContext lengths = layout::MakeLengthContext(pass);
    bool any = false;
    auto refresh = [&](LayoutHandle& handle) {
        LayoutNode& node = handle.node();
        ++pass.update.counters.restyled;
        if (!Refresh(node, lengths, pass.snapToPixels) && !node.needsTransform) return;
        node.visualChanged = true;
        MarkForTransform(handle);
        any = true;
    };
    pass.update.changed.ForEach(refresh);
    // Percentages and gradients follow the box.
    pass.update.updated.ForEach([&](LayoutHandle& handle) {
        const LayoutNode& node = handle.node();
        if (node.visuals && (node.boxMetricsChanged || node.rectChanged) &&
            !pass.update.changed.Contains(&handle))
            refresh(handle);
    });
    // The pass that followed layout has seen old extents, or there was no such pass in this frame.
    if (any) RunTransformPass(pass);
}

}  // namespace qorvex::dsp
