// Makes the C callbacks of bound members from native operations, so that nobody writes one by hand.
//
//   using Bind = Binding<dom::Element>;
//   constexpr AttributeDescription kAttributes[] = {
//       Bind::ReadOnly<&Element::GetChildElementCount>("childElementCount"),
//       Bind::ReadWrite<&Element::GetClassName, &Element::SetClassName>("className"),
//   };
//   constexpr MethodDescription kMethods[] = {
//       Bind::Method<"hasAttribute", &Element::HasAttribute, 1>(),
//   };
//
// An operation is a member function of the class or of a base, or a free function that takes the object
// first; a free function may ask for the raw call as its second parameter (ScriptCall&). What each callback
// does, in order: argument count, `this`, arguments from the last to the first, the operation, a waiting
// exception, the result. A `this` of another class gets undefined: nothing is thrown for it.
//
// No strong reference is taken for the call: `this` and the arguments are on the engine's stack, so the
// collector cannot finalise their wrappers, and these hold the natives.
#pragma once

#include <tuple>

#include "script/class_description.h"
#include "script/convert.h"
#include "script/make_handle.h"
#include "script/scripting_context.h"

namespace qorvex::script {

// The raw call, for operations whose arguments do not follow from types.
struct ScriptCall {
    JSContextRef context;
    JSObjectRef function;
    JSObjectRef this_object;
    std::span<const JSValueRef> arguments;
    JSValueRef* exception;

    // Undefined for a missing one.
    [[nodiscard]] JSValueRef ArgumentAt(size_t index) const {
        return index < arguments.size() ? arguments[index] : JSValueMakeUndefined(context);
    }
    void Raise(std::string_view message) const { RaiseError(context, message, exception); }
    [[nodiscard]] ScriptingContext* page() const { return script::GetScriptingContext(context); }
};

// "Failed to execute '%s' on '%s': %d arguments required, but only %d present" as an Error; gives undefined.
JSValueRef RaiseArgumentCountError(const ScriptCall& call, const char* operation, const char* class_name,
                                   size_t required);

template <size_t N>
struct FixedString {
    char text[N];
    constexpr FixedString(const char (&literal)[N]) {  // NOLINT: implicit by design
        for (size_t i = 0; i < N; ++i)
            text[i] = literal[i];
    }
};

// "on" and "click" as "onclick".
template <size_t P, size_t N>
constexpr FixedString<P + N - 1> Join(const char (&prefix)[P], const FixedString<N>& tail) {
    char text[P + N - 1] = {};
    for (size_t i = 0; i + 1 < P; ++i)
        text[i] = prefix[i];
    for (size_t i = 0; i < N; ++i)
        text[P - 1 + i] = tail.text[i];
    return text;
}

// A template parameter's text as an object that outlives all.
template <FixedString kName>
inline constexpr auto kText = kName;

namespace internal {

template <class... A>
struct TypeList {};

// The result and the script arguments of an operation; `kTakesCall` when the raw call comes first.
template <class R, bool kIsMember, bool kCall, class... A>
struct SignatureOf {
    using Result = R;
    using Arguments = TypeList<std::remove_cvref_t<A>...>;
    static constexpr bool kMember = kIsMember;
    static constexpr bool kTakesCall = kCall;
};

template <class F>
struct Signature;
template <class R, class C, class... A>
struct Signature<R (C::*)(A...)> : SignatureOf<R, true, false, A...> {};
template <class R, class C, class... A>
struct Signature<R (C::*)(A...) const> : SignatureOf<R, true, false, A...> {};
template <class R, class T, class... A>
struct Signature<R (*)(T&, A...)> : SignatureOf<R, false, false, A...> {};
template <class R, class T, class... A>
struct Signature<R (*)(T&, ScriptCall&, A...)> : SignatureOf<R, false, true, A...> {};

template <class S, auto kOperation, class T, class... Values>
decltype(auto) CallOperation(T& self, ScriptCall& call, Values&&... values) {
    if constexpr (S::kMember) {
        return (self.*kOperation)(std::forward<Values>(values)...);
    } else if constexpr (S::kTakesCall) {
        return kOperation(self, call, std::forward<Values>(values)...);
    } else {
        return kOperation(self, std::forward<Values>(values)...);
    }
}

template <auto kOperation, class T, class... A, size_t... I>
JSValueRef Apply(T& self, ScriptCall& call, TypeList<A...>, std::index_sequence<I...>) {
    using S = Signature<decltype(kOperation)>;
    [[maybe_unused]] std::tuple<Argument<A>...> arguments;
    // Last to first, as conversions may run script.
    [[maybe_unused]] constexpr size_t kLast = sizeof...(A) - 1;
    const bool converted =
        (std::get<kLast - I>(arguments).Read(call.context, call.ArgumentAt(kLast - I), call.exception) &&
         ...);
    if (!converted) return JSValueMakeUndefined(call.context);

    if constexpr (std::is_void_v<typename S::Result>) {
        CallOperation<S, kOperation>(self, call, std::get<I>(arguments).Get()...);
        HandOverPendingException(call.context, call.exception);
        return JSValueMakeUndefined(call.context);
    } else {
        auto&& result = CallOperation<S, kOperation>(self, call, std::get<I>(arguments).Get()...);
        HandOverPendingException(call.context, call.exception);
        if (*call.exception) return JSValueMakeUndefined(call.context);
        return ToScript(call.context, result);
    }
}

template <class T, auto kOperation>
JSValueRef ApplyToThis(ScriptCall& call) {
    T* self = NativeOf<T>(call.context, call.this_object);
    if (!self) return JSValueMakeUndefined(call.context);
    return []<class... A>(T& object, ScriptCall& inner, TypeList<A...> types) {
        return Apply<kOperation>(object, inner, types, std::index_sequence_for<A...>{});
    }(*self, call, typename Signature<decltype(kOperation)>::Arguments{});
}

// The class in a message: its script name, unless the class says otherwise.
template <class T>
constexpr const char* ErrorClassName() {
    if constexpr (requires { T::kErrorClassName; }) return T::kErrorClassName;
    return GetScriptClassRow(T::kScriptClass).name;
}

template <class T, FixedString kName, auto kOperation, unsigned kRequired>
JSValueRef MethodCallback(JSContextRef context, JSObjectRef function, JSObjectRef this_object, size_t count,
                          const JSValueRef arguments[], JSValueRef* exception) {
    ScriptCall call{context, function, this_object, {arguments, count}, exception};
    if constexpr (kRequired > 0) {
        if (count < kRequired) {
            return RaiseArgumentCountError(call, kName.text, ErrorClassName<T>(), kRequired);
        }
    }
    return ApplyToThis<T, kOperation>(call);
}

template <class T, auto kOperation>
JSValueRef AccessorCallback(JSContextRef context, JSObjectRef function, JSObjectRef this_object, size_t count,
                            const JSValueRef arguments[], JSValueRef* exception) {
    ScriptCall call{context, function, this_object, {arguments, count}, exception};
    return ApplyToThis<T, kOperation>(call);
}

}  // namespace internal

template <class T>
struct Binding {
    template <FixedString kName, auto kOperation, unsigned kRequired = 0>
    static constexpr MethodDescription Method() {
        return {kText<kName>.text, internal::MethodCallback<T, kName, kOperation, kRequired>};
    }

    template <auto kGetter>
    static constexpr AttributeDescription ReadOnly(const char* name) {
        return {name, internal::AccessorCallback<T, kGetter>, nullptr};
    }

    template <auto kGetter, auto kSetter>
    static constexpr AttributeDescription ReadWrite(const char* name) {
        return {name, internal::AccessorCallback<T, kGetter>, internal::AccessorCallback<T, kSetter>};
    }
};

}  // namespace qorvex::script
