// The display element of a DOM text node.
#pragma once

#include "core/memory/containers.h"
#include "display/display_element.h"

#include <string_view>

namespace qorvex::dsp {

class DisplayText final : public IDisplayElement {
  public:
    DisplayText() : IDisplayElement(kMeasures) {}

    // Already transformed (text-transform) UTF-8. On the layout thread, or at the commit.
    void SetText(std::string_view text);
    std::string_view Text() const { return text_.view(); }

    void Paint(PaintContext& context, bool dirty, const layout::LayoutNode& node,
               fresco::CommandBuffer& buffer) override;
    void Measure(layout::LayoutHandle& handle, float availableWidth, float availableHeight,
                 MeasureMode widthMode, MeasureMode heightMode, layout::Size& out) override;
    uint32_t TextLength() const override;

  private:
    TaggedString<MemoryTag::Rendering> text_;
};

}  // namespace qorvex::dsp
