// Access by index to the lists that script gets: `list[0]`, `0 in list`.
#pragma once

#include "script/class_description.h"
#include "script/convert.h"

namespace qorvex::script {

// True for names of digits alone, the empty one included; the value wraps at 32 bits.
[[nodiscard]] bool ReadIndexName(JSStringRef name, uint32_t& index);

// Whatever the size of the list: an index that is too large is reported present and reads as undefined.
bool HasIndexName(JSContextRef context, JSObjectRef object, JSStringRef name);

template <class T, auto kGetItem>
JSValueRef GetIndexed(JSContextRef context, JSObjectRef object, JSStringRef name, JSValueRef*) {
    T* list = NativeOf<T>(context, object);
    uint32_t index = 0;
    if (!list || !ReadIndexName(name, index)) return JSValueMakeUndefined(context);
    auto item = (list->*kGetItem)(index);
    if (!item) return JSValueMakeUndefined(context);
    return ToScript(context, item);
}

template <class T, auto kGetItem>
constexpr PropertyAccessDescription IndexedAccess() {
    return {.has = HasIndexName, .get = GetIndexed<T, kGetItem>, .indexed = true};
}

}  // namespace qorvex::script
