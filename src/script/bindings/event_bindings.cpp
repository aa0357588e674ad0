// Event, UIEvent and CustomEvent, and their constructors.
#include "dom/document.h"
#include "dom/event_listeners.h"
#include "script/bindings/bound_classes.h"
#include "script/bindings/construction.h"
#include "script/bindings/custom_event.h"

namespace qorvex::script {

namespace {

using dom::CustomEvent;
using dom::Event;

void InitEvent(Event& event, std::string_view type, bool bubbles, bool cancelable) {
    if (dom::Document* document = event.GetDocument())
        event.InitEvent(document->Intern(type), bubbles, cancelable);
}

using Bind = Binding<Event>;
constexpr AttributeDescription kAttributes[] = {
    Bind::ReadOnly<&Event::GetType>("type"),
    Bind::ReadOnly<&Event::GetTarget>("target"),
    Bind::ReadOnly<&Event::GetCurrentTarget>("currentTarget"),
    Bind::ReadOnly<&Event::GetPhase>("eventPhase"),
    Bind::ReadOnly<&Event::GetBubbles>("bubbles"),
    Bind::ReadOnly<&Event::GetCancelable>("cancelable"),
    Bind::ReadOnly<&Event::GetDefaultPrevented>("defaultPrevented"),
};
constexpr MethodDescription kMethods[] = {
    Bind::Method<"initEvent", &InitEvent>(),
    Bind::Method<"preventDefault", &Event::PreventDefault>(),
    Bind::Method<"stopImmediatePropagation", &Event::StopImmediatePropagation>(),
    Bind::Method<"stopPropagation", &Event::StopPropagation>(),
};
// https://dom.spec.whatwg.org/#interface-event
constexpr ConstantDescription kConstants[] = {
    {"NONE", 0}, {"CAPTURING_PHASE", 1}, {"AT_TARGET", 2}, {"BUBBLING_PHASE", 3}};

constexpr MethodDescription kUIEventMethods[] = {Binding<dom::UIEvent>::Method<"initUIEvent", &InitEvent>()};

JSValueRef GetDetail(CustomEvent& event, ScriptCall& call) {
    return event.GetDetail() ? event.GetDetail() : JSValueMakeNull(call.context);
}

void InitCustomEvent(CustomEvent& event, ScriptCall& call, std::string_view type, bool bubbles,
                     bool cancelable, JSValueRef detail) {
    InitEvent(event, type, bubbles, cancelable);
    event.SetDetail(ProtectedValue(call.context, detail));
}

using BindCustom = Binding<CustomEvent>;
constexpr AttributeDescription kCustomAttributes[] = {BindCustom::ReadOnly<&GetDetail>("detail")};
constexpr MethodDescription kCustomMethods[] = {BindCustom::Method<"initCustomEvent", &InitCustomEvent, 1>()};

template <class T>
qsl::RefPtr<T> NewEvent(dom::Document& document, ConstructorCall& call) {
    return MakeHandle<T>(&document, document.Intern(call.TextAt(0)), call.FlagOf(1, "bubbles"),
                         call.FlagOf(1, "cancelable"));
}

qsl::RefPtr<CustomEvent> NewCustomEvent(dom::Document& document, ConstructorCall& call) {
    qsl::RefPtr<CustomEvent> event = NewEvent<CustomEvent>(document, call);
    event->SetScriptConstructed();
    if (const JSValueRef detail = call.MemberOf(1, "detail")) {
        event->SetDetail(ProtectedValue(call.context(), detail));
    }
    return event;
}

// `listener.handleEvent(event)` as script may call it.
void HandleEvent(dom::EventListener& listener, Event* event) {
    if (event) listener.HandleEvent(*event);
}
constexpr MethodDescription kListenerMethods[] = {
    Binding<dom::EventListener>::Method<"handleEvent", &HandleEvent, 1>()};

}  // namespace

const ClassDescription kEventClass = {.script_class = ScriptClass::Event,
                                      .attributes = kAttributes,
                                      .methods = kMethods,
                                      .constants = kConstants,
                                      .construct = Construct<&NewEvent<Event>>};
const ClassDescription kUIEventClass = {.script_class = ScriptClass::UIEvent,
                                        .methods = kUIEventMethods,
                                        .construct = Construct<&NewEvent<dom::UIEvent>>};
const ClassDescription kCustomEventClass = {.script_class = ScriptClass::CustomEvent,
                                            .attributes = kCustomAttributes,
                                            .methods = kCustomMethods,
                                            .construct = Construct<&NewCustomEvent>};
const ClassDescription kEventListenerClass = {
    .script_class = ScriptClass::EventListener, .methods = kListenerMethods, .has_global_name = false};

}  // namespace qorvex::script
