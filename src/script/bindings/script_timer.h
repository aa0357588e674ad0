// A function that script wants to be called later. Held by the window's map and by its queue.
#pragma once

#include "core/tasks/timer.h"
#include "script/protected_value.h"

namespace qorvex::dom {

class Window;

class ScriptTimer final : public Timer {
  public:
    ScriptTimer(Window& window, script::ProtectedValue function, uint32_t id)
        : window_(&window), function_(std::move(function)), id_(id) {}

    // Calls the function with no arguments. What it throws vanishes: a timer has nobody to tell.
    void Execute() override;
    // The queue has retired the timer: lets go of the function and of the window's entry.
    void Cancel() override;

  private:
    Window* window_;
    script::ProtectedValue function_;
    uint32_t id_;
};

}  // namespace qorvex::dom
