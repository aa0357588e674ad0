// The display element of every element without a class of its own: backgrounds, borders and shadows.
#pragma once

#include "core/memory/containers.h"
#include "display/display_element.h"

namespace qorvex::dsp {

// One image of a background, border image or mask list, or the content of an image element. Filled at the
// commit; a slot without a resource paints nothing.
struct ImageSlot {
    int32_t resource = -1;  // the frame that shows, of an animated image
    layout::Size intrinsic;
    // The part of the image to draw, in its pixels; empty for the whole.
    layout::Rect source{};
};

using ImageSlots = SmallVector<ImageSlot, 1, MemoryTag::Rendering>;

class Box : public IDisplayElement {
  public:
    Box() : IDisplayElement(kPaintsBox) {}

    void Paint(PaintContext& context, bool dirty, const layout::LayoutNode& node,
               fresco::CommandBuffer& buffer) override;

    // The slots of an element's images; most elements have none. Null until first asked for by EnsureImages.
    struct Images {
        ImageSlots background;
        ImageSlots border;
        ImageSlots mask;
    };
    Images* GetImages() { return images_.get(); }
    Images& EnsureImages();
    ImageSlots* BackgroundSlots() { return images_ ? &images_->background : nullptr; }
    ImageSlots* BorderSlots() { return images_ ? &images_->border : nullptr; }
    // Null for elements without a mask image.
    ImageSlots* MaskSlots() { return images_ && Has(kHasMask) ? &images_->mask : nullptr; }
    void SetHasMask(bool on);

  protected:
    // For a subclass that paints content.
    explicit Box(uint32_t extraFlags) : IDisplayElement(kPaintsBox | kPaintsContent | extraFlags) {}

    // What such a subclass shows between its background and its border.
    virtual void PaintContent(PaintContext& context, bool dirty, const layout::LayoutNode& node,
                              fresco::CommandBuffer& buffer);

  private:
    UniquePtr<Images, MemoryTag::Rendering> images_;
};

}  // namespace qorvex::dsp
