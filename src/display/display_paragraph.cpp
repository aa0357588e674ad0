#include "display/display_paragraph.h"

#include <yoga/Yoga.h>

#include <cmath>

#include "core/memory/temp_vector.h"
#include "layout/layout_store.h"
#include "layout/text/font_fit.h"

namespace qorvex::dsp {

namespace {

// Bytes of all text below.
uint64_t TextBelow(const layout::LayoutHandle& paragraph) {
    const TempMark mark;
    TempVector<const layout::LayoutHandle*> stack;
    stack.push_back(&paragraph);
    uint64_t bytes = 0;
    while (!stack.empty()) {
        const layout::LayoutNode& node = stack.back()->node();
        stack.pop_back();
        if (node.display) bytes += node.display->TextLength();
        for (const layout::HandlePtr& child : node.Children())
            stack.push_back(child.get());
    }
    return bytes;
}

// A first guess from the area that each character may take, half as wide again as it is tall.
float FirstFitSize(const layout::LayoutHandle& paragraph, float fontSize, float width, float height) {
    const uint64_t bytes = TextBelow(paragraph);
    const float guess = std::floor(std::sqrt(width * height / static_cast<float>(bytes) * 1.5f));
    const bool usable = bytes > 0 && std::isfinite(guess) && guess >= 1;
    return usable ? std::min(guess, limits::kLargestFitSize - 1) : fontSize;
}

bool SameExtent(float a, float b) {
    return layout::Near(a, b) || (std::isnan(a) && std::isnan(b));
}

}  // namespace

void DisplayParagraph::FlowFor(layout::LayoutHandle& handle, float width, float height) {
    using css::FontFitModeType;
    const css::TextLayoutStyle& style = *handle.node().style->text;
    const FontFitModeType mode = style.fontFitMode;
    const bool fit = mode != FontFitModeType::None && (!std::isnan(width) || !std::isnan(height)) &&
                     style.computedFontSize > 0;
    if (!stale_ && SameExtent(width, width_) && (!fit || SameExtent(height, height_))) return;
    const float base = style.computedFontSize;
    const auto flowAt = [&](float size) {
        size_ = flow_.Flow(handle, width, fit ? size / base : 1);
        return (std::isnan(width) || size_.width <= width) && (std::isnan(height) || size_.height <= height);
    };
    const float first =
        fit && mode == FontFitModeType::Fit ? FirstFitSize(handle, base, width, height) : base;
    const bool fits = flowAt(first);
    if (fit) flowAt(layout::FindFittingSize(mode, first, fits, flowAt));
    width_ = width;
    height_ = height;
    stale_ = false;
}

void DisplayParagraph::Measure(layout::LayoutHandle& handle, float availableWidth, float availableHeight,
                               MeasureMode widthMode, MeasureMode heightMode, layout::Size& out) {
    FlowFor(handle, widthMode == MeasureMode::Undefined ? NAN : availableWidth,
            heightMode == MeasureMode::Undefined ? NAN : availableHeight);
    out.width = std::ceil(size_.width);
    out.height = std::ceil(size_.height);
}

void DisplayParagraph::PlaceContent(layout::LayoutHandle& handle, layout::LayoutPass& pass) {
    const layout::LayoutNode& node = handle.node();
    const layout::Rect content = layout::Inset(layout::Inset(node.box, node.border()), node.padding());
    // Lines that were not broken at an unknown width are right for the box that was made of them.
    const bool measured = !stale_ && std::isnan(width_) && content.width >= std::ceil(size_.width);
    if (!measured) FlowFor(handle, content.width, content.height);
    flow_.Place(pass, handle, {content.x, content.y}, content.width);
}

void InvalidateParagraphs(layout::LayoutHandle& changed) {
    if (!changed.store().flowsText) return;
    for (layout::LayoutHandle* at = &changed; at != nullptr; at = at->node().parent) {
        const layout::LayoutNode& node = at->node();
        if (!node.display || !node.display->Has(IDisplayElement::kFlowsChildren)) continue;
        static_cast<DisplayParagraph&>(*node.display).Invalidate();
        if (node.flex != nullptr && YGNodeHasMeasureFunc(node.flex)) YGNodeMarkDirty(node.flex);
    }
}

}  // namespace qorvex::dsp
