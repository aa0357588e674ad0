#include "script/bindings/script_timer.h"

#include "core/logging/log.h"
#include "script/bindings/window.h"
#include "script/scripting_context.h"

namespace qorvex::dom {

void ScriptTimer::Execute() {
    const script::ScriptingContext* page = window_->GetScriptingContext();
    if (!page) return;
    JSContextRef context = page->context;
    JSValueRef exception = nullptr;
    const JSObjectRef function = function_ ? JSValueToObject(context, function_.get(), &exception) : nullptr;
    if (!function) {
        LogWarning("Attempt to call a non-function value");
        return;
    }
    // An object that is no function is called as well, and does nothing.
    JSObjectCallAsFunction(context, function, nullptr, 0, nullptr, &exception);
}

void ScriptTimer::Cancel() {
    function_.reset();
    window_->ForgetTimer(id_);
}

}  // namespace qorvex::dom
