#include "script/bindings/event_target_binding.h"

#include "dom/document.h"
#include "dom/script_event_listener.h"
#include "script/bindings/bound_classes.h"

namespace qorvex::script {

namespace {

// https://dom.spec.whatwg.org/#concept-flatten-options: the third argument is a flag, or an object with one.
bool UsesCapture(JSContextRef context, JSValueRef options) {
    const JSObjectRef object = AsObject(context, options);
    const JSValueRef flag = object ? GetProperty(context, object, "capture") : options;
    return flag && JSValueToBoolean(context, flag);
}

// Null for no listener: such an entry is kept and does nothing.
qsl::RefPtr<dom::EventListener> MakeListener(JSContextRef context, JSValueRef value) {
    if (!AsObject(context, value)) return nullptr;
    return MakeHandle<dom::ScriptEventListener>(context, value);
}

}  // namespace

void AddListener(dom::EventTarget& target, ScriptCall& call, std::string_view type, JSValueRef listener,
                 JSValueRef options) {
    dom::Document* document = target.GetEventTargetDocument();
    if (!document) return;
    target.AddEventListener(document->Intern(type), MakeListener(call.context, listener),
                            UsesCapture(call.context, options));
}

void RemoveListener(dom::EventTarget& target, ScriptCall& call, std::string_view type, JSValueRef listener,
                    JSValueRef options) {
    dom::Document* document = target.GetEventTargetDocument();
    if (!document) return;
    target.RemoveEventListener(document->Intern(type), MakeListener(call.context, listener).get(),
                               UsesCapture(call.context, options));
}

namespace {
constexpr MethodDescription kMethods[] = {QORVEX_EVENT_TARGET_METHODS(dom::EventTarget)};
}
const ClassDescription kEventTargetClass = {.script_class = ScriptClass::EventTarget, .methods = kMethods};

}  // namespace qorvex::script
