// From a script object to the native one behind it.
//
// Any object can come as `this` or as an argument. Wrappers are found in the page's table (wrapper_table.h),
// so a method borrowed by a foreign object meets nothing and memory is touched only when the class fits.
// Objects of the few classes with property rules carry the same answer in their private pointer, where the
// engine's own callbacks need it: the address takes 48 bits, a marker, the class and the kind of count the
// rest; an object of the client's own class and a null private are told apart by them.
#pragma once

#include <JavaScriptCore/JavaScript.h>

#include <cstdint>
#include <type_traits>

#include "script/class_table.h"

namespace qorvex::script {

class ScriptingHandleEnabled;

static_assert(sizeof(void*) == 8, "the private pointer needs 16 bits beside the address");
static_assert(kScriptClassCount < 128, "the class has seven bits");

struct NativePrivate {
    // A ScriptingHandleEnabled, but for CSSStyleDeclaration, whose private is its style holder.
    void* object = nullptr;
    ScriptClass script_class = ScriptClass::None;
    // The handle is of the WithWeak flavour.
    bool has_weak = false;
};

namespace internal {
inline constexpr uint64_t kPrivateMarker = 0xB7;
inline constexpr int kMarkerShift = 56;
inline constexpr int kClassShift = 49;
inline constexpr int kWeakShift = 48;
inline constexpr uint64_t kPrivateAddress = (uint64_t{1} << kWeakShift) - 1;
}  // namespace internal

[[nodiscard]] inline void* PackPrivate(const void* object, ScriptClass script_class, bool has_weak) {
    using namespace internal;
    return reinterpret_cast<void*>((kPrivateMarker << kMarkerShift) |
                                   (static_cast<uint64_t>(script_class) << kClassShift) |
                                   (static_cast<uint64_t>(has_weak) << kWeakShift) |
                                   (reinterpret_cast<uintptr_t>(object) & kPrivateAddress));
}

[[nodiscard]] inline NativePrivate UnpackPrivate(const void* value) {
    using namespace internal;
    const auto packed = reinterpret_cast<uintptr_t>(value);
    const auto script_class = (packed >> kClassShift) & 0x7F;
    if (packed >> kMarkerShift != kPrivateMarker || script_class >= kScriptClassCount) return {};
    return {reinterpret_cast<void*>(packed & kPrivateAddress), static_cast<ScriptClass>(script_class),
            ((packed >> kWeakShift) & 1) != 0};
}

// The native behind a plain wrapper, or behind the global object, which is none; null for others.
[[nodiscard]] NativePrivate FindWrapped(JSContextRef context, JSObjectRef object);

// The object of a value that is one, else null. In this engine an object's value is its reference; asking
// JSValueToObject for the same pointer would cost a lock.
[[nodiscard]] inline JSObjectRef AsObject(JSContextRef context, JSValueRef value) {
    return value && JSValueIsObject(context, value) ? const_cast<JSObjectRef>(value) : nullptr;
}

// The native object of class T behind a script object; null for every other object.
template <class T>
[[nodiscard]] T* NativeOf(JSContextRef context, JSObjectRef object) {
    if (!object) return nullptr;
    NativePrivate found;
    if constexpr (HasPropertyRules(T::kScriptClass)) {
        found = UnpackPrivate(JSObjectGetPrivate(object));
    } else {
        found = FindWrapped(context, object);
    }
    if (!found.object || !IsScriptClassOrDerived(found.script_class, T::kScriptClass)) return nullptr;
    if constexpr (std::is_base_of_v<ScriptingHandleEnabled, T>) {
        return static_cast<T*>(static_cast<ScriptingHandleEnabled*>(found.object));
    } else {
        return static_cast<T*>(found.object);
    }
}

template <class T>
[[nodiscard]] T* NativeOfValue(JSContextRef context, JSValueRef value) {
    return NativeOf<T>(context, AsObject(context, value));
}

}  // namespace qorvex::script
