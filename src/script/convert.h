// Between script values and native values, by type: Argument<T> reads one, ToScript writes one. The rules are
// those of the bindings as a whole, so no callback converts by hand.
//
//   text            String(value)                     <-> string, an absent optional being null
//   numbers         Number(value), integers truncated  -> number
//   bool            Boolean(value)                    <-> boolean
//   bound object    null for anything of another class <-> its wrapper, null for a null pointer
//   optional<T>     absent for undefined or missing    -> null when absent
//   JSValueRef      as it is                          <-> as it is
#pragma once

#include <JavaScriptCore/JavaScript.h>

#include <cmath>
#include <concepts>
#include <optional>
#include <span>
#include <string_view>
#include <type_traits>

#include "qsl/ref_ptr.h"
#include "script/evaluate.h"
#include "script/native_private.h"
#include "script/script_text.h"
#include "script/scripting_handle_enabled.h"

namespace qorvex::script {

// Number(value) cut to 32 bits and wrapped, as ECMAScript's ToUint32 does; NaN and infinities give 0.
[[nodiscard]] inline uint32_t TruncateToUint32(double number) {
    if (!std::isfinite(number)) return 0;
    if (std::fabs(number) < 9.0e18) return static_cast<uint32_t>(static_cast<int64_t>(number));
    return static_cast<uint32_t>(static_cast<int64_t>(std::fmod(std::trunc(number), 4294967296.0)));
}

template <class T>
concept TextResult = requires(const T& value) {
    { value.view() } -> std::convertible_to<std::string_view>;
};

template <class T>
struct Argument;

template <>
struct Argument<JSValueRef> {
    bool Read(JSContextRef, JSValueRef value, JSValueRef*) {
        value_ = value;
        return true;
    }
    JSValueRef Get() { return value_; }
    JSValueRef value_ = nullptr;
};

template <>
struct Argument<bool> {
    bool Read(JSContextRef context, JSValueRef value, JSValueRef*) {
        value_ = JSValueToBoolean(context, value);
        return true;
    }
    bool Get() { return value_; }
    bool value_ = false;
};

template <class T>
requires std::is_arithmetic_v<T>
struct Argument<T> {
    bool Read(JSContextRef context, JSValueRef value, JSValueRef* exception) {
        const double number = JSValueToNumber(context, value, exception);
        if (exception && *exception) return false;
        if constexpr (std::is_floating_point_v<T>) {
            value_ = static_cast<T>(number);
        } else if constexpr (std::is_signed_v<T>) {
            value_ = static_cast<T>(static_cast<int32_t>(TruncateToUint32(number)));
        } else {
            value_ = static_cast<T>(TruncateToUint32(number));
        }
        return true;
    }
    T Get() { return value_; }
    T value_ = 0;
};

template <>
struct Argument<std::string_view> {
    bool Read(JSContextRef context, JSValueRef value, JSValueRef* exception) {
        return text_.Read(context, value, exception);
    }
    std::string_view Get() { return text_.view(); }
    ScriptText text_;
};

template <class T>
struct Argument<T*> {
    bool Read(JSContextRef context, JSValueRef value, JSValueRef*) {
        native_ = NativeOfValue<T>(context, value);
        return true;
    }
    T* Get() { return native_; }
    // Not counted: the value is on the caller's stack, and its wrapper holds the object.
    T* native_ = nullptr;
};

template <class T>
struct Argument<qsl::RefPtr<T>> : Argument<T*> {
    qsl::RefPtr<T> Get() { return qsl::RefPtr<T>(this->native_); }
};

template <class T>
struct Argument<std::optional<T>> {
    bool Read(JSContextRef context, JSValueRef value, JSValueRef* exception) {
        present_ = !JSValueIsUndefined(context, value);
        return !present_ || inner_.Read(context, value, exception);
    }
    std::optional<T> Get() { return present_ ? std::optional<T>(inner_.Get()) : std::nullopt; }
    Argument<T> inner_;
    bool present_ = false;
};

inline JSValueRef ToScript(JSContextRef, JSValueRef value) {
    return value;
}
inline JSValueRef ToScript(JSContextRef context, std::string_view text) {
    return ToScriptString(context, text);
}
inline JSValueRef ToScript(JSContextRef context, const char* text) {
    return ToScriptString(context, text);
}

template <class T>
requires std::is_arithmetic_v<T> JSValueRef ToScript(JSContextRef context, T value) {
    if constexpr (std::is_same_v<T, bool>) return JSValueMakeBoolean(context, value);
    return JSValueMakeNumber(context, static_cast<double>(value));
}

template <class T>
requires std::is_enum_v<T> JSValueRef ToScript(JSContextRef context, T value) {
    return JSValueMakeNumber(context, static_cast<double>(value));
}

template <TextResult T>
JSValueRef ToScript(JSContextRef context, const T& text) {
    return ToScriptString(context, text.view());
}

template <class T>
requires std::derived_from<T, ScriptingHandleEnabled> JSValueRef ToScript(JSContextRef context, T* object) {
    JSValueRef value = nullptr;
    if (object) object->GetOrCreateWrapper(context, &value);
    return value ? value : JSValueMakeNull(context);
}

template <class T>
JSValueRef ToScript(JSContextRef context, const qsl::RefPtr<T>& object) {
    return ToScript(context, object.get());
}

template <class T>
JSValueRef ToScript(JSContextRef context, const std::optional<T>& value) {
    return value ? ToScript(context, *value) : JSValueMakeNull(context);
}

// An array of texts. The array is made first, so that every string is reachable once it exists.
template <class T>
JSValueRef ToScriptArray(JSContextRef context, std::span<const T> items) {
    const JSObjectRef array = JSObjectMakeArray(context, 0, nullptr, nullptr);
    for (size_t i = 0; i < items.size(); ++i) {
        JSObjectSetPropertyAtIndex(context, array, static_cast<unsigned>(i), ToScript(context, items[i]),
                                   nullptr);
    }
    return array;
}

}  // namespace qorvex::script
