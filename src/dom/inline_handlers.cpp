#include "dom/inline_handlers.h"

#include <JavaScriptCore/JavaScript.h>

#include <array>

#include "core/logging/log.h"
#include "dom/event.h"
#include "dom/event_listeners.h"
#include "dom/event_target.h"
#include "script/evaluate.h"
#include "script/scripting_context.h"

namespace qorvex::dom {

void CallInlineHandler(EventTarget& target, EventListeners& store, Event& event) {
    const int id = EventId(event.GetType().view());
    if (id < 0 || !store.InlineHandlers().test(static_cast<size_t>(id))) return;
    const script::ScriptingContext* context = target.GetScriptingContext();
    JSObjectRef self = target.wrapper();
    if (!context || !context->context || !self) return;
    JSContextRef ctx = context->context;
    const std::string_view name = InlineHandlerName(id);
    JSValueRef value = script::GetProperty(ctx, self, name);
    if (!value || JSValueIsUndefined(ctx, value) || JSValueIsNull(ctx, value)) return;
    JSObjectRef function = JSValueIsObject(ctx, value) ? JSValueToObject(ctx, value, nullptr) : nullptr;
    if (!function || !JSObjectIsFunction(ctx, function)) {
        String text("Attempt to call a non-function value ");
        text.append(name);
        AssertFailure(text);
        return;
    }
    JSValueRef argument = nullptr;
    event.GetOrCreateWrapper(ctx, &argument);
    if (!argument) return;
    const std::array<JSValueRef, 1> arguments = {argument};
    script::CallFunction(ctx, function, self, arguments);
}

}  // namespace qorvex::dom
