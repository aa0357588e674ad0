// The display element of a DOM text node. Lines are kept until a parameter of the layout changes; a frame
// that only moves or colours text lays nothing out.
#pragma once

#include <memory>
#include <string_view>

#include "core/memory/containers.h"
#include "display/display_element.h"
#include "layout/node_link.h"
#include "layout/text/text_info.h"
#include "layout/text/text_positions.h"
#include "layout/text/text_services.h"

namespace qorvex {
class IInternationalizationManager;
namespace i18n {
class IBreakIterator;
}
}  // namespace qorvex

namespace qorvex::dsp {

// A layout inside an inline flow. `scale` is what font-fit-mode makes of all sizes of the flow.
struct InlineTextRequest {
    float width = 0;  // NaN: not known
    float firstLineOffset = 0;
    float scale = 1;
};

class DisplayText final : public IDisplayElement {
  public:
    // The link (may be null) is told where the characters stand. The manager may be null.
    explicit DisplayText(layout::NodeLinkPtr link = nullptr, IInternationalizationManager* i18n = nullptr);
    ~DisplayText() override;

    // Already transformed (text-transform) UTF-8. On the layout thread, or at the commit.
    void SetText(std::string_view text);
    std::string_view Text() const { return text_.view(); }
    const layout::TextInfo& Info() const { return info_; }

    void Paint(PaintContext& context, bool dirty, const layout::LayoutNode& node,
               fresco::CommandBuffer& buffer) override;
    void Measure(layout::LayoutHandle& handle, float availableWidth, float availableHeight,
                 MeasureMode widthMode, MeasureMode heightMode, layout::Size& out) override;
    bool KeepsSize(layout::LayoutHandle& handle) override;
    void OffsetLine(uint32_t lineIndex, float offset, uint8_t alignment) override;
    void GrowLastLine(float amount) override;
    uint32_t TextLength() const override;

    // For a paragraph: null without a loaded typeface. Lines stand at their left edges until they are placed.
    const layout::TextInfo* LayoutInline(layout::LayoutHandle& handle, const InlineTextRequest& request);
    // Where each line of that layout stands.
    void PlaceLines(const layout::LinePlacement* lines, size_t count);

  private:
    struct Parameters {
        layout::TextStyle style;
        float width = 0;
        float height = 0;
        float firstLineOffset = 0;
        bool inFlow = false;
    };
    // One question of the layout and its answer. The available size is NaN where it is not known.
    struct Answer {
        float width;
        float height;
        layout::Size size;
    };
    struct DestroyIterator {
        void operator()(i18n::IBreakIterator* iterator) const;
    };

    // Lays out when the style, the text or the available box differ from those of the stored lines. False
    // without a loaded typeface.
    bool EnsureLayout(const layout::LayoutNode& node, const layout::TextServices& services,
                      const Parameters& wanted);
    [[nodiscard]] bool Holds(const Parameters& wanted) const;
    layout::Size MeasureFor(layout::LayoutHandle& handle, float availableWidth, float availableHeight);
    void Remember(const Answer& answer);
    void Publish(PaintContext& context);
    void PaintShadows(PaintContext& context, const layout::LayoutNode& node, layout::Point corner,
                      fresco::CommandBuffer& buffer) const;
    // The lines as they are painted.
    const layout::TextInfo& Shown() const { return justified_ ? *justified_ : info_; }
    const layout::LinePlacement* Placements() const { return placed_.empty() ? nullptr : placed_.data(); }

    TaggedString<MemoryTag::Rendering> text_;
    layout::TextInfo info_;
    Parameters laid_;  // of info_
    bool laidOut_ = false;
    bool unpublished_ = false;
    // Of the layout's cached sizes; more of them than are kept here are too many to compare.
    static constexpr size_t kMostAnswers = 4;
    SmallVector<Answer, 2, MemoryTag::LayoutData> answers_;
    bool tooManyAnswers_ = false;
    // Lines of an inline flow; empty elsewhere.
    Vector<layout::LinePlacement, MemoryTag::LayoutData> placed_;
    // info_ with wider gaps, where the flow justifies some of these lines.
    UniquePtr<layout::TextInfo, MemoryTag::LayoutData> justified_;
    layout::NodeLinkPtr link_;
    std::unique_ptr<i18n::IBreakIterator, DestroyIterator> iterator_;
    qsl::RefPtr<layout::TextFontStyle> publishedStyle_;
};

}  // namespace qorvex::dsp
