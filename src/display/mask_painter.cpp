#include "display/mask_painter.h"

#include "core/logging/log.h"
#include "css/values/style_groups.h"
#include "display/box.h"
#include "display/gradient_painter.h"
#include "display/transforms.h"

namespace qorvex::dsp {

using fresco::CommandBuffer;
using layout::LayoutNode;
using layout::Rect;

namespace {

ImageSlots* SlotsOf(const LayoutNode& node) {
    if (!node.display || !node.display->Has(IDisplayElement::kPaintsBox)) return nullptr;
    return static_cast<Box*>(node.display.get())->MaskSlots();
}

// Outside of this box nothing of the content stays.
Rect MaskClipBox(const LayoutNode& node, const Rect& box) {
    switch (node.style->visual->maskClip) {
        case css::MaskClipType::ContentBox:
            return layout::Inset(layout::Inset(box, node.border()), node.padding());
        case css::MaskClipType::PaddingBox:
            return layout::Inset(box, node.border());
        default:
            return box;
    }
}

// A gradient has no image: what it paints, as a layer of its own, is what stays of the content.
void ApplyGradientMask(const LayoutNode& node, PaintContext& context, const ResolvedImageLayer& layer,
                       const Rect& box, const Rect& clip, CommandBuffer& buffer) {
    CommandBuffer* mask =
        buffer.BeginLayer(fresco::kLayerContent, fresco::MakeLayerPaint(1, fresco::kBlendDestinationIn));
    mask->PushState(fresco::kStateClip);
    mask->ClipRect(clip, fresco::kClipIntersect);
    PaintGradientLayer(context, *node.style->visual->maskImage.gradient, layer, {box.x, box.y}, clip, *mask);
    mask->PopState();
    mask->EndLayer();
}

}  // namespace

MaskState PrepareMask(const LayoutNode& node) {
    const css::ImageValue& image = node.style->visual->maskImage;
    if (image.kind <= css::ImageKind::Initial) return MaskState::None;
    if (image.gradient) return MaskState::Ready;
    const ImageSlots* slots = SlotsOf(node);
    if (slots == nullptr || slots->empty()) return MaskState::Hold;
    if (slots->size() > 1) LogWarning("Multiple mask images are not supported!");
    return (*slots)[0].resource >= 0 ? MaskState::Ready : MaskState::Hold;
}

void ApplyMask(const LayoutNode& node, PaintContext& context, CommandBuffer& buffer) {
    if (!node.visuals || node.visuals->masks.empty()) return;
    const ResolvedImageLayer& layer = node.visuals->masks[0];
    const Rect box = PaintBox(node, context.snapToPixels);
    Rect area = MaskClipBox(node, box);
    if (node.style->visual->maskImage.gradient) {
        ApplyGradientMask(node, context, layer, box, area, buffer);
        return;
    }
    const ImageSlot& slot = (*SlotsOf(node))[0];
    const auto image = static_cast<fresco::ImageId>(slot.resource);
    Rect tile = layer.tile;
    tile.x += box.x;
    tile.y += box.y;
    // Along an axis without repeat there is one row or column of tiles.
    Rect tiles = area;
    if (!layer.repeatX) tiles.x = tile.x, tiles.width = tile.width;
    if (!layer.repeatY) tiles.y = tile.y, tiles.height = tile.height;
    area = layout::Intersection(area, tiles);
    if (!layer.repeatX && !layer.repeatY && layout::Near(area, tile)) {
        buffer.SetMaskImage(image, tile, slot.source, 0);
        return;
    }
    buffer.SetMaskImageTiled(image, area, {slot.source, tile, layer.spacingX, layer.spacingY}, 0);
}

}  // namespace qorvex::dsp
