// The display elements of <html> and <body>.
#pragma once

#include "display/box.h"

namespace qorvex::dsp {

// Paints the page's base background over the whole view.
class DisplayHTML final : public IDisplayElement {
  public:
    DisplayHTML() : IDisplayElement(0) {}
    void Paint(PaintContext& context, bool dirty, const layout::LayoutNode& node,
               fresco::CommandBuffer& buffer) override;
};

// Whether the root node paints every pixel of the view, with no help from transforms and effects around it.
bool FillsCanvas(const layout::LayoutNode& root);

class DisplayBody final : public Box {};

}  // namespace qorvex::dsp
