// The display elements of <html> and <body>.
#pragma once

#include "display/box.h"

namespace qorvex::dsp {

// Paints the page's base background over the whole view.
class DisplayHTML final : public IDisplayElement {
  public:
    static qsl::RefPtr<DisplayHTML> Create();
    void Paint(PaintContext& context, bool dirty, const layout::LayoutNode& node,
               fresco::CommandBuffer& buffer) override;

  private:
    DisplayHTML() : IDisplayElement(0) {}
    template <typename T, typename... Args>
    friend T* qorvex::New(MemoryTag, Args&&...);
};

class DisplayBody final : public Box {
  public:
    static qsl::RefPtr<DisplayBody> Create();

  private:
    DisplayBody() = default;
    template <typename T, typename... Args>
    friend T* qorvex::New(MemoryTag, Args&&...);
};

}  // namespace qorvex::dsp
