#include "display/background_painter.h"

#include "css/values/style_groups.h"
#include "display/gradient_painter.h"
#include "display/transforms.h"

#include <algorithm>

namespace qorvex::dsp {

using fresco::CommandBuffer;
using layout::Edges;
using layout::LayoutNode;
using layout::Rect;

namespace {

constexpr float kMinArea = 0.001f;

bool HasBorderImage(const css::VisualStyle& visual) {
    return visual.borderImageSource.kind > css::ImageKind::Initial;
}

// A pixel less below each border, so that the colour does not bleed through the antialiased edge outside.
// Sides that take room without painting (dotted, dashed) hide nothing and get none.
Edges BleedInset(const BoxShape& shape) {
    auto inset = [](float width) { return width > 1 ? 1.0f : 0.0f; };
    return {inset(shape.border.left), inset(shape.border.right), inset(shape.border.top),
            inset(shape.border.bottom)};
}

// Images reach a pixel below each side that hides them, and no further: more would bleed through its edges
// where these are smoothed.
Edges HiddenInset(const BoxShape& shape) {
    auto inset = [&](uint32_t side, float width) {
        return width > 1 && shape.colors[side].a >= 1 ? std::max(width - 1, 1.0f) : 0.0f;
    };
    return {inset(0, shape.border.left), inset(1, shape.border.right), inset(2, shape.border.top),
            inset(3, shape.border.bottom)};
}

void ClipToShape(const BoxShape& shape, const Edges& inset, CommandBuffer& buffer) {
    const Rect rect = layout::Inset(shape.box, inset);
    buffer.PushState(fresco::kStateClip);
    shape.IsRounded() ? buffer.ClipRoundedRect(rect, InsetRadii(shape.radii, inset), fresco::kClipIntersect)
                      : buffer.ClipRect(rect, fresco::kClipIntersect);
}

void DrawImageLayer(const ImageSlot& slot, const ResolvedImageLayer& layer, const Rect& box,
                    CommandBuffer& buffer) {
    Rect tile = layer.tile;
    tile.x += box.x;
    tile.y += box.y;
    const auto image = static_cast<fresco::ImageId>(slot.resource);
    if (!layer.repeatX && !layer.repeatY) {
        buffer.DrawImage(image, tile, slot.source, fresco::Paint());
        return;
    }
    Rect area = box;
    if (!layer.repeatX) area.x = tile.x, area.width = tile.width;
    if (!layer.repeatY) area.y = tile.y, area.height = tile.height;
    buffer.DrawImageTiled(image, area, {slot.source, tile, layer.spacingX, layer.spacingY}, fresco::Paint());
}

}  // namespace

void PaintPlainColor(const LayoutNode& node, bool snapToPixels, CommandBuffer& buffer) {
    const Rect box = PaintBox(node, snapToPixels);
    if (box.width * box.height > kMinArea)
        buffer.FillRect(box, SolidPaint(ToFresco(node.style->visual->backgroundColor)));
}

void PaintBackgroundColor(const LayoutNode& node, const BoxShape& shape, CommandBuffer& buffer) {
    const css::VisualStyle& visual = *node.style->visual;
    if (visual.backgroundColor.alpha <= 0) return;
    const Edges inset = HasBorderImage(visual) ? Edges{} : BleedInset(shape);
    const Rect rect = layout::Inset(shape.box, inset);
    if (rect.width * rect.height <= kMinArea) return;
    const fresco::Paint paint = SolidPaint(ToFresco(visual.backgroundColor));
    const layout::Point center{rect.x + rect.width / 2, rect.y + rect.height / 2};
    if (!shape.IsRounded()) {
        buffer.FillRect(rect, paint);
    } else if ((shape.bits & kShapeCircle) != 0) {
        buffer.FillCircle(center.x, center.y, 0, rect.width / 2, paint);
    } else if ((shape.bits & kShapeEllipse) != 0) {
        buffer.FillEllipse(center.x, center.y, 0, rect.width / 2, rect.height / 2, paint);
    } else {
        buffer.FillRoundedRect(rect, InsetRadii(shape.radii, inset), paint);
    }
}

void PaintBackgroundImages(PaintContext& context, const LayoutNode& node, const BoxShape& shape,
                           const ImageSlots* slots, CommandBuffer& buffer) {
    const css::VisualStyle& visual = *node.style->visual;
    if (visual.backgroundImage.empty() || !node.visuals || layout::IsEmpty(shape.box)) return;
    const auto& layers = node.visuals->backgrounds;
    bool clipped = false;
    for (size_t i = std::min<size_t>(visual.backgroundImage.size(), layers.size()); i-- > 0;) {
        const css::ImageValue& image = visual.backgroundImage[i];
        const bool isImage = !image.IsGradient() && slots && i < slots->size() && (*slots)[i].resource >= 0;
        if (layout::IsEmpty(layers[i].tile) || (!image.gradient && !isImage)) continue;
        if (!clipped) ClipToShape(shape, HasBorderImage(visual) ? Edges{} : HiddenInset(shape), buffer);
        clipped = true;
        if (image.gradient) {
            PaintGradientLayer(context, *image.gradient, layers[i], {shape.box.x, shape.box.y}, shape.box,
                               buffer);
        } else {
            DrawImageLayer((*slots)[i], layers[i], shape.box, buffer);
        }
    }
    if (clipped) buffer.PopState();
}

}  // namespace qorvex::dsp
