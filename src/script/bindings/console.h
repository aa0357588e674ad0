// `console`: lines of the page in the engine's log.
#pragma once

#include <chrono>
#include <string_view>

#include "core/memory/containers.h"
#include "script/native_private.h"
#include "script/scripting_handle_enabled.h"

namespace qorvex::dom {

class Console final : public script::ScriptingHandleEnabledRefCounted {
    QORVEX_SCRIPT_CLASS(Console)
  public:
    void StartTimer(std::string_view label);
    // Logs the time since StartTimer of the label and forgets it.
    void EndTimer(std::string_view label);

  private:
    HashMap<String, std::chrono::steady_clock::time_point, MemoryTag::DOM> timers_;
};

}  // namespace qorvex::dom

namespace qorvex::script {

// A page has one console: its functions work on that whatever `this` is, so that `const { log } = console`
// does what it says.
template <>
dom::Console* NativeOf<dom::Console>(JSContextRef context, JSObjectRef object);

}  // namespace qorvex::script
