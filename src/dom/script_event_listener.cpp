#include "dom/script_event_listener.h"

#include <JavaScriptCore/JavaScript.h>

#include <array>

#include "core/logging/log.h"
#include "dom/event.h"
#include "dom/event_target.h"
#include "script/evaluate.h"
#include "script/scripting_context.h"

namespace qorvex::dom {

ScriptEventListener::ScriptEventListener(JSContextRef context, JSValueRef function)
    : context_(JSContextGetGlobalContext(context)), function_(function) {
    if (function_) JSValueProtect(context_, function_);
}

ScriptEventListener::~ScriptEventListener() {
    script::UnprotectUnlessTeardown(context_, function_);
}

bool ScriptEventListener::IsSameAs(const EventListener& other) const {
    JSValueRef function = other.GetScriptFunction();
    if (!function_ || !function) return this == &other;
    return JSValueIsEqual(context_, function_, function, nullptr);
}

void ScriptEventListener::HandleEvent(Event& event) {
    EventTarget* current = event.GetCurrentTarget();
    if (!current) {
        LogDebug("HandleEvent trying to handle an event without a target.");
        return;
    }
    const script::ScriptingContext* context = current->GetScriptingContext();
    if (!context || !context->context) {
        AssertFailure("Cannot handle event with invalid scripting context!");
        return;
    }
    if (!function_) {
        AssertFailure("Empty listener JS object!");
        return;
    }
    JSValueRef target = nullptr;
    JSValueRef argument = nullptr;
    current->GetOrCreateWrapper(context->context, &target);
    event.GetOrCreateWrapper(context->context, &argument);
    JSObjectRef function = JSValueToObject(context->context, function_, nullptr);
    if (!target || !argument || !function) return;
    const std::array<JSValueRef, 1> arguments = {argument};
    script::CallFunction(context->context, function, JSValueToObject(context->context, target, nullptr),
                         arguments);
}

}  // namespace qorvex::dom
