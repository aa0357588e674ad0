// The display element of <p qor-inline>: text nodes and inline boxes below it share lines.
//
// To the box layout it is a leaf: its descendants stand in no Yoga tree of the page, and get their boxes from
// the flow once the paragraph has its own. So whoever changes a descendant must say so with
// InvalidateParagraphs.
#pragma once

#include "display/box.h"
#include "display/inline_flow.h"

namespace qorvex::dsp {

class DisplayParagraph final : public Box {
  public:
    // Its content paints itself.
    DisplayParagraph() : Box(kMeasures | kFlowsChildren) { SetFlag(kPaintsContent, false); }

    void Measure(layout::LayoutHandle& handle, float availableWidth, float availableHeight,
                 MeasureMode widthMode, MeasureMode heightMode, layout::Size& out) override;
    // Places what is inside when the paragraph's own box is known.
    void PlaceContent(layout::LayoutHandle& handle, layout::LayoutPass& pass);
    // Something below has changed.
    void Invalidate() { stale_ = true; }

  private:
    void FlowFor(layout::LayoutHandle& handle, float width, float height);

    InlineFlow flow_;
    layout::Size size_;
    float width_ = 0;
    float height_ = 0;
    bool stale_ = true;
};

// Every paragraph around the handle, and itself where it is one, is measured anew by the next layout.
void InvalidateParagraphs(layout::LayoutHandle& changed);

}  // namespace qorvex::dsp
