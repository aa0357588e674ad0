// The images that an element's style names: layers of its background, its border image, its mask. They are
// asked for as style is solved, also without a box to show them, and handed to the display element at the
// commit.
#pragma once

#include "css/values/image_values.h"
#include "dom/image_use.h"

namespace qorvex::css {
struct VisualStyle;
}

namespace qorvex::dom {

class Element;

class StyleImages {
  public:
    // The numbers are those of Node::ReleaseImages.
    enum Group : int { kBackground = 0, kBorder = 1, kMask = 2 };

    static bool AreNamedBy(const css::VisualStyle& style);

    // Asks for what the style names anew and lets go of what it no longer names; an image that stays in use
    // is not asked for again.
    void Take(Element& element);
    // A `slot` of -1 stands for the whole group.
    void Release(Group group, int slot);

    // True when it is one of these.
    bool Update(uint32_t id, const ImageInfoPtr& info, ImageState state);
    bool UpdateSVG(uint32_t id, const SVGImagePtr& svg);
    bool ShowFrame(uint32_t id, uint32_t frame);

    void Commit(dsp::Box& box, const css::VisualStyle& style) const;

  private:
    struct Image {
        css::CssString url;  // as the style has it
        ImageUse use;
    };
    using Images = SmallVector<Image, 1, MemoryTag::DOM>;

    static void TakeGroup(Element& element, Images& images, std::span<const css::ImageValue> wanted);
    template <class Visitor>
    bool Any(Visitor&& visit);

    Images groups_[3];
};

}  // namespace qorvex::dom
