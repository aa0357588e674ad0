#include "display/own_paint.h"

#include "css/values/style_groups.h"
#include "display/resolved_visuals.h"

namespace qorvex::dsp {

using layout::LayoutNode;

namespace {

// Dotted and dashed sides take room but paint nothing.
bool HasBorder(const LayoutNode& node) {
    const css::LayoutStyle& style = *node.style->layout;
    const layout::Edges& border = node.border();
    auto draws = [](css::BorderStyleType type, float width) {
        return type == css::BorderStyleType::Solid && width > layout::kLengthTolerance;
    };
    return draws(style.borderLeftStyle, border.left) || draws(style.borderRightStyle, border.right) ||
           draws(style.borderTopStyle, border.top) || draws(style.borderBottomStyle, border.bottom);
}

}  // namespace

uint8_t FindOwnPaint(const LayoutNode& node) {
    using namespace layout;
    const css::VisualStyle& visual = *node.style->visual;
    if (!node.display || visual.visibility != css::Visibility::Visible) return 0;
    if (!node.display->Has(IDisplayElement::kPaintsBox)) return kPaintsContent;
    uint32_t own = node.display->Has(IDisplayElement::kPaintsContent) ? kPaintsContent : 0;
    const bool round = node.visuals && HasRadii(node.visuals->radii);
    if (visual.backgroundColor.alpha > 0) own |= round ? kPaintsRoundColor : kPaintsColor;
    if (!visual.backgroundImage.empty()) own |= kPaintsImages;
    if (!visual.boxShadow.empty()) own |= kPaintsShadows;
    if (visual.borderImageSource.kind > css::ImageKind::Initial || HasBorder(node)) own |= kPaintsBorder;
    return static_cast<uint8_t>(own);
}

}  // namespace qorvex::dsp
