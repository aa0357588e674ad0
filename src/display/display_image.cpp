#include "display/display_image.h"

#include "display/box_shape.h"
#include "display/paint_context.h"
#include "layout/replaced_size.h"

#include <fresco/command_buffer.h>

namespace qorvex::dsp {

using layout::Edges;
using layout::Rect;

void DisplayImage::Measure(layout::LayoutHandle& handle, float availableWidth, float availableHeight,
                           MeasureMode widthMode, MeasureMode heightMode, layout::Size& out) {
    out = layout::MeasureReplaced(handle.node(), image_.intrinsic, availableWidth, availableHeight, widthMode,
                                  heightMode);
}

void DisplayImage::PaintContent(PaintContext& context, bool, const layout::LayoutNode& node,
                                fresco::CommandBuffer& buffer) {
    if (image_.resource < 0) return;
    const BoxShape shape = AnalyseBox(node, context.snapToPixels);
    const Edges &border = node.border(), &padding = node.padding();
    const Edges inset{border.left + padding.left, border.right + padding.right, border.top + padding.top,
                      border.bottom + padding.bottom};
    const Rect content = layout::Inset(shape.box, inset);
    if (layout::IsEmpty(content)) return;
    const auto image = static_cast<fresco::ImageId>(image_.resource);
    if (!shape.IsRounded()) {
        buffer.DrawImage(image, content, image_.source, fresco::Paint());
        return;
    }
    // The picture ends at the inner curve of its box (CSS Backgrounds 3, section 4.3).
    buffer.PushState(fresco::kStateClip);
    buffer.ClipRoundedRect(content, InsetRadii(shape.radii, inset), fresco::kClipIntersect);
    buffer.DrawImage(image, content, image_.source, fresco::Paint());
    buffer.PopState();
}

}  // namespace qorvex::dsp
