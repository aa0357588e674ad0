// A script value that native memory holds on to: the collector scans the stack but not the heap.
#pragma once

#include <JavaScriptCore/JavaScript.h>

#include <utility>

#include "script/scripting_context.h"

namespace qorvex::script {

class ProtectedValue {
  public:
    ProtectedValue() = default;
    // Null stands for "no value".
    ProtectedValue(JSContextRef context, JSValueRef value)
        : context_(value ? GetGlobalContext(context) : nullptr), value_(value) {
        if (value_) JSValueProtect(context_, value_);
    }
    ProtectedValue(ProtectedValue&& other) noexcept
        : context_(std::exchange(other.context_, nullptr)), value_(std::exchange(other.value_, nullptr)) {}
    ProtectedValue& operator=(ProtectedValue other) noexcept {
        std::swap(context_, other.context_);
        std::swap(value_, other.value_);
        return *this;
    }
    ~ProtectedValue() { UnprotectUnlessTeardown(context_, value_); }

    [[nodiscard]] JSContextRef context() const { return context_; }
    [[nodiscard]] JSValueRef get() const { return value_; }
    explicit operator bool() const { return value_ != nullptr; }
    void reset() { *this = ProtectedValue(); }

  private:
    JSContextRef context_ = nullptr;
    JSValueRef value_ = nullptr;
};

}  // namespace qorvex::script
