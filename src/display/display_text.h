// The display element of a DOM text node. Lines are kept until a parameter of the layout changes; a frame
// that only moves or colours text lays nothing out.
#pragma once

#include <memory>
#include <span>
#include <string_view>

#include "core/memory/containers.h"
#include "css/values/layout_style_refs.h"
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
    layout::BaseDirection base = layout::BaseDirection::OfText;
    std::span<const uint8_t> levels;  // of each byte of the text; empty: nothing in the flow runs backward
};

class DisplayText : public IDisplayElement {
  public:
    // The manager may be null.
    explicit DisplayText(IInternationalizationManager* i18n = nullptr);
    ~DisplayText() override;

    // Already transformed (text-transform) UTF-8. On the layout thread, or at the commit.
    void SetText(std::string_view text);
    std::string_view Text() const { return text_.view(); }
    // Of the last layout; null before the first one.
    const layout::TextInfo* Info() const {
        return lines_ && lines_->parameters.style ? &lines_->info : nullptr;
    }
    // The same as it is painted, after PlaceLines.
    const layout::TextInfo* ShownInfo() const {
        return lines_ && lines_->parameters.style ? &lines_->Shown() : nullptr;
    }

    // How far the painted content reaches beyond the box, in pixels: overhanging glyphs.
    float InkOverflow() const;
    // What the content takes from the box's corner: words that do not break may be longer than the box.
    layout::Size ContentSize() const;

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
    // Where each line of that layout stands. `runs` (may be null): where in their lines its runs do, NaN for
    // those that stand where they were laid.
    void PlaceLines(const layout::LinePlacement* lines, size_t count, const float* runs);

  private:
    // What lines depend on besides the text. The group stands for all of its text values.
    struct Parameters {
        css::StyleHandle<css::TextLayoutStyle> style;
        float usedSize = 0;
        float width = 0;  // NaN: not known
        float height = 0;
        float firstLineOffset = 0;
        bool inFlow = false;  // what belongs to a paragraph is left to it
        bool complexText = true;
        layout::BaseDirection base = layout::BaseDirection::OfText;
        uint64_t levels = 0;  // hash of those that a flow brings
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
    // Made by the first layout, or for the iterator: a text that is not shown has none of it.
    struct Lines {
        layout::TextInfo info;
        Parameters parameters;
        bool valid = false;
        bool unpublished = false;
        // Of the layout's cached sizes; more of them than are kept here are too many to compare.
        static constexpr size_t kMostAnswers = 4;
        bool tooManyAnswers = false;
        SmallVector<Answer, 2, MemoryTag::LayoutData> answers;
        // In an inline flow; empty elsewhere.
        Vector<layout::LinePlacement, MemoryTag::LayoutData> placed;
        // info with wider gaps or runs in other places, where the flow justifies lines or orders their parts.
        UniquePtr<layout::TextInfo, MemoryTag::LayoutData> arranged;
        qsl::RefPtr<layout::TextFontStyle> publishedStyle;
        std::unique_ptr<i18n::IBreakIterator, DestroyIterator> iterator;

        // The lines as they are painted.
        const layout::TextInfo& Shown() const { return arranged ? *arranged : info; }
        const layout::LinePlacement* Placements() const { return placed.empty() ? nullptr : placed.data(); }
    };

    // Who is told where the characters stand.
    virtual layout::NodeLinkPtr GetLink() { return nullptr; }
    Lines& EnsureLines();
    i18n::IBreakIterator* Iterator() const { return lines_ ? lines_->iterator.get() : nullptr; }

    static layout::TextStyle MakeStyle(const Parameters& parameters);
    // Lays out when the style, the text or the available box differ from those of the stored lines. False
    // without a loaded typeface.
    bool EnsureLayout(const layout::TextServices& services, const Parameters& wanted,
                      const uint8_t* levels = nullptr);
    [[nodiscard]] bool Holds(const Parameters& wanted) const;
    layout::Size MeasureFor(layout::LayoutHandle& handle, float availableWidth, float availableHeight);
    void Remember(const Answer& answer);
    void Publish(PaintContext& context);
    void PaintShadows(PaintContext& context, const layout::LayoutNode& node, layout::Point corner,
                      fresco::CommandBuffer& buffer) const;

    TaggedString<MemoryTag::Rendering> text_;
    UniquePtr<Lines, MemoryTag::LayoutData> lines_;
};
static_assert(sizeof(DisplayText) == 48);

}  // namespace qorvex::dsp
