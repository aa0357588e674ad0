#include "display/page_elements.h"

#include "css/values/style_groups.h"
#include "display/paint_context.h"

#include <fresco/command_buffer.h>

namespace qorvex::dsp {

// The root's background covers the canvas, not its box (CSS Backgrounds 3, section 2.11.1).
void DisplayHTML::Paint(PaintContext& context, bool, const layout::LayoutNode& node,
                        fresco::CommandBuffer& buffer) {
    const css::Color& color = node.style->visual->backgroundColor;
    if (color.alpha <= 0) return;
    buffer.FillRect({0, 0, 0, context.viewSize.width, context.viewSize.height}, SolidPaint(ToFresco(color)));
}

bool FillsCanvas(const layout::LayoutNode& root) {
    // A root of another kind than DisplayHTML paints a box or measures.
    if (!root.display || root.display->Has(IDisplayElement::kPaintsBox) ||
        root.display->Has(IDisplayElement::kMeasures))
        return false;
    const css::VisualStyle& visual = *root.style->visual;
    return visual.visibility == css::Visibility::Visible && visual.backgroundColor.alpha >= 1;
}

}  // namespace qorvex::dsp
