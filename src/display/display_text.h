// The display element of a DOM text node. Lines are kept until a parameter of the layout changes; a frame
// that only moves or colours text lays nothing out.
#pragma once

#include <string_view>

#include "core/memory/containers.h"
#include "display/display_element.h"
#include "layout/text/text_info.h"

namespace fresco {
class IFontService;
}

namespace qorvex::dsp {

class DisplayText final : public IDisplayElement {
  public:
    DisplayText() : IDisplayElement(kMeasures) {}

    // Already transformed (text-transform) UTF-8. On the layout thread, or at the commit.
    void SetText(std::string_view text);
    std::string_view Text() const { return text_.view(); }
    const layout::TextInfo& Info() const { return info_; }

    void Paint(PaintContext& context, bool dirty, const layout::LayoutNode& node,
               fresco::CommandBuffer& buffer) override;
    void Measure(layout::LayoutHandle& handle, float availableWidth, float availableHeight,
                 MeasureMode widthMode, MeasureMode heightMode, layout::Size& out) override;
    uint32_t TextLength() const override;

  private:
    // Lays out when the style, the text or the available box differ from those of the stored lines. False
    // without a loaded typeface.
    bool EnsureLayout(const layout::LayoutNode& node, fresco::IFontService* fonts, float width, float height);
    [[nodiscard]] bool Holds(const layout::TextStyle& style, float width, float height) const;

    TaggedString<MemoryTag::Rendering> text_;
    layout::TextInfo info_;
    layout::TextStyle style_;  // of info_
    float availableWidth_ = 0;
    float availableHeight_ = 0;
    bool laidOut_ = false;
};

}  // namespace qorvex::dsp
