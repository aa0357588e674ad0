#include "display/display_text.h"

#include <cmath>

#include "core/logging/log.h"
#include "layout/layout_store.h"
#include "layout/text/text_layout.h"

namespace qorvex::dsp {

using layout::Near;

namespace {

// Glyphs may reach this part of the font size beyond their line and their advance.
constexpr float kOverhang = 0.5f;

bool SameExtent(float a, float b) {
    return Near(a, b) || (std::isnan(a) && std::isnan(b));
}

}  // namespace

void DisplayText::SetText(std::string_view text) {
    if (text == text_.view()) return;
    text_ = text;
    laidOut_ = false;
}

uint32_t DisplayText::TextLength() const {
    return static_cast<uint32_t>(text_.size());
}

bool DisplayText::Holds(const layout::TextStyle& style, float width, float height) const {
    if (!laidOut_ || !SameTextStyle(style, style_)) return false;
    if (style.fit != css::FontFitModeType::None && !SameExtent(height, availableHeight_)) return false;
    if (SameExtent(width, availableWidth_)) return true;
    // Lines that fit a narrower width without a break are the same in a wider one, and the other way round.
    const bool followsWidth = style.fit != css::FontFitModeType::None ||
                              style.align != css::TextAlignType::Left ||
                              style.overflow != css::TextOverflowMode::Clip;
    return !followsWidth && !info_.wrapped && !(width < info_.width);
}

bool DisplayText::EnsureLayout(const layout::LayoutNode& node, fresco::IFontService* fonts, float width,
                               float height) {
    const css::TextLayoutStyle* group = node.style.text.get();
    if (fonts == nullptr || group == nullptr) return false;
    const layout::TextStyle style = layout::MakeTextStyle(*group);
    if (Holds(style, width, height)) return true;
    if (!LayoutText({text_.view(), style, width, height, *fonts}, info_)) {
        LogDebug("Measuring text without typeface");
        info_.Clear();
        laidOut_ = false;
        return false;
    }
    style_ = style;
    availableWidth_ = width;
    availableHeight_ = height;
    laidOut_ = true;
    SetInkOverflow(std::ceil(info_.usedSize * kOverhang + group->computedStrokeWidth));
    return true;
}

void DisplayText::Measure(layout::LayoutHandle& handle, float availableWidth, float availableHeight,
                          MeasureMode widthMode, MeasureMode heightMode, layout::Size& out) {
    if (widthMode == MeasureMode::Undefined) availableWidth = NAN;
    if (heightMode == MeasureMode::Undefined) availableHeight = NAN;
    if (!EnsureLayout(handle.node(), handle.store().fonts, availableWidth, availableHeight)) {
        out = {};
        return;
    }
    out.width = std::ceil(info_.width);
    out.height = std::ceil(info_.height);
}

}  // namespace qorvex::dsp
