// What `new` does for the classes that script can construct.
#pragma once

#include <optional>

#include "script/member_callbacks.h"

namespace qorvex::dom {
class Document;
}

namespace qorvex::script {

// The arguments of `new`, with readers for dictionaries. An absent key keeps the default that the reader was
// given; a null, undefined or non-object dictionary is an empty one.
class ConstructorCall {
  public:
    // The first argument of the native function is new.target.
    ConstructorCall(JSContextRef context, std::span<const JSValueRef> arguments, JSValueRef* exception);

    [[nodiscard]] JSContextRef context() const { return context_; }
    [[nodiscard]] JSValueRef* exception() const { return exception_; }
    [[nodiscard]] size_t count() const { return arguments_.size(); }
    [[nodiscard]] JSValueRef ValueAt(size_t index) const;
    // Empty for a missing one. Valid until the next call.
    [[nodiscard]] std::string_view TextAt(size_t index);

    // The value of a key of the dictionary at `index`; null when it is absent.
    [[nodiscard]] JSValueRef MemberOf(size_t index, std::string_view key) const;
    [[nodiscard]] bool FlagOf(size_t index, std::string_view key, bool absent = false) const;

    // The document of the page; null in a context without one.
    [[nodiscard]] dom::Document* document() const;

    // Gives the new object the prototype of new.target, which differs for subclasses.
    JSValueRef Finish(ScriptingHandleEnabled* object) const;

  private:
    JSContextRef context_;
    JSValueRef new_target_;
    std::span<const JSValueRef> arguments_;
    JSValueRef* exception_;
    ScriptText text_;
};

namespace internal {
// "Invalid constructor!", for a call without `new`.
JSValueRef RaiseInvalidConstructor(JSContextRef context, JSValueRef* exception);
}  // namespace internal

// kMake is RefPtr<T> (*)(dom::Document&, ConstructorCall&). The object is held natively only until this
// returns.
template <auto kMake>
JSValueRef Construct(JSContextRef context, JSObjectRef, JSObjectRef, size_t count,
                     const JSValueRef arguments[], JSValueRef* exception) {
    ConstructorCall call(context, {arguments, count}, exception);
    dom::Document* document = call.document();
    if (count == 0 || !AsObject(context, arguments[0]) || !document) {
        return internal::RaiseInvalidConstructor(context, exception);
    }
    auto object = kMake(*document, call);
    if (*exception || !object) return JSValueMakeUndefined(context);
    return call.Finish(object.get());
}

}  // namespace qorvex::script
