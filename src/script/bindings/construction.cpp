#include "script/bindings/construction.h"

#include "dom/document.h"
#include "script/bindings/window.h"

namespace qorvex::script {

ConstructorCall::ConstructorCall(JSContextRef context, std::span<const JSValueRef> arguments,
                                 JSValueRef* exception)
    : context_(context),
      new_target_(arguments.empty() ? nullptr : arguments[0]),
      arguments_(arguments.empty() ? arguments : arguments.subspan(1)),
      exception_(exception) {}

JSValueRef ConstructorCall::ValueAt(size_t index) const {
    return index < arguments_.size() ? arguments_[index] : JSValueMakeUndefined(context_);
}

std::string_view ConstructorCall::TextAt(size_t index) {
    if (index >= arguments_.size() || JSValueIsUndefined(context_, arguments_[index])) return {};
    text_.Read(context_, arguments_[index], exception_);
    return text_.view();
}

JSValueRef ConstructorCall::MemberOf(size_t index, std::string_view key) const {
    const JSObjectRef dictionary = AsObject(context_, ValueAt(index));
    if (!dictionary) return nullptr;
    const String name(key);
    JSStringRef text = JSStringCreateWithUTF8CString(name.c_str());
    JSValueRef value = nullptr;
    if (JSObjectHasProperty(context_, dictionary, text)) {
        value = JSObjectGetProperty(context_, dictionary, text, exception_);
    }
    JSStringRelease(text);
    return value;
}

bool ConstructorCall::FlagOf(size_t index, std::string_view key, bool absent) const {
    const JSValueRef value = MemberOf(index, key);
    return value ? JSValueToBoolean(context_, value) : absent;
}

dom::Document* ConstructorCall::document() const {
    const ScriptingContext* page = GetScriptingContext(context_);
    return page && page->window ? page->window->GetEventTargetDocument() : nullptr;
}

JSValueRef ConstructorCall::Finish(ScriptingHandleEnabled* object) const {
    const JSValueRef value = ToScript(context_, object);
    const JSObjectRef target = AsObject(context_, new_target_);
    const JSObjectRef wrapper = AsObject(context_, value);
    const JSValueRef prototype = target ? GetProperty(context_, target, "prototype") : nullptr;
    if (wrapper && prototype && JSValueIsObject(context_, prototype) &&
        !JSValueIsStrictEqual(context_, prototype, JSObjectGetPrototype(context_, wrapper))) {
        JSObjectSetPrototype(context_, wrapper, prototype);
    }
    return value;
}

namespace internal {

JSValueRef RaiseInvalidConstructor(JSContextRef context, JSValueRef* exception) {
    RaiseError(context, "Invalid constructor!", exception);
    return JSObjectMake(context, nullptr, nullptr);
}

}  // namespace internal

}  // namespace qorvex::script
