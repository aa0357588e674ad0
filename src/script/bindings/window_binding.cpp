// The window as script sees it: functions and numbers. Its objects (document, console and the like) are plain
// properties of the global object, put there when the context is made: reading one costs nothing that way.
#include "dom/document.h"
#include "dom/document_host.h"
#include "script/bindings/bound_classes.h"
#include "script/bindings/event_handler_attribute.h"
#include "script/bindings/event_target_binding.h"
#include "script/bindings/style_declaration.h"
#include "script/bindings/unavailable.h"
#include "script/bindings/window.h"

namespace qorvex::script {

namespace {

using dom::Window;
using Bind = Binding<Window>;

// Nothing for null and undefined.
ProtectedValue Callback(JSContextRef context, JSValueRef value) {
    if (JSValueIsNull(context, value) || JSValueIsUndefined(context, value)) return {};
    return ProtectedValue(context, value);
}

uint32_t SetTimeout(Window& window, ScriptCall& call, JSValueRef function, std::optional<uint32_t> delay) {
    return window.AddTimer(Callback(call.context, function), delay.value_or(0), false);
}
uint32_t SetInterval(Window& window, ScriptCall& call, JSValueRef function, std::optional<uint32_t> delay) {
    return window.AddTimer(Callback(call.context, function), delay.value_or(0), true);
}
uint32_t RequestFrame(Window& window, ScriptCall& call, JSValueRef function) {
    return window.RequestAnimationFrame(Callback(call.context, function));
}

uint32_t GetWidth(Window& window) {
    return window.GetEventTargetDocument()->GetHost().GetViewSize().width;
}
uint32_t GetHeight(Window& window) {
    return window.GetEventTargetDocument()->GetHost().GetViewSize().height;
}
int GetZero(Window&) {
    return 0;
}
int GetOne(Window&) {
    return 1;
}

// The root scroller is the body, or the html element of a page without one.
dom::Element* GetScroller(Window& window) {
    dom::Document& document = *window.GetEventTargetDocument();
    return document.GetBodyElement() ? document.GetBodyElement() : document.GetHtmlElement();
}
int GetScrollX(Window& window) {
    dom::Element* scroller = GetScroller(window);
    return scroller ? static_cast<int>(scroller->GetScrollLeft()) : 0;
}
int GetScrollY(Window& window) {
    dom::Element* scroller = GetScroller(window);
    return scroller ? static_cast<int>(scroller->GetScrollTop()) : 0;
}
void ScrollTo(Window& window, std::optional<int32_t> x, std::optional<int32_t> y) {
    dom::Element* scroller = GetScroller(window);
    if (!scroller) return;
    scroller->SetScrollTop(static_cast<float>(y.value_or(0)));
    scroller->SetScrollLeft(static_cast<float>(x.value_or(0)));
}
void ScrollBy(Window& window, std::optional<double> x, std::optional<double> y) {
    ScrollTo(window, static_cast<int32_t>(TruncateToUint32(GetScrollX(window) + x.value_or(0))),
             static_cast<int32_t>(TruncateToUint32(GetScrollY(window) + y.value_or(0))));
}

JSValueRef GetComputedStyle(Window&, ScriptCall& call, dom::Element* element) {
    if (!element) return JSValueMakeNull(call.context);
    return MakeStyleDeclaration(call.context, *element, StyleForm::Computed);
}

constexpr AttributeDescription kAttributes[] = {
    Bind::ReadOnly<&GetHeight>("outerHeight"),
    Bind::ReadOnly<&GetWidth>("outerWidth"),
    Bind::ReadOnly<&GetHeight>("innerHeight"),
    Bind::ReadOnly<&GetWidth>("innerWidth"),
    Bind::ReadOnly<&GetZero>("screenX"),
    Bind::ReadOnly<&GetZero>("screenY"),
    Bind::ReadOnly<&GetZero>("screenLeft"),
    Bind::ReadOnly<&GetZero>("screenTop"),
    Bind::ReadOnly<&GetScrollX>("scrollX"),
    Bind::ReadOnly<&GetScrollY>("scrollY"),
    Bind::ReadOnly<&GetScrollX>("pageXOffset"),
    Bind::ReadOnly<&GetScrollY>("pageYOffset"),
    Bind::ReadOnly<&GetOne>("devicePixelRatio"),
    EventHandler<"gamepadconnected">(),
    EventHandler<"gamepaddisconnected">(),
    EventHandler<"popstate">(),
    EventHandler<"resize">(),
};

constexpr MethodDescription kMethods[] = {
    QORVEX_EVENT_TARGET_METHODS(Window),
    Bind::Method<"cancelAnimationFrame", &Window::CancelAnimationFrame, 1>(),
    Bind::Method<"clearInterval", &Window::CancelTimer, 1>(),
    Bind::Method<"clearTimeout", &Window::CancelTimer, 1>(),
    Bind::Method<"getComputedStyle", &GetComputedStyle, 1>(),
    Bind::Method<"getSelection", &NotAvailable<Window, "Window::GetSelection">>(),
    Bind::Method<"requestAnimationFrame", &RequestFrame, 1>(),
    Bind::Method<"scrollBy", &ScrollBy>(),
    Bind::Method<"scrollTo", &ScrollTo>(),
    Bind::Method<"setInterval", &SetInterval, 1>(),
    Bind::Method<"setTimeout", &SetTimeout, 1>(),
};

}  // namespace

const ClassDescription kWindowClass = {.script_class = ScriptClass::Window,
                                       .attributes = kAttributes,
                                       .shared_attributes = kCommonEventHandlers,
                                       .methods = kMethods};

}  // namespace qorvex::script
