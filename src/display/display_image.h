// The display element of <img>: a box that shows a picture, stretched over its content box.
#pragma once

#include "display/box.h"

namespace qorvex::dsp {

class DisplayImage final : public Box {
  public:
    DisplayImage() : Box(kReplaced) {}

    // At the commit. Without a resource there is nothing to draw, but the size counts.
    void SetImage(const ImageSlot& image) { image_ = image; }
    layout::Size NaturalSize() const { return image_.intrinsic; }

    void Measure(layout::LayoutHandle& handle, float availableWidth, float availableHeight,
                 MeasureMode widthMode, MeasureMode heightMode, layout::Size& out) override;

  protected:
    void PaintContent(PaintContext& context, bool dirty, const layout::LayoutNode& node,
                      fresco::CommandBuffer& buffer) override;

  private:
    ImageSlot image_;
};

}  // namespace qorvex::dsp
