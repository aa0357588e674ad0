#include "display/display_text.h"

namespace qorvex::dsp {

void DisplayText::SetText(std::string_view text) {
    text_ = TaggedString<MemoryTag::Rendering>(text);
}

void DisplayText::Paint(PaintContext&, bool, const layout::LayoutNode&, fresco::CommandBuffer&) {}

void DisplayText::Measure(layout::LayoutHandle&, float, float, MeasureMode, MeasureMode, layout::Size& out) {
    out = {};
}

uint32_t DisplayText::TextLength() const {
    return static_cast<uint32_t>(text_.size());
}

}  // namespace qorvex::dsp
