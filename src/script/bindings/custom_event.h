// An event that script makes with a value of its own.
#pragma once

#include "dom/event.h"
#include "script/protected_value.h"

namespace qorvex::dom {

class CustomEvent final : public Event {
    QORVEX_SCRIPT_CLASS(CustomEvent)
  public:
    using Event::Event;

    // Null when there is none.
    JSValueRef GetDetail() const { return detail_.get(); }
    void SetDetail(script::ProtectedValue detail) { detail_ = std::move(detail); }

  private:
    script::ProtectedValue detail_;
};

}  // namespace qorvex::dom
