// Text to value and back, for code that knows a property only by its id: the converter of sheets, the object
// model, data binding, the inspector. Thread-safe: all tables are constant.
#pragma once

#include <span>
#include <string_view>

#include "css/values/declaration.h"

namespace qorvex::css {

// What a property's value type can do. `value` pointers are those of Declaration::value() and of a style
// group's field.
struct ValueOperations {
    bool (*parse)(std::string_view text, Declaration& out);  // plain values only
    void (*serialise)(const void* value, CssString& out);
    bool (*equal)(const void* a, const void* b);
    void* (*clone)(const void* value);  // null for inline values
    void (*destroy)(void* value);       // null for inline values
    void (*setInitial)(Declaration& out);
    bool acceptsInitial;  // the value may be the word "initial"
};

[[nodiscard]] const ValueOperations& OperationsOf(PropertyId longhand);

// Reads the value text of a longhand: the word inherit, initial where the property takes it, or a value.
// Custom expressions are not values; see PrepareCustomExpression. The flags of `out` stay as they are.
[[nodiscard]] bool ParseLonghand(PropertyId id, std::string_view text, Declaration& out);

// What a shorthand expands into, in id order; empty for any other id.
[[nodiscard]] std::span<const PropertyId> LonghandsOf(PropertyId shorthand);

// Expands a shorthand's value text; all of its longhands are appended with the flags, or none when it is
// refused.
[[nodiscard]] bool ParseShorthand(PropertyId id, std::string_view text, uint8_t flags,
                                  CssVector<Declaration>& out);

// The text form of a plain value; its parser reads it back to an equal value.
void SerialiseValue(PropertyId id, const void* value, CssString& out);
// As above for any kind: "inherit", a custom expression as written, or the value.
void SerialiseDeclaration(const Declaration& declaration, CssString& out);

}  // namespace qorvex::css
