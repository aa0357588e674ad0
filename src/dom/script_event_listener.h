// A listener that calls a script function, which stays protected from the collector as long as the listener
// lives.
#pragma once

#include <JavaScriptCore/JSBase.h>

#include "dom/event_listeners.h"

namespace qorvex::dom {

class ScriptEventListener final : public EventListener {
  public:
    // `function` may be null, or no function: calling it then is an assertion.
    ScriptEventListener(JSContextRef context, JSValueRef function);

    void HandleEvent(Event& event) override;
    bool IsSameAs(const EventListener& other) const override;
    JSValueRef GetScriptFunction() const override { return function_; }

  private:
    ~ScriptEventListener() override;

    JSGlobalContextRef context_;
    JSValueRef function_;
};

}  // namespace qorvex::dom
