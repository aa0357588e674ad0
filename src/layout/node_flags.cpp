#include "layout/node_flags.h"

namespace qorvex::layout {

void RefreshNodeFlags(LayoutNode& node) {
    const css::LayoutStyle& style = *node.style->layout;
    const css::TransformStyle& transform = *node.style->transform;
    NodeFlags& flags = node.flags;
    flags.isPositioned = style.position != css::CSSPosition::Static;
    flags.isFixed = style.position == css::CSSPosition::Fixed;
    flags.isAbsolute = style.position == css::CSSPosition::Absolute;
    flags.shouldOverflowClip =
        style.overflowX != css::CSSOverflow::Visible || style.overflowY != css::CSSOverflow::Visible;
    flags.containsFixedDescendants = !transform.transform.empty() ||
                                     transform.perspective.kind != css::PerspectiveKind::None ||
                                     !node.style->visual->filter.empty();
    flags.preserves3d = transform.transformStyle == css::TransformStyleProperty::Preserve3D;
    SetDisplayFlags(flags, node.display.get());
}

void SetDisplayFlags(NodeFlags& flags, const dsp::IDisplayElement* display) {
    flags.measuredByDisplayElement = display && display->Has(dsp::IDisplayElement::kMeasures);
    flags.isReplaced = display && display->Has(dsp::IDisplayElement::kReplaced);
}

}  // namespace qorvex::layout
