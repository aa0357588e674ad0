#include "script/bindings/event_handler_attribute.h"

#include "dom/event_listeners.h"

namespace qorvex::script {

namespace {

// Null for anything that cannot be called.
JSObjectRef AsFunction(JSContextRef context, JSValueRef value) {
    const JSObjectRef object = AsObject(context, value);
    return object && JSObjectIsFunction(context, object) ? object : nullptr;
}

}  // namespace

JSValueRef ReadEventHandler(JSContextRef context, JSObjectRef wrapper, std::string_view hidden_name) {
    const JSObjectRef function = AsFunction(context, GetProperty(context, wrapper, hidden_name));
    return function ? function : JSValueMakeNull(context);
}

void WriteEventHandler(dom::EventTarget& target, ScriptCall& call, std::string_view type,
                       std::string_view hidden_name, JSValueRef value) {
    const JSObjectRef function = AsFunction(call.context, value);
    dom::EventListeners* listeners = target.GetEventListeners(function != nullptr);
    const int id = dom::EventId(type);
    if (listeners && id >= 0) listeners->InlineHandlers().set(static_cast<size_t>(id), function != nullptr);
    SetProperty(call.context, call.this_object, hidden_name,
                function ? function : JSValueMakeNull(call.context), kJSPropertyAttributeDontEnum);
}

}  // namespace qorvex::script
