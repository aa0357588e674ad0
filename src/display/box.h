// The display element of every element without a class of its own: backgrounds, borders and shadows.
#pragma once

#include "core/memory/containers.h"
#include "display/display_element.h"

namespace qorvex::dsp {

// One image of a background, border image or mask list. Filled by the image rooms; a slot without a resource
// and without a gradient paints nothing.
struct ImageSlot {
    int32_t resource = -1;
    uint32_t gradient = 0;  // 1-based index in the style's image list, 0 for none
    layout::Size intrinsic;
    layout::Edges slices;
    uint32_t usedInFrame = 0;
};

using ImageSlots = SmallVector<ImageSlot, 1, MemoryTag::Rendering>;

class Box : public IDisplayElement {
  public:
    Box() : Box(0) {}

    void Paint(PaintContext& context, bool dirty, const layout::LayoutNode& node,
               fresco::CommandBuffer& buffer) override;

    ImageSlots& BackgroundSlots() { return background_; }
    ImageSlots& BorderImageSlots() { return border_image_; }
    // Exists only for elements with a mask image.
    ImageSlots* MaskSlots() { return mask_.get(); }
    void SetHasMask(bool on);

  protected:
    explicit Box(uint32_t extraFlags) : IDisplayElement(kPaintsBox | extraFlags) {}

    // What a subclass shows between its background and its border.
    virtual void PaintContent(PaintContext& context, bool dirty, const layout::LayoutNode& node,
                              fresco::CommandBuffer& buffer);

  private:
    ImageSlots background_;
    ImageSlots border_image_;
    UniquePtr<ImageSlots, MemoryTag::Rendering> mask_;
};

}  // namespace qorvex::dsp
