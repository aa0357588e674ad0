// Styles of text nodes. A text has no declarations: it takes its parent's text group as it is, and the few
// fields of the other groups that its parent decides. Those few have few combinations, so texts share groups
// made once.
#pragma once

#include "css/values/shared_style.h"

namespace qorvex::css {

class TextStyleCache {
  public:
    // The layout group of a text below a parent with this display and white-space.
    const StyleHandle<LayoutStyle>& LayoutFor(CSSDisplay display, uint8_t textKind);
    // The visual group of a text below a parent with this one: what is inherited, and the selection
    // background.
    const StyleHandle<VisualStyle>& VisualFor(const VisualStyle& parent);

    // The whole styles.
    SharedStyles& Records() { return records_; }

  private:
    static constexpr size_t kDisplays = 5, kTextKinds = 4;
    StyleHandle<LayoutStyle> layouts_[kDisplays][kTextKinds];
    // The most recently made ones, in a ring: texts with the same look mostly stand together.
    static constexpr size_t kVisuals = 8;
    StyleHandle<VisualStyle> visuals_[kVisuals];
    size_t nextVisual_ = 0;
    SharedStyles records_;
};

}  // namespace qorvex::css
