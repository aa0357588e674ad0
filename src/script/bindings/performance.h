// `performance`: the page's clock, which is the view's.
#pragma once

#include "dom/event_target.h"

namespace qorvex::dom {

class Window;

class Performance final : public EventTarget {
    QORVEX_SCRIPT_CLASS(Performance)
  public:
    explicit Performance(Window& window) : window_(&window) {}

    // The window goes before script lets go of this object.
    void ForgetWindow() { window_ = nullptr; }
    double Now() const;
    Document* GetEventTargetDocument() const override;

  private:
    Window* window_;
};

}  // namespace qorvex::dom
