#include "display/box.h"

#include "display/background_painter.h"
#include "display/border_image.h"
#include "display/border_painter.h"
#include "display/box_shape.h"
#include "display/shadow_painter.h"

namespace qorvex::dsp {

void Box::SetHasMask(bool on) {
    SetFlag(kHasMask, on);
    if (on) EnsureImages();
    if (!on && images_) images_->mask.clear();
}

Box::Images& Box::EnsureImages() {
    if (!images_) images_ = MakeUnique<Images, MemoryTag::Rendering>();
    return *images_;
}

void Box::Paint(PaintContext& context, bool dirty, const layout::LayoutNode& node,
                fresco::CommandBuffer& buffer) {
    const BoxShape shape = AnalyseBox(node, context.snapToPixels);
    PaintOuterShadows(context, node, shape, buffer);
    PaintBackgroundColor(node, shape, buffer);
    PaintBackgroundImages(context, node, shape, BackgroundSlots(), buffer);
    PaintInsetShadows(context, node, shape, buffer);
    PaintContent(context, dirty, node, buffer);
    if (!PaintBorderImage(context, node, shape, BorderSlots(), buffer)) PaintBorder(context, shape, buffer);
}

void Box::PaintContent(PaintContext&, bool, const layout::LayoutNode&, fresco::CommandBuffer&) {}

}  // namespace qorvex::dsp
