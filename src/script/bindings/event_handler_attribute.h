// The on<type> attributes: a visible accessor and the hidden property __<type> of the wrapper that keeps the
// function. Dispatch looks at the target's bit first and reads the property only when it is set.
#pragma once

#include <string_view>

#include "dom/event_target.h"
#include "script/class_description.h"
#include "script/member_callbacks.h"

namespace qorvex::script {

// The function in the hidden property, else null.
JSValueRef ReadEventHandler(JSContextRef context, JSObjectRef wrapper, std::string_view hidden_name);
// Anything but a function clears the handler.
void WriteEventHandler(dom::EventTarget& target, ScriptCall& call, std::string_view type,
                       std::string_view hidden_name, JSValueRef value);

namespace internal {

template <FixedString kType>
inline constexpr auto kHandlerName = Join("on", kType);

template <FixedString kType>
inline constexpr auto kHiddenName = Join("__", kType);

template <FixedString kType>
JSValueRef GetEventHandler(dom::EventTarget&, ScriptCall& call) {
    return ReadEventHandler(call.context, call.this_object, kHiddenName<kType>.text);
}

template <FixedString kType>
void SetEventHandler(dom::EventTarget& target, ScriptCall& call, JSValueRef value) {
    WriteEventHandler(target, call, kType.text, kHiddenName<kType>.text, value);
}

}  // namespace internal

// The accessor on<type>, for example EventHandler<"click">().
template <FixedString kType>
constexpr AttributeDescription EventHandler() {
    using Bind = Binding<dom::EventTarget>;
    return Bind::ReadWrite<&internal::GetEventHandler<kType>, &internal::SetEventHandler<kType>>(
        internal::kHandlerName<kType>.text);
}

// Those that documents, elements and windows share.
inline constexpr AttributeDescription kCommonEventHandlers[] = {
    EventHandler<"abort">(),     EventHandler<"blur">(),       EventHandler<"click">(),
    EventHandler<"dblclick">(),  EventHandler<"error">(),      EventHandler<"focus">(),
    EventHandler<"keydown">(),   EventHandler<"keypress">(),   EventHandler<"keyup">(),
    EventHandler<"load">(),      EventHandler<"mousedown">(),  EventHandler<"mouseover">(),
    EventHandler<"mouseout">(),  EventHandler<"mouseenter">(), EventHandler<"mouseleave">(),
    EventHandler<"mousemove">(), EventHandler<"mouseup">(),    EventHandler<"input">(),
    EventHandler<"scroll">(),    EventHandler<"wheel">(),      EventHandler<"touchstart">(),
    EventHandler<"touchend">(),  EventHandler<"touchmove">(),
};

}  // namespace qorvex::script
